#pragma once

// Internal: the check helpers and the log, with the QString overloads of the check texts.
#include "rklib/RkCheck.h"
#include "rklib/RkLogFile.h"
#include "rklib/Tz.h"

#include <QByteArray>
#include <QString>

// Text handed to the core runtime layer travels in the local 8-bit encoding.
inline QByteArray Q2M(const QString& inText)
{
    return inText.toLocal8Bit();
}
