#pragma once

// Small helpers shared by the test suites: helper programs, and the log lines a test captured
// with the source line numbers of failure records dropped, so that expected texts survive edits
// of the code.
#include "rklib/RkLogFile.h"

#include <QRegularExpression>
#include <QStringList>

namespace TestSupport {

// A helper program built under tests/helpers.
inline QString helper(const char* inName)
{
    return QStringLiteral(ZUBASE_TEST_HELPER_DIR "/") + QLatin1String(inName);
}

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

// The failure records reported through Tz::fail, as "<where>: <message>  <detail>".
inline QStringList failureLines(const RkLogCapture& inCapture)
{
    return logLines(inCapture, "Tz");
}

} // namespace TestSupport
