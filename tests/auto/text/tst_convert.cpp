// Text and conversion helpers: date and time texts, environment expansion, fillers,
// case-insensitive strings and the Qt message handler.
#include "zubase/ZuConvert.h"
#include "zubase/ZuStringCaseInsensitive.h"

#include "TestSupport.h"

Q_DECLARE_METATYPE(QtMsgType)

namespace {

QStringList sCallbackTexts;

} // namespace

class TestConvert : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    // The display formats, and the tolerant parsers reading them back.
    void dateAndTime()
    {
        const QDate date(2024, 3, 5);
        const QString monthName = "2024-" + date.toString("MMM") + "-05";
        const QStringList dates = {"20240305", "5/3/2024", "2024/03/05", monthName, monthName};
        const int formats[] = {0, 1, 2, 3, 17}; // any value beyond 3 means the month-name form
        for (int i = 0; i < 5; ++i) {
            const auto format = Zu::Format::Format_t(formats[i]);
            const QString time = Zu::timeToString(QTime(9, 7, 5), format);
            QCOMPARE(time, QLatin1String(i == 0 ? "090705" : "09:07:05"));
            QCOMPARE(Zu::timeFromString(time), QTime(9, 7, 5));
            QCOMPARE(Zu::dateToString(date, format), dates[i]);
            QCOMPARE(Zu::dateFromString(dates[i]), date);
        }
        // Blanks around and a time after the date are ignored; a time is not trimmed.
        QCOMPARE(Zu::dateFromString("  2024-3-5 12:30:00 "), date);
        QVERIFY(!Zu::timeFromString(" 12:30:05").isValid());
    }

    void expandEnvironmentVariables_data()
    {
        qputenv("ZU_A", "alpha");
        qputenv("ZU_NESTED", "%ZU_A%/x");
        qputenv("ZU_SELF", "%ZU_SELF%");
        qputenv("ZU_GROW", "%ZU_GROW%x");
        qputenv("ZU_PERCENT", "50%");
        qunsetenv("ZU_UNSET");
        QTest::addColumn<QString>("text");
        QTest::addColumn<QString>("expected");
        auto row = [](const char* inName, const char* inText, const QString& inExpected) {
            QTest::newRow(inName) << QString(inText) << inExpected;
        };
        row("unset", "%ZU_UNSET%/x", "/x");
        row("both forms", "%ZU_A% ${ZU_A}/bin", "alpha alpha/bin");
        row("value expanded in turn", "%ZU_NESTED%", "alpha/x");
        row("lone percent stops all", "50% of ${HOME}", "50% of ${HOME}");
        row("unterminated after one", "%ZU_A%%ZU_A", "alpha%ZU_A");
        // The text is rescanned from its start: a "%" of a value pairs with the next one.
        row("percent in value", "%ZU_PERCENT%ZU_A%", "50alpha");
        // Bounded: a self-reference stays, a growing one stops after the last replacement.
        row("self reference", "%ZU_SELF%", "%ZU_SELF%");
        row("growing reference", "%ZU_GROW%",
            "%ZU_GROW%" + QString(Zu::kMaxEnvironmentReplacements, 'x'));
    }
    void expandEnvironmentVariables()
    {
        QFETCH(QString, text);
        QTEST(Zu::expandEnvironmentVariables(text), "expected");
    }

    void replaceFillersAndCase()
    {
        QCOMPARE(Zu::replaceFillers("__a__b_", "_", ' '), QStringLiteral("a b"));
        QCOMPARE(Zu::replaceFillers("-a_-_b..c.", "-_", '.'), QStringLiteral("a.b.c"));
        // const char* is Latin-1 (0xC4 is 'Ä'); the comparison ignores case, also beyond ASCII.
        QVERIFY(ZuStringCaseInsensitive("\xC4rger") == QString::fromUtf8("äRGER"));
        QVERIFY(!(ZuStringCaseInsensitive("abc") == QStringLiteral("abd")));
        ZuStringCaseInsensitive text;
        QCOMPARE(text = "\xE9t\xE9", QString::fromUtf8("été"));
        QCOMPARE(text = QStringLiteral("ABC"), QStringLiteral("ABC")); // kept as given
    }

    void messageHandler_data()
    {
        QTest::addColumn<QtMsgType>("type");
        QTest::addColumn<QByteArray>("category"); // null: no category
        QTest::addColumn<int>("level"); // levels 0 to 2 are hidden from the write callback
        QTest::addColumn<QString>("logged");
        QTest::newRow("debug") << QtDebugMsg << QByteArray("zu.test") << 0 << "zu.test: 1% %s";
        QTest::newRow("warning") << QtWarningMsg << QByteArray("default") << 2 << "default: 1% %s";
        QTest::newRow("critical, empty category")
            << QtCriticalMsg << QByteArray("") << 3 << "1% %s";
        QTest::newRow("fatal") << QtFatalMsg << QByteArray("zu") << 4 << "zu: 1% %s";
        QTest::newRow("unknown type") << QtMsgType(7) << QByteArray() << 3 << "1% %s";
    }
    void messageHandler()
    {
        QFETCH(QtMsgType, type);
        QFETCH(QByteArray, category);
        QFETCH(int, level);
        QFETCH(QString, logged);
        sCallbackTexts.clear();
        getTheLogInstance().setWriteCallback(
            [](RkLogLevel, const RkString& inText) { sCallbackTexts << inText.c_str(); },
            RkLogDebug);
        RkLogCapture capture;
        QMessageLogContext context("f.cpp", 1, "f()",
                                   category.isNull() ? nullptr : category.data());
        ZuBase::logQtMessageToRkLogFile(type, context, QStringLiteral("1% %s"));
        // The hiding was for one message only.
        getTheLogInstance().tracef(RkLogError, "Qt", "after");
        getTheLogInstance().setWriteCallback(nullptr, RkLogOff);

        QCOMPARE(TestSupport::logLines(capture, "Qt"), QStringList({logged, "after"}));
        QVERIFY(TestSupport::logLines(capture, "Qt", RkLogLevel(level)).contains(logged));
        QVERIFY(!TestSupport::logLines(capture, "Qt", RkLogLevel(level + 1)).contains(logged));
        QCOMPARE(sCallbackTexts, level > 2 ? QStringList({logged, "after"}) : QStringList("after"));
    }
};

QTEST_GUILESS_MAIN(TestConvert)
#include "tst_convert.moc"
