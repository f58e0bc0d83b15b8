#pragma once

// Small helpers shared by the test suites.
#include "rklib/RkLogFile.h"

#include <QRegularExpression>
#include <QStringList>

namespace TestSupport {

// A helper program built under tests/helpers.
inline QString helper(const char* inName)
{
    return QStringLiteral(ZUBASE_TEST_HELPER_DIR "/") + QLatin1String(inName);
}

// The failure lines of the log ("Tz"), without their source line numbers.
inline QStringList failureLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const std::string& text : inCapture.texts("Tz"))
        lines << QString::fromStdString(text).replace(QRegularExpression(R"(\(\d+\): )"), ": ");
    return lines;
}

} // namespace TestSupport
