// The core runtime layer: failure records (reported wherever a family reports one), the log, and
// the value types the library builds on: handles in arrays, versions, file names, its thread.
#include "TestSupport.h"

#include "rklib/RkCheck.h"
#include "rklib/RkDArray.h"
#include "rklib/RkFilename.h"
#include "rklib/RkHandle.h"
#include "rklib/RkLogFile.h"
#include "rklib/RkThread.h"
#include "rklib/RkVersion.h"

#include <atomic>
#include <memory>
#include <thread>

#include <fcntl.h>
#include <unistd.h>

namespace {

// "ok" or "bad", then the records with a source line as "(#)".
QString described(const RkResult& inResult)
{
    return QString(inResult.isBad() ? "bad " : "ok ") +
           QString::fromStdString(inResult.toString())
               .replace(QRegularExpression(R"(\([1-9]\d*\))"), "(#)");
}

QStringList sCallbackLines; // "<level> <text>"
void recordCallback(RkLogLevel inLevel, const RkString& inText)
{
    sCallbackLines << QString("%1 %2").arg(inLevel).arg(QString::fromStdString(inText.str()));
}

// Runs inWork with standard error going to a file and gives what was written there.
template <typename Work> QStringList standardError(const QString& inFile, Work inWork)
{
    std::fflush(stderr);
    const int saved = dup(STDERR_FILENO);
    QFile file(inFile);
    if (!file.open(QIODevice::WriteOnly))
        return {"cannot open " + inFile};
    dup2(file.handle(), STDERR_FILENO);
    inWork();
    std::fflush(stderr);
    dup2(saved, STDERR_FILENO);
    close(saved);
    file.close();
    file.open(QIODevice::ReadOnly);
    return QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
}

struct Counted : RkHandable
{
    explicit Counted(int* inDeaths) : mDeaths(inDeaths) {}
    ~Counted() override { ++*mDeaths; }
    int* mDeaths;
};

} // namespace

class TestRkLib : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void checkRecords();
    void qualifiedFunctionName_data();
    void qualifiedFunctionName();
    void writeCallbackLevelsAndDisabler();
    void captureAndSinks();
    void logLevelFromEnvironment();
    void logFileFromEnvironment();
    void handlesAndArrays();
    void versionsAndFilenames();
    void threadWaitTimesOut();
};

void TestRkLib::checkRecords()
{
    const QString where = "bad tst_rklib:TestRkLib::checkRecords(#): ";
    const int value = 7;
    QCOMPARE(described(RK_CHECK(value > 0, "value>0", "Internal Error")), "ok ");
    QCOMPARE(described(RK_CHECK(value < 0, "value<0", "Internal Error")),
             where + "Internal Error  cond[value<0]");
    QCOMPARE(described(RK_CHECK_EQ(value, 1, QStringLiteral("count"))),
             where + "count  val[7]  exp[1]");
    QCOMPARE(described(RK_CHECK_NE(QStringLiteral("x"), "x", "not x")),
             where + "not x  val[x]  notexp[x]");
}

void TestRkLib::qualifiedFunctionName_data()
{
    QTest::addColumn<QString>("pretty");
    QTest::addColumn<QString>("name");
    const auto row = [](const char* inRow, const char* inPretty, const char* inName) {
        QTest::newRow(inRow) << inPretty << inName;
    };
    row("template return", "QMap<QString, int> Zu::Foo::bar(int)", "Zu::Foo::bar");
    row("operator call", "bool Zu::Less::operator()(int) const", "Zu::Less::operator()");
    row("operator less", "bool Zu::Key::operator<(const Zu::Key&) const", "Zu::Key::operator<");
    row("operator at the start", "operator bool()", "operator bool");
    row("lambda inside", "ZuBase::Process::start(bool)::<lambda()>", "ZuBase::Process::start");
    row("reference at the name", "int &ZuX::at(int)", "ZuX::at");
    row("no parameter list", "ZuX::value", "ZuX::value");
    row("call type in a template", "std::function<void(int)> Zu::X::f(int)", "Zu::X::f");
    row("member of a class template", "void Zu::Pair<A, B>::swap(int)", "Zu::Pair<A, B>::swap");
}

void TestRkLib::qualifiedFunctionName()
{
    QFETCH(QString, pretty);
    QFETCH(QString, name);
    QCOMPARE(QString::fromStdString(Rk::qualifiedFunctionName(pretty.toUtf8().constData())), name);
    // Family folders and any prefix before src/ are not part of the where text.
    QCOMPARE(Rk::sourceFamily("/work/x/src/core/zubase/File.cpp"),
             std::string("src/core/zubase/File"));
    QCOMPARE(Rk::sourceFamily("../../src/core/zubase/system/Pipe.cpp"),
             std::string("src/core/zubase/Pipe"));
    QCOMPARE(Rk::sourceFamily("C:\\b\\tests\\tst_x.cpp"), std::string("tst_x"));
}

void TestRkLib::writeCallbackLevelsAndDisabler()
{
    sCallbackLines.clear();
    RkLogFile& log = getTheLogInstance();
    log.setWriteCallback(&recordCallback, RkLogWarning);
    log.tracef(RkLogInfo, "T", "info %d", 1);
    log.warnf("warn %s", "x");
    {
        RkLogFileWriteCallbackDisabler disabler;
        disabler.disableWriteCallback();
        disabler.disableWriteCallback(); // once is enough to restore
        log.errorf("hidden");
        // Another thread is not affected by this thread's disabler.
        std::thread([&log] { log.errorf("other thread"); }).join();
        disabler.restoreWriteCallback();
        log.errorf("shown");
        disabler.disableWriteCallback();
    } // restored by the destructor
    log.print("C", "after scope");
    log.tracef(RkLogFatal, "C", "fatal");
    log.setWriteCallback(nullptr, RkLogOff);
    log.errorf("removed");
    QCOMPARE(sCallbackLines, QStringList({"2 warn x", "3 other thread", "3 shown", "4 fatal"}));
}

void TestRkLib::captureAndSinks()
{
    RkLogCapture capture;
    RkLogFile& log = getTheLogInstance();
    const std::string longText(700, 'y'); // longer than the first formatting buffer
    log.printf("%s|", longText.c_str());
    log.tracef(RkLogDebug, "ZuBase", "a\nb");
    log.errorf("plain %d", 3);
    QCOMPARE(capture.texts(), std::vector<std::string>({longText + "|", "a\nb", "plain 3"}));
    QCOMPARE(capture.texts("ZuBase"), std::vector<std::string>({"a\nb"}));
    QCOMPARE(capture.lines(),
             std::vector<std::string>({"I " + longText + "|", "D ZuBase: a\\nb", "E plain 3"}));
    QCOMPARE(capture.entries().at(2).thread, long(gettid()));

    // A removed sink is not called again.
    int calls = 0;
    const int sink = log.addSink([&calls](const RkLogEntry&) { ++calls; });
    log.printf("one");
    log.removeSink(sink);
    log.printf("two");
    QVERIFY(calls == 1 && capture.texts().size() == 5);
}

void TestRkLib::logLevelFromEnvironment()
{
    // 0 to 5 are taken; anything else is said on standard error and the default kept.
    QTemporaryDir dir;
    const std::tuple<const char*, RkLogLevel, int> cases[] = {
        {"0", RkLogDebug, 0}, {"5", RkLogOff, 0},  {"", RkLogInfo, 0},
        {"-1", RkLogInfo, 1}, {"6", RkLogInfo, 1}, {"verbose", RkLogInfo, 1}};
    for (const auto& [value, level, said] : cases) {
        qputenv("ZUBASE_LOG_LEVEL", value);
        RkLogLevel read = RkLogFatal;
        const QStringList errors =
            standardError(dir.filePath("stderr"), [&read] { read = RkLogFile().outputLevel(); });
        QCOMPARE(read, level);
        QCOMPARE(errors.size(), said);
    }
    qunsetenv("ZUBASE_LOG_LEVEL");
}

void TestRkLib::logFileFromEnvironment()
{
    // A file and a level from the environment, taken without a word; one call is one line,
    // whatever the text holds.
    QTemporaryDir dir;
    const QString path = dir.filePath("log.txt");
    qputenv("ZUBASE_LOG_FILE", path.toLocal8Bit());
    qputenv("ZUBASE_LOG_LEVEL", "2");
    std::unique_ptr<RkLogFile> made;
    QCOMPARE(standardError(dir.filePath("stderr"), [&made] { made.reset(new RkLogFile); }),
             QStringList());
    made->printf("not written");
    made->tracef(RkLogOff, "ZuBase", "never written");
    const QString today = QDate::currentDate().toString("yyyy-MM-dd");
    made->tracef(RkLogWarning, "ZuBase", "value [%s]", "a\nE Tz: forged\r\x1b[2J\tb");
    // The children the library starts must not inherit the log file.
    bool closedOnExec = false;
    for (const QFileInfo& fd : QDir("/proc/self/fd").entryInfoList(QDir::Files | QDir::System))
        if (fd.symLinkTarget() == path)
            closedOnExec = fcntl(fd.fileName().toInt(), F_GETFD) & FD_CLOEXEC;
    QVERIFY(closedOnExec);
    QFile file(path); // read while the log is open: each line is there at once
    QVERIFY(file.open(QIODevice::ReadOnly));
    const QStringList lines = QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
    QCOMPARE(lines.size(), 1);
    QVERIFY2(QRegularExpression("^" + today +
                                R"( \d\d:\d\d:\d\d\.\d{3} \[\d+\] W ZuBase: )"
                                R"(value \[a\\nE Tz: forged\\r\\x1b\[2J\tb\]$)")
                 .match(lines[0])
                 .hasMatch(),
             qPrintable(lines[0]));

    // What cannot be used is said on standard error when the log is made; the defaults stay.
    const QString missing = dir.filePath("missing/log.txt");
    qputenv("ZUBASE_LOG_FILE", missing.toLocal8Bit());
    qputenv("ZUBASE_LOG_LEVEL", "1x");
    RkLogLevel level = RkLogOff;
    const QStringList said = standardError(dir.filePath("stderr"), [&level] {
        RkLogFile log;
        level = log.outputLevel();
        log.printf("to standard error");
    });
    qunsetenv("ZUBASE_LOG_FILE");
    qunsetenv("ZUBASE_LOG_LEVEL");
    QCOMPARE(level, RkLogInfo);
    QCOMPARE(said.size(), 3);
    QCOMPARE(said[0], "zubase: ZUBASE_LOG_LEVEL \"1x\" is no level from 0 to 5; the log keeps "
                      "level 1");
    QCOMPARE(said[1], "zubase: cannot open ZUBASE_LOG_FILE \"" + missing +
                          "\" (No such file or directory); the log goes to standard error");
    QVERIFY(said[2].endsWith(" I to standard error"));
}

void TestRkLib::handlesAndArrays()
{
    int deaths = 0;
    {
        RkHandle<Counted> a(new Counted(&deaths));
        RkHandle<Counted> b = a;
        RkHandle<Counted> c(std::move(b));
        QVERIFY(b.isNull() && c.isNotNull() && a->refCount() == 2);
        a = a; // self-assignment keeps the object
        a = RkHandle<Counted>(new Counted(&deaths));
        c.clear();
        QCOMPARE(deaths, 1);

        RkDArray<RkHandle<Counted>> array;
        for (int i = 0; i < 1000; ++i)
            array.append(RkHandle<Counted>(new Counted(&deaths)));
        array.append(array[0]); // an element of the array itself, across a reallocation
        RkDArray<RkHandle<Counted>> copy = array;
        array.removeAt(5);
        QVERIFY(array[999].get() == copy[0].get() && array[5].get() == copy[6].get());
        QCOMPARE(copy[6]->refCount(), 2);
        copy.clear();
        QCOMPARE(deaths, 2);
    }
    QCOMPARE(deaths, 1002);
}

void TestRkLib::versionsAndFilenames()
{
    // Components compare as numbers; missing ones count as 0, text after the digits not at all.
    QVERIFY(RkVersion("1.9") < RkVersion("1.10") && !(RkVersion("1.10") < RkVersion("1.9")));
    QVERIFY(RkVersion("1.2") == RkVersion("1.2.0") && RkVersion("3.1beta") == RkVersion("3.1"));
    QCOMPARE(RkVersion("7.4.12").majorVersion() * 10 + RkVersion("7.4.12").minorVersion(), 74);

    RkString dir;
    RkFilename::dirname("C:\\data\\x.ini", dir);
    QCOMPARE(dir, RkString("C:\\data"));
    RkFilename::dirname("file", dir);
    QVERIFY(dir == RkString(".") && RkFilename("file").isRelative() &&
            !RkFilename("/x").isRelative());
    RkFilename joined("C:\\a\\");
    QCOMPARE(joined.appendFile("/b").fixSlashes(), RkString("C:/a/b"));
}

void TestRkLib::threadWaitTimesOut()
{
    struct Looper : RkThread
    {
        std::atomic<bool> stop{false};
        void run() override
        {
            while (!stop)
                msleep(1);
        }
    } looper;
    QVERIFY(looper.wait(0)); // never started
    looper.start();
    QVERIFY(!looper.wait(20) && looper.isRunning());
    looper.stop = true;
    QVERIFY(looper.wait(RkThread::Forever) && !looper.isRunning());
}

QTEST_GUILESS_MAIN(TestRkLib)
#include "tst_rklib.moc"
