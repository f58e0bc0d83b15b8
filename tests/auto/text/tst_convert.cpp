// Text and conversion helpers: date and time texts, environment expansion, fillers,
// case-insensitive strings and the Qt message handler.
#include "zubase/ZuConvert.h"
#include "zubase/ZuStringCaseInsensitive.h"

#include "rklib/RkLogFile.h"

#include <QtTest>

#include <vector>

Q_DECLARE_METATYPE(QtMsgType)

namespace {

std::vector<std::string> sCallbackTexts;

} // namespace

class TestConvert : public QObject
{
    Q_OBJECT

private slots:
    void parse_data();
    void parse();
    void toText();
    void expandEnvironmentVariables_data();
    void expandEnvironmentVariables();
    void replaceFillers();
    void randomText();
    void caseInsensitive();
    void messageHandler_data();
    void messageHandler();
};

// Every text goes through both parsers.
void TestConvert::parse_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QDate>("date");
    QTest::addColumn<QTime>("time");
    auto row = [](const char* inName, const char* inText, QDate inDate, QTime inTime = QTime()) {
        QTest::newRow(inName) << QString::fromLatin1(inText) << inDate << inTime;
    };
    const QDate march5(2024, 3, 5);
    row("dashes", "2024-3-5", march5);
    row("slashes", "2024/3/5", march5);
    row("day first", "5/3/2024", march5);
    row("compact", "20240305", march5);
    row("blanks and time", "  2024-3-5 12:30:00 ", march5);
    if (march5.toString(QStringLiteral("MMM")) == QLatin1String("Mar"))
        row("month name", "2024-Mar-05", march5);
    row("empty", "", QDate());
    row("time with colons", "12:30:05", QDate(), QTime(12, 30, 5));
    row("compact time", "123005", QDate(), QTime(12, 30, 5));
    row("time not trimmed", " 12:30:05", QDate());
    row("no seconds", "12:30", QDate());
}

void TestConvert::parse()
{
    QFETCH(QString, text);
    QTEST(Zu::dateFromString(text), "date");
    QTEST(Zu::timeFromString(text), "time");
}

void TestConvert::toText()
{
    const QDate date(2024, 3, 5);
    const QTime time(9, 7, 5);
    const QString monthName = "2024-" + date.toString(QStringLiteral("MMM")) + "-05";
    const QStringList dates = {"20240305", "5/3/2024", "2024/03/05", monthName, monthName};
    const int formats[] = {0, 1, 2, 3, 17}; // any value beyond 3 means the month-name form
    for (int i = 0; i < 5; ++i) {
        const QString timeText = Zu::timeToString(time, Zu::Format::Format_t(formats[i]));
        QCOMPARE(timeText, QLatin1String(i == 0 ? "090705" : "09:07:05"));
        QCOMPARE(Zu::dateToString(date, Zu::Format::Format_t(formats[i])), dates[i]);
        // What is written is read back.
        QCOMPARE(Zu::dateFromString(dates[i]), date);
        QCOMPARE(Zu::timeFromString(timeText), time);
    }
}

void TestConvert::expandEnvironmentVariables_data()
{
    qputenv("ZU_A", "alpha");
    qputenv("ZU_NESTED", "%ZU_A%/x");
    qputenv("ZU_SELF", "%ZU_SELF%");
    qputenv("ZU_GROW", "%ZU_GROW%x");
    qputenv("ZU_P", "%ZU_Q%");
    qputenv("ZU_Q", "%ZU_P%");
    qputenv("ZU_PERCENT", "50%");
    qunsetenv("ZU_UNSET");
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("expected");
    auto row = [](const char* inName, const QString& inText, const QString& inExpected) {
        QTest::newRow(inName) << inText << inExpected;
    };
    row("unset", "%ZU_UNSET%/x", "/x");
    row("percent form", "%ZU_A%/bin", "alpha/bin");
    row("brace form", "${ZU_A}/bin", "alpha/bin");
    row("value expanded in turn", "%ZU_NESTED%", "alpha/x");
    row("brace form after percent form", "%ZU_A% ${ZU_A}", "alpha alpha");
    row("lone percent stops all", "50% of ${HOME}", "50% of ${HOME}");
    row("unterminated percent", "x%ZU_A", "x%ZU_A");
    row("unterminated brace", "${ZU_A/x", "${ZU_A/x");
    row("unterminated after one", "%ZU_A%%ZU_A", "alpha%ZU_A");
    // A "%" inside a value pairs with the next one on the rescan.
    row("percent in value", "%ZU_PERCENT%ZU_A%", "50alpha");
    // The bound: self-reference stays as it is, mutual ones stop after the last replacement,
    // growing ones stop with 256 replacements done.
    row("self reference", "%ZU_SELF%", "%ZU_SELF%");
    row("mutual reference", "%ZU_P%", "%ZU_P%");
    row("growing reference", "%ZU_GROW%",
        "%ZU_GROW%" + QString(Zu::kMaxEnvironmentReplacements, QLatin1Char('x')));
    row("many references", QStringLiteral("%ZU_A%;").repeated(100),
        QStringLiteral("alpha;").repeated(100));
}

void TestConvert::expandEnvironmentVariables()
{
    QFETCH(QString, text);
    QTEST(Zu::expandEnvironmentVariables(text), "expected");
}

// randomText checks the rule with blanks at large; here also with another fill character.
void TestConvert::replaceFillers()
{
    QCOMPARE(Zu::replaceFillers(QStringLiteral("__a__b_"), QStringLiteral("_"), QLatin1Char(' ')),
             QStringLiteral("a b"));
    QCOMPARE(
        Zu::replaceFillers(QStringLiteral("-a_-_b..c."), QStringLiteral("-_"), QLatin1Char('.')),
        QStringLiteral("a.b.c"));
}

// Random texts from the characters that matter to the parsers: no hang, no crash, and the
// properties callers rely on.
void TestConvert::randomText()
{
    QRandomGenerator generator(42);
    const QString alphabet = QStringLiteral("%${}-/ :0123456789ZU_ASELFGROWMar\t");
    for (int round = 0; round < 5000; ++round) {
        QString text;
        for (int i = int(generator.bounded(24)); i > 0; --i)
            text += alphabet.at(int(generator.bounded(alphabet.size())));

        const QTime time = Zu::timeFromString(text);
        if (time.isValid())
            QVERIFY(time.toString(QStringLiteral("hh:mm:ss")) == text ||
                    time.toString(QStringLiteral("hhmmss")) == text);
        Zu::dateFromString(text); // only must not crash

        // At most 256 replacements of values no longer than "%ZU_GROW%x".
        const QString expanded = Zu::expandEnvironmentVariables(text);
        QVERIFY(expanded.size() <= text.size() + 10 * Zu::kMaxEnvironmentReplacements);
        if (!text.contains(QLatin1Char('%')) && !text.contains(QLatin1String("${")))
            QCOMPARE(expanded, text);

        // No filler left, no blank at the ends or twice, and nothing else lost.
        const QString filled = Zu::replaceFillers(text, QStringLiteral("-/"), QLatin1Char(' '));
        QVERIFY(!filled.startsWith(QLatin1Char(' ')) && !filled.endsWith(QLatin1Char(' ')) &&
                !filled.contains(QLatin1String("  ")) && !filled.contains(QLatin1Char('-')) &&
                !filled.contains(QLatin1Char('/')));
        QCOMPARE(QString(filled).remove(QLatin1Char(' ')),
                 QString(text).remove(QRegularExpression(QStringLiteral("[-/ ]"))));
    }
}

void TestConvert::caseInsensitive()
{
    QVERIFY(ZuStringCaseInsensitive("Abc") == QStringLiteral("aBC"));
    QVERIFY(ZuStringCaseInsensitive(QString::fromUtf8("ÄRGER")) == QString::fromUtf8("ärger"));
    QVERIFY(!(ZuStringCaseInsensitive("abc") == QStringLiteral("abd")));
    // const char* is Latin-1 (0xC4 is 'Ä'); assignment keeps the text as given.
    QVERIFY(ZuStringCaseInsensitive("\xC4rger") == QString::fromUtf8("äRGER"));
    ZuStringCaseInsensitive text;
    QCOMPARE(text = "\xE9t\xE9", QString::fromUtf8("été"));
    QCOMPARE(text = QStringLiteral("ABC"), QStringLiteral("ABC"));
    QVERIFY(text == QStringLiteral("abc"));
}

void TestConvert::messageHandler_data()
{
    QTest::addColumn<QtMsgType>("type");
    QTest::addColumn<QByteArray>("category"); // null: no category
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("level"); // levels 0 to 2 are hidden from the write callback
    QTest::addColumn<QString>("logged");
    auto row = [](const char* inName, QtMsgType inType, const char* inCategory, const char* inText,
                  int inLevel, const char* inLogged) {
        QTest::newRow(inName) << inType << QByteArray(inCategory) << QString::fromLatin1(inText)
                              << inLevel << QString::fromLatin1(inLogged);
    };
    row("debug", QtDebugMsg, "zu.test", "d", 0, "zu.test: d");
    row("warning", QtWarningMsg, "default", "w", 2, "default: w");
    row("critical", QtCriticalMsg, "zu.test", "c", 3, "zu.test: c");
    row("fatal", QtFatalMsg, nullptr, "f", 4, "f");
    row("unknown type", QtMsgType(7), nullptr, "u", 3, "u");
    row("percent signs stay", QtCriticalMsg, nullptr, "100% %s %d", 3, "100% %s %d");
    row("empty category", QtWarningMsg, "", "e", 2, "e");
}

void TestConvert::messageHandler()
{
    QFETCH(QtMsgType, type);
    QFETCH(QByteArray, category);
    QFETCH(QString, text);
    QFETCH(int, level);
    QFETCH(QString, logged);

    sCallbackTexts.clear();
    getTheLogInstance().setWriteCallback(
        [](RkLogLevel, const RkString& inText) { sCallbackTexts.push_back(inText.c_str()); },
        RkLogDebug);
    RkLogCapture capture;
    QMessageLogContext context("file.cpp", 12, "void f()",
                               category.isNull() ? nullptr : category.constData());
    ZuBase::logQtMessageToRkLogFile(type, context, text);
    // The callback works again for the next line: the hiding was for one message only.
    getTheLogInstance().tracef(RkLogError, "Qt", "after");
    getTheLogInstance().setWriteCallback(nullptr, RkLogOff);

    const std::vector<RkLogEntry> entries = capture.entries();
    QCOMPARE(int(entries.size()), 2);
    QCOMPARE(int(entries[0].level), level);
    QCOMPARE(QString::fromStdString(entries[0].category), QStringLiteral("Qt"));
    QCOMPARE(QString::fromStdString(entries[0].text), logged);
    std::vector<std::string> expectedCallback;
    if (level > 2)
        expectedCallback.push_back(logged.toStdString());
    expectedCallback.push_back("after");
    QCOMPARE(sCallbackTexts, expectedCallback);
}

QTEST_GUILESS_MAIN(TestConvert)
#include "tst_convert.moc"
