#pragma once

// Internal: the check helpers and the log, with the QString overloads of the check texts.
#include "rklib/RkCheck.h"
#include "rklib/RkLogFile.h"
#include "rklib/Tz.h"

#include <QByteArray>
#include <QString>

// Report and return, in one line: a failed check is written to the log, ioResult turns bad and
// the calling function returns it. The record is the one RK_CHECK built at the call site.
//   ZU_CHECK_RETURN(res, RK_CHECK(file.exists(), "file.exists()", "Internal Error"));
#define ZU_CHECK_RETURN(ioResult, inCheck)                                                         \
    do {                                                                                           \
        if (Tz::fail(inCheck)) {                                                                   \
            (ioResult).makeBad(1);                                                                 \
            return (ioResult);                                                                     \
        }                                                                                          \
    } while (false)

// The same after a system call: inError is the saved error number for the record's text.
#define ZU_CHECK_WIN_RETURN(ioResult, inCheck, inError)                                            \
    do {                                                                                           \
        if (Tz::failWin((inCheck), (inError))) {                                                   \
            (ioResult).makeBad(1);                                                                 \
            return (ioResult);                                                                     \
        }                                                                                          \
    } while (false)

// Text handed to the core runtime layer travels in the local 8-bit encoding.
inline QByteArray Q2M(const QString& inText)
{
    return inText.toLocal8Bit();
}
