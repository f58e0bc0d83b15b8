// Text and conversion helpers: date and time texts, environment expansion, fillers,
// case-insensitive strings and the Qt message handler.
#include "zubase/ZuConvert.h"
#include "zubase/ZuStringCaseInsensitive.h"

#include "TestSupport.h"

Q_DECLARE_METATYPE(QtMsgType)

static QStringList sCallbackTexts;

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
        qputenv("ZU_GROW", "%ZU_GROW%x");
        qputenv("ZU_PERCENT", "50%");
        qunsetenv("ZU_UNSET");
        QTest::addColumn<QString>("text");
        QTest::addColumn<QString>("expected");
        // clang-format off
        QTest::newRow("unset") << "%ZU_UNSET%/x" << "/x";
        QTest::newRow("both forms") << "%ZU_A% ${ZU_A}/bin" << "alpha alpha/bin";
        QTest::newRow("lone percent stops all") << "50% of ${HOME}" << "50% of ${HOME}";
        QTest::newRow("unterminated after one") << "%ZU_A%%ZU_A" << "alpha%ZU_A";
        // Values are expanded in turn: the text is rescanned from its start, so a "%" of a value
        // pairs with the next one.
        QTest::newRow("percent in value") << "%ZU_PERCENT%ZU_A%" << "50alpha";
        // Bounded: a self-reference stops after the last replacement.
        QTest::newRow("growing reference") << "%ZU_GROW%" << "%ZU_GROW%" + QString(Zu::kMaxEnvironmentReplacements, 'x');
        // clang-format on
    }
    void expandEnvironmentVariables()
    {
        QFETCH(QString, text);
        QTEST(Zu::expandEnvironmentVariables(text), "expected");
    }

    void replaceFillersAndCase()
    {
        QCOMPARE(Zu::replaceFillers("-a_-_b..c.", "-_", '.'), QStringLiteral("a.b.c"));
        // const char* is Latin-1 (0xC4 is 'Ä'); the comparison ignores case, also beyond ASCII.
        QVERIFY(ZuStringCaseInsensitive("\xC4rger") == QString::fromUtf8("äRGER"));
        QVERIFY(!(ZuStringCaseInsensitive("abc") == QStringLiteral("abd")));
    }

    // Written to the log at its level; levels 0 to 2 are hidden from the write callback, for that
    // one message only.
    void messageHandler_data()
    {
        QTest::addColumn<QtMsgType>("type");
        QTest::addColumn<QByteArray>("category"); // null: no category
        QTest::addColumn<int>("level");
        QTest::addColumn<QString>("logged");
        // clang-format off
        QTest::newRow("debug") << QtDebugMsg << QByteArray("zu.test") << 0 << "zu.test: 1% %s";
        QTest::newRow("warning") << QtWarningMsg << QByteArray("default") << 2 << "default: 1% %s";
        QTest::newRow("fatal, empty category") << QtFatalMsg << QByteArray("") << 4 << "1% %s";
        QTest::newRow("unknown type") << QtMsgType(7) << QByteArray() << 3 << "1% %s";
        // clang-format on
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
        ZuBase::logQtMessageToRkLogFile(type, context, "1% %s");
        getTheLogInstance().tracef(RkLogError, "Qt", "after");
        getTheLogInstance().setWriteCallback(nullptr, RkLogOff);
        QCOMPARE(TestSupport::logLines(capture, "Qt"), QStringList({logged, "after"}));
        QCOMPARE(int(capture.entries().front().level), level);
        QCOMPARE(sCallbackTexts, level > 2 ? QStringList({logged, "after"}) : QStringList("after"));
    }
};

QTEST_GUILESS_MAIN(TestConvert)
#include "tst_convert.moc"
