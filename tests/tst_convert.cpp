// Text and conversion helpers: date and time texts, environment expansion, fillers, viewport
// sizing, case-insensitive strings, scoped connections and the Qt message handler.
#include "zubase/ZuConvert.h"
#include "zubase/ZuScopedConnection.h"
#include "zubase/ZuStringCaseInsensitive.h"

#include "rklib/RkLogFile.h"

#include <QLoggingCategory>
#include <QScrollArea>
#include <QVBoxLayout>
#include <QtTest>

#include <atomic>
#include <thread>
#include <vector>

Q_DECLARE_METATYPE(QtMsgType)

namespace {

class FixedHintWidget : public QWidget
{
public:
    explicit FixedHintWidget(const QSize& inHint) : mHint(inHint) {}
    QSize sizeHint() const override { return mHint; }

private:
    QSize mHint;
};

std::vector<std::string> sCallbackTexts;

void writeCallback(RkLogLevel, const RkString& inText)
{
    sCallbackTexts.push_back(inText.c_str());
}

} // namespace

class TestConvert : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void dateFromString_data();
    void dateFromString();
    void dateAndTimeToString_data();
    void dateAndTimeToString();
    void timeFromString_data();
    void timeFromString();
    void expandEnvironmentVariables_data();
    void expandEnvironmentVariables();
    void replaceFillers_data();
    void replaceFillers();
    void randomText();
    void resizeWidgetToViewport();
    void caseInsensitive_data();
    void caseInsensitive();
    void scopedConnectionShares();
    void scopedConnectionAcrossThreads();
    void messageHandler_data();
    void messageHandler();
};

void TestConvert::initTestCase()
{
    qputenv("ZU_A", "alpha");
    qputenv("ZU_NESTED", "%ZU_A%/x");
    qputenv("ZU_SELF", "%ZU_SELF%");
    qputenv("ZU_GROW", "%ZU_GROW%x");
    qputenv("ZU_P", "%ZU_Q%");
    qputenv("ZU_Q", "%ZU_P%");
    qputenv("ZU_PERCENT", "50%");
    qunsetenv("ZU_UNSET");
}

void TestConvert::dateFromString_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QDate>("date");
    const QDate march5(2024, 3, 5);
    QTest::newRow("dashes") << "2024-3-5" << march5;
    QTest::newRow("slashes") << "2024/3/5" << march5;
    QTest::newRow("padded") << "2024/03/05" << march5;
    QTest::newRow("day first") << "5/3/2024" << march5;
    QTest::newRow("day first, dashes") << "5-3-2024" << march5;
    QTest::newRow("compact") << "20240305" << march5;
    QTest::newRow("blanks and time") << "  2024-3-5 12:30:00 " << march5;
    QTest::newRow("tab before time") << "\t20240305 1230" << march5;
    if (QDate(2024, 3, 5).toString(QStringLiteral("MMM")) == QLatin1String("Mar"))
        QTest::newRow("month name") << "2024-Mar-05" << march5;
    QTest::newRow("empty") << "" << QDate();
    QTest::newRow("blanks only") << "   " << QDate();
    QTest::newRow("month 13") << "2024/13/1" << QDate();
    QTest::newRow("30 February") << "30/2/2024" << QDate();
    QTest::newRow("two-digit year") << "5/3/24" << QDate();
    QTest::newRow("words") << "yesterday" << QDate();
}

void TestConvert::dateFromString()
{
    QFETCH(QString, text);
    QFETCH(QDate, date);
    const QDate parsed = Zu::dateFromString(text);
    QCOMPARE(parsed.isValid(), date.isValid());
    if (date.isValid())
        QCOMPARE(parsed, date);
}

void TestConvert::dateAndTimeToString_data()
{
    QTest::addColumn<int>("format");
    QTest::addColumn<QString>("dateText");
    QTest::addColumn<QString>("timeText");
    const QString monthName =
        QStringLiteral("2024-") + QDate(2024, 3, 5).toString(QStringLiteral("MMM")) + "-05";
    QTest::newRow("compact") << 0 << "20240305"
                             << "090705";
    QTest::newRow("day month year") << 1 << "5/3/2024"
                                    << "09:07:05";
    QTest::newRow("year month day") << 2 << "2024/03/05"
                                    << "09:07:05";
    QTest::newRow("month name") << 3 << monthName << "09:07:05";
    QTest::newRow("unknown value") << 17 << monthName << "09:07:05";
}

void TestConvert::dateAndTimeToString()
{
    QFETCH(int, format);
    QFETCH(QString, dateText);
    QFETCH(QString, timeText);
    const auto f = Zu::Format::Format_t(format);
    QCOMPARE(Zu::dateToString(QDate(2024, 3, 5), f), dateText);
    QCOMPARE(Zu::timeToString(QTime(9, 7, 5), f), timeText);
    // What is written is read back.
    QCOMPARE(Zu::dateFromString(dateText), QDate(2024, 3, 5));
    QCOMPARE(Zu::timeFromString(timeText), QTime(9, 7, 5));
}

void TestConvert::timeFromString_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QTime>("time");
    QTest::newRow("colons") << "12:30:05" << QTime(12, 30, 5);
    QTest::newRow("compact") << "123005" << QTime(12, 30, 5);
    QTest::newRow("midnight") << "000000" << QTime(0, 0, 0);
    QTest::newRow("not trimmed") << " 12:30:05" << QTime();
    QTest::newRow("hour 25") << "25:00:00" << QTime();
    QTest::newRow("no seconds") << "12:30" << QTime();
    QTest::newRow("empty") << "" << QTime();
}

void TestConvert::timeFromString()
{
    QFETCH(QString, text);
    QFETCH(QTime, time);
    const QTime parsed = Zu::timeFromString(text);
    QCOMPARE(parsed.isValid(), time.isValid());
    if (time.isValid())
        QCOMPARE(parsed, time);
}

void TestConvert::expandEnvironmentVariables_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("expected");
    QTest::newRow("no reference") << "C:/data"
                                  << "C:/data";
    QTest::newRow("unset") << "%ZU_UNSET%/x"
                           << "/x";
    QTest::newRow("percent form") << "%ZU_A%/bin"
                                  << "alpha/bin";
    QTest::newRow("brace form") << "${ZU_A}/bin"
                                << "alpha/bin";
    QTest::newRow("twice") << "%ZU_A%-%ZU_A%"
                           << "alpha-alpha";
    QTest::newRow("value expanded in turn") << "%ZU_NESTED%"
                                            << "alpha/x";
    QTest::newRow("brace form after percent form") << "%ZU_A% ${ZU_A}"
                                                   << "alpha alpha";
    QTest::newRow("lone percent stops all") << "50% of ${HOME}"
                                            << "50% of ${HOME}";
    QTest::newRow("unterminated percent") << "x%ZU_A"
                                          << "x%ZU_A";
    QTest::newRow("unterminated brace") << "${ZU_A/x"
                                        << "${ZU_A/x";
    QTest::newRow("unterminated after one") << "%ZU_A%%ZU_A"
                                            << "alpha%ZU_A";
    // A "%" inside a value pairs with the next one on the rescan.
    QTest::newRow("percent in value") << "%ZU_PERCENT%ZU_A%"
                                      << "50alpha";
    // The bound: self-reference stays as it is, mutual ones stop after the last replacement,
    // growing ones stop with 256 replacements done.
    QTest::newRow("self reference") << "%ZU_SELF%"
                                    << "%ZU_SELF%";
    QTest::newRow("mutual reference") << "%ZU_P%"
                                      << "%ZU_P%";
    QTest::newRow("growing reference")
        << "%ZU_GROW%"
        << "%ZU_GROW%" + QString(Zu::maxEnvironmentReplacements, QLatin1Char('x'));
    QString many, manyExpanded;
    for (int i = 0; i < 100; ++i) {
        many += QLatin1String("%ZU_A%;");
        manyExpanded += QLatin1String("alpha;");
    }
    QTest::newRow("many references") << many << manyExpanded;
}

void TestConvert::expandEnvironmentVariables()
{
    QFETCH(QString, text);
    QFETCH(QString, expected);
    QCOMPARE(Zu::expandEnvironmentVariables(text), expected);
}

void TestConvert::replaceFillers_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("fillers");
    QTest::addColumn<QChar>("fill");
    QTest::addColumn<QString>("expected");
    QTest::newRow("underscores") << "__a__b_"
                                 << "_" << QChar(' ') << "a b";
    QTest::newRow("several fillers") << "-a_-_b--c"
                                     << "-_" << QChar('.') << "a.b.c";
    QTest::newRow("fill itself collapses") << "  a   b  "
                                           << "" << QChar(' ') << "a b";
    QTest::newRow("mixed with fill") << "a _ b"
                                     << "_" << QChar(' ') << "a b";
    QTest::newRow("only fillers") << "___"
                                  << "_" << QChar(' ') << "";
    QTest::newRow("empty") << ""
                           << "_" << QChar(' ') << "";
    QTest::newRow("nothing to do") << "abc"
                                   << "_" << QChar(' ') << "abc";
}

void TestConvert::replaceFillers()
{
    QFETCH(QString, text);
    QFETCH(QString, fillers);
    QFETCH(QChar, fill);
    QFETCH(QString, expected);
    QCOMPARE(Zu::replaceFillers(text, fillers, fill), expected);
}

// Random texts from the characters that matter to the parsers: no hang, no crash, and the
// properties callers rely on.
void TestConvert::randomText()
{
    QRandomGenerator generator(42);
    const QString alphabet = QStringLiteral("%${}-/ :0123456789ZU_ASELFGROWMar\t");
    for (int round = 0; round < 5000; ++round) {
        QString text;
        const int length = int(generator.bounded(24));
        for (int i = 0; i < length; ++i)
            text += alphabet.at(int(generator.bounded(alphabet.size())));

        const QTime time = Zu::timeFromString(text);
        if (time.isValid())
            QVERIFY(time.toString(QStringLiteral("hh:mm:ss")) == text ||
                    time.toString(QStringLiteral("hhmmss")) == text);
        Zu::dateFromString(text); // only must not crash

        // At most 256 replacements of values no longer than "%ZU_GROW%x".
        const QString expanded = Zu::expandEnvironmentVariables(text);
        QVERIFY(expanded.size() <= text.size() + 10 * Zu::maxEnvironmentReplacements);
        if (!text.contains(QLatin1Char('%')) && !text.contains(QLatin1String("${")))
            QCOMPARE(expanded, text);

        const QString filled = Zu::replaceFillers(text, QStringLiteral("-/"), QLatin1Char(' '));
        QVERIFY(!filled.startsWith(QLatin1Char(' ')) && !filled.endsWith(QLatin1Char(' ')));
        QVERIFY(!filled.contains(QLatin1String("  ")) && !filled.contains(QLatin1Char('-')) &&
                !filled.contains(QLatin1Char('/')));
        QString stripped = text;
        stripped.remove(QRegularExpression(QStringLiteral("[-/ ]")));
        QCOMPARE(QString(filled).remove(QLatin1Char(' ')), stripped);
    }
}

void TestConvert::resizeWidgetToViewport()
{
    QWidget window;
    auto* layout = new QVBoxLayout(&window);
    auto* area = new QScrollArea;
    layout->addWidget(area);
    auto* content = new FixedHintWidget(QSize(420, 260));
    area->setWidget(content);
    window.resize(200, 120);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    QVERIFY(area->maximumViewportSize() != content->sizeHint());

    Zu::resizeWidgetToViewport(&window, area);
    QTRY_COMPARE(area->maximumViewportSize(), content->sizeHint());

    // Null pointers and an area without content leave the widget alone.
    const QSize before = window.size();
    Zu::resizeWidgetToViewport(nullptr, area);
    Zu::resizeWidgetToViewport(&window, nullptr);
    QScrollArea empty;
    Zu::resizeWidgetToViewport(&window, &empty);
    QCOMPARE(window.size(), before);
}

void TestConvert::caseInsensitive_data()
{
    QTest::addColumn<QString>("left");
    QTest::addColumn<QString>("right");
    QTest::addColumn<bool>("equal");
    QTest::newRow("mixed case") << "Abc"
                                << "aBC" << true;
    QTest::newRow("empty") << ""
                           << "" << true;
    QTest::newRow("different") << "abc"
                               << "abd" << false;
    QTest::newRow("prefix") << "abc"
                            << "ab" << false;
    QTest::newRow("umlaut") << QString::fromUtf8("ÄRGER") << QString::fromUtf8("ärger") << true;
}

void TestConvert::caseInsensitive()
{
    QFETCH(QString, left);
    QFETCH(QString, right);
    QFETCH(bool, equal);
    const ZuStringCaseInsensitive text(left);
    QCOMPARE(text == right, equal);
    ZuStringCaseInsensitive copy;
    copy = text;
    QCOMPARE(copy == right, equal);
    QString& assigned = (copy = right.toUpper());
    QCOMPARE(assigned, right.toUpper());
    QVERIFY(copy == right);

    // const char* is Latin-1: 0xC4 is 'Ä'.
    QVERIFY(ZuStringCaseInsensitive("\xC4rger") == QString::fromUtf8("äRGER"));
    copy = "\xE9t\xE9";
    QCOMPARE(static_cast<const QString&>(copy), QString::fromUtf8("été"));
}

void TestConvert::scopedConnectionShares()
{
    QObject sender;
    int calls = 0;
    auto connect = [&] {
        return ZuScopedConnection(
            QObject::connect(&sender, &QObject::objectNameChanged, [&calls] { ++calls; }));
    };
    auto fire = [&] {
        const int before = calls;
        sender.setObjectName(sender.objectName() + QLatin1Char('x'));
        return calls - before;
    };

    {
        ZuScopedConnection only = connect();
        QCOMPARE(fire(), 1);
    }
    QCOMPARE(fire(), 0); // the only share went away

    {
        ZuScopedConnection first = connect();
        {
            ZuScopedConnection second = first;
            QCOMPARE(fire(), 1);
        }
        QCOMPARE(fire(), 1); // one copy gone, the other holds it
        ZuScopedConnection third = first;
        first.disconnect();
        QCOMPARE(fire(), 1); // disconnect() drops a share only
        third.disconnect();
        QCOMPARE(fire(), 0);
        third.disconnect(); // nothing left to drop
    }

    // Assigning over the last share breaks the old connection and keeps the new one.
    ZuScopedConnection a = connect();
    ZuScopedConnection b;
    QCOMPARE(fire(), 1);
    a = b;
    QCOMPARE(fire(), 0);
    a = connect();
    b = a;
    a = ZuScopedConnection();
    QCOMPARE(fire(), 1);
}

void TestConvert::scopedConnectionAcrossThreads()
{
    QObject sender;
    std::atomic<int> calls{0};
    ZuScopedConnection kept(
        QObject::connect(&sender, &QObject::objectNameChanged, [&calls] { ++calls; }));
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([kept] {
            for (int i = 0; i < 20000; ++i) {
                ZuScopedConnection copy = kept;
                ZuScopedConnection other;
                other = copy;
                copy.disconnect();
            }
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    sender.setObjectName(QStringLiteral("one"));
    QCOMPARE(calls.load(), 1);
    kept.disconnect();
    sender.setObjectName(QStringLiteral("two"));
    QCOMPARE(calls.load(), 1);
}

void TestConvert::messageHandler_data()
{
    QTest::addColumn<QtMsgType>("type");
    QTest::addColumn<QByteArray>("category"); // null: no category
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("level");
    QTest::addColumn<QString>("logged");
    QTest::addColumn<bool>("callback");
    QTest::newRow("debug") << QtDebugMsg << QByteArray("zu.test") << "d" << 0 << "zu.test: d"
                           << false;
    QTest::newRow("info") << QtInfoMsg << QByteArray("zu.test") << "i" << 1 << "zu.test: i"
                          << false;
    QTest::newRow("warning") << QtWarningMsg << QByteArray("default") << "w" << 2 << "default: w"
                             << false;
    QTest::newRow("critical") << QtCriticalMsg << QByteArray("zu.test") << "c" << 3 << "zu.test: c"
                              << true;
    QTest::newRow("fatal") << QtFatalMsg << QByteArray() << "f" << 4 << "f" << true;
    QTest::newRow("unknown type") << QtMsgType(42) << QByteArray() << "u" << 3 << "u" << true;
    QTest::newRow("percent signs stay")
        << QtCriticalMsg << QByteArray() << "100% %s %d" << 3 << "100% %s %d" << true;
    QTest::newRow("empty category") << QtWarningMsg << QByteArray("") << "e" << 2 << "e" << false;
}

void TestConvert::messageHandler()
{
    QFETCH(QtMsgType, type);
    QFETCH(QByteArray, category);
    QFETCH(QString, text);
    QFETCH(int, level);
    QFETCH(QString, logged);
    QFETCH(bool, callback);

    sCallbackTexts.clear();
    getTheLogInstance().setWriteCallback(&writeCallback, RkLogDebug);
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
    if (callback)
        expectedCallback.push_back(logged.toStdString());
    expectedCallback.push_back("after");
    QCOMPARE(sCallbackTexts, expectedCallback);
}

QTEST_MAIN(TestConvert)
#include "tst_convert.moc"
