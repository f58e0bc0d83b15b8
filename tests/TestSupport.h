#pragma once

// Shared by the test suites: the log lines a test captured, with the source line numbers of
// failure records dropped so that expected texts survive edits of the code.
#include "rklib/RkLogFile.h"

#include <QRegularExpression>
#include <QStringList>

// Texts of the entries of inCategory (nullptr: any) at inMinimum or above, in order.
inline QStringList logLines(const RkLogCapture& inCapture, const char* inCategory = nullptr,
                            RkLogLevel inMinimum = RkLogDebug)
{
    static const QRegularExpression lineNumber(R"(\(\d+\): )");
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries()) {
        if (entry.level >= inMinimum && (!inCategory || entry.category == inCategory))
            lines << QString::fromStdString(entry.text).replace(lineNumber, ": ");
    }
    return lines;
}
