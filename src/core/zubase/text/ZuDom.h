#pragma once

#include "zubase/zubase_export.h"

#include <QDomElement>
#include <QList>
#include <QString>

// Typed attribute access on DOM elements. Nothing here reports errors other than by the return
// value; a failed read leaves the output variable as it was.
namespace ZuDom {

// Reads attribute inName (Latin-1) as a base-10 integer; false for a missing attribute, a null
// element or text that is not a whole number.
ZUBASE_EXPORT bool getAttribute(QDomElement inElement, const char* inName, int& outValue);
// The same with QString::toFloat.
ZUBASE_EXPORT bool getAttribute(QDomElement inElement, const char* inName, float& outValue);
// The same with qStringToBool(); false when the text is neither a yes nor a no word.
ZUBASE_EXPORT bool getAttribute(QDomElement inElement, const char* inName, bool& outValue);
// Sets the attribute unless the element is null.
ZUBASE_EXPORT void setAttribute(QDomElement inElement, const char* inName, const QString& inValue);

// 1 for "yes", "on", "true", "1"; 0 for "no", "off", "false", "0" (any case, not trimmed);
// -1 for anything else, the empty text included.
ZUBASE_EXPORT int qStringToBool(const QString& inText);

// Parses integers separated by single blanks. Stops with false at the first part that is not a
// number (an empty part between two blanks included); outList keeps what was read until then.
ZUBASE_EXPORT bool readIntegerListParams(const QString& inText, QList<int>& outList);

} // namespace ZuDom
