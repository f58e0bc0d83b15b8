#pragma once

#include "zubase/zubase_export.h"

#include <QTextStream>
#include <QUuid>

// Text stream operators for bool and QUuid as the product's text files hold them.
//
// The two reading operators do not consume tokens: they look at the whole string the stream
// works on (QTextStream::string()), whatever was read before, so they need a stream over a
// QString; on a device stream they read an empty text.

// Writes "true" or "false".
ZUBASE_EXPORT QTextStream& operator<<(QTextStream& ioStream, const bool& inValue);
// True exactly when the stream's whole string, lower-cased, is "true".
ZUBASE_EXPORT QTextStream& operator>>(QTextStream& ioStream, bool& outValue);
// Writes the braced form "{xxxxxxxx-...}".
ZUBASE_EXPORT QTextStream& operator<<(QTextStream& ioStream, const QUuid& inValue);
// The QUuid made from the stream's whole string (null when it is no uuid).
ZUBASE_EXPORT QTextStream& operator>>(QTextStream& ioStream, QUuid& outValue);
