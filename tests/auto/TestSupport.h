#pragma once

// Small helpers shared by the test suites: helper programs, test data, results, and the log
// lines a test captured with the source line numbers of failure records dropped, so that
// expected texts survive edits of the code.
#include "rklib/RkLogFile.h"
#include "rklib/RkResult.h"

#include <QRegularExpression>
#include <QStringList>
#include <QtTest>

// Fails the test unless inResult is good, and shows the result's records when it is not.
#define QVERIFY_OK(inResult)                                                                       \
    do {                                                                                           \
        const RkResult zuVerifyResult = (inResult);                                                \
        QVERIFY2(zuVerifyResult.isOk(), zuVerifyResult.toString().c_str());                        \
    } while (false)

namespace TestSupport {

// A helper program built beside the test that uses it.
inline QString helper(const char* inName)
{
    return QStringLiteral(ZUBASE_TEST_HELPER_DIR "/") + QLatin1String(inName);
}

// A file or folder under tests/data, e.g. dataPath("style/dark.xml").
inline QString dataPath(const char* inRelative)
{
    return QStringLiteral(ZUBASE_TEST_DATA_DIR "/") + QLatin1String(inRelative);
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
