// Failure records and the log they go to. (How records are reported is checked wherever a
// family reports one.)
#include "TestSupport.h"

#include "rklib/RkCheck.h"
#include "rklib/RkLogFile.h"

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

std::vector<std::pair<RkLogLevel, std::string>> sCallbackLines;
void recordCallback(RkLogLevel inLevel, const RkString& inText)
{
    sCallbackLines.emplace_back(inLevel, inText.str());
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

} // namespace

class TestRkLog : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void checkRecords_data();
    void checkRecords();
    void qualifiedFunctionName_data();
    void qualifiedFunctionName();
    void writeCallbackLevelsAndDisabler();
    void captureAndSinks();
    void logLevelFromEnvironment();
    void logFileFromEnvironment();
};

void TestRkLog::checkRecords_data()
{
    QTest::addColumn<QString>("result");
    QTest::addColumn<QString>("expected");
    const QString where = "bad tst_rklog:TestRkLog::checkRecords_data(#): ";
    const int value = 7;
    QTest::newRow("cond holds") << described(RK_CHECK(value > 0, "value>0", "Internal Error"))
                                << "ok ";
    QTest::newRow("cond fails") << described(RK_CHECK(value < 0, "value<0", "Internal Error"))
                                << where + "Internal Error  cond[value<0]";
    QTest::newRow("eq holds") << described(RK_CHECK_EQ(value, 7, "count")) << "ok ";
    QTest::newRow("eq fails") << described(RK_CHECK_EQ(value, 1, QStringLiteral("count")))
                              << where + "count  val[7]  exp[1]";
    QTest::newRow("ne fails") << described(RK_CHECK_NE(QStringLiteral("x"), "x", "not x"))
                              << where + "not x  val[x]  notexp[x]";
}

void TestRkLog::checkRecords()
{
    QFETCH(QString, result);
    QFETCH(QString, expected);
    QCOMPARE(result, expected);
}

void TestRkLog::qualifiedFunctionName_data()
{
    QTest::addColumn<QString>("pretty");
    QTest::addColumn<QString>("name");
    const auto row = [](const char* inRow, const char* inPretty, const char* inName) {
        QTest::newRow(inRow) << inPretty << inName;
    };
    row("static member",
        "static RkResult ZuBase::Command::create(RkHandle<ZuBase::Command>&, const QString&)",
        "ZuBase::Command::create");
    row("template return", "QMap<QString, int> Zu::Foo::bar(int)", "Zu::Foo::bar");
    row("constructor", "ZuBase::Pipe::Pipe(const QString&)", "ZuBase::Pipe::Pipe");
    row("operator call", "bool Zu::Less::operator()(int) const", "Zu::Less::operator()");
    row("operator less", "bool Zu::Key::operator<(const Zu::Key&) const", "Zu::Key::operator<");
    row("operator at the start", "operator bool()", "operator bool");
    row("lambda inside", "ZuBase::Process::start(bool)::<lambda()>", "ZuBase::Process::start");
    row("pointer at the name", "char *ZuX::name() const", "ZuX::name");
    row("reference at the name", "int &ZuX::at(int)", "ZuX::at");
    row("no parameter list", "ZuX::value", "ZuX::value");
    row("call type in a template", "std::function<void(int)> Zu::X::f(int)", "Zu::X::f");
    row("member of a class template", "void Zu::Pair<A, B>::swap(int)", "Zu::Pair<A, B>::swap");
}

void TestRkLog::qualifiedFunctionName()
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

void TestRkLog::writeCallbackLevelsAndDisabler()
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
    const std::vector<std::pair<RkLogLevel, std::string>> expected = {{RkLogWarning, "warn x"},
                                                                      {RkLogError, "other thread"},
                                                                      {RkLogError, "shown"},
                                                                      {RkLogFatal, "fatal"}};
    QCOMPARE(sCallbackLines, expected);
}

void TestRkLog::captureAndSinks()
{
    RkLogCapture capture;
    RkLogFile& log = getTheLogInstance();
    const std::string longText(700, 'y'); // longer than the first formatting buffer
    log.printf("%s|", longText.c_str());
    log.print("ZuBase", "a\nb");
    log.errorf("plain %d", 3);
    QCOMPARE(capture.texts(), std::vector<std::string>({longText + "|", "a\nb", "plain 3"}));
    QCOMPARE(capture.texts("ZuBase"), std::vector<std::string>({"a\nb"}));
    QCOMPARE(capture.lines(),
             std::vector<std::string>({"I " + longText + "|", "I ZuBase: a\\nb", "E plain 3"}));
    QCOMPARE(capture.entries().at(2).thread, long(gettid()));
    capture.clear();
    QVERIFY(capture.entries().empty());

    // A removed sink is not called again.
    int calls = 0;
    const int sink = log.addSink([&calls](const RkLogEntry&) { ++calls; });
    log.printf("one");
    log.removeSink(sink);
    log.printf("two");
    QCOMPARE(calls, 1);
    QCOMPARE(capture.texts().size(), std::size_t(2));
}

void TestRkLog::logLevelFromEnvironment()
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

void TestRkLog::logFileFromEnvironment()
{
    // A file and a level from the environment; one call is one line, whatever the text holds.
    QTemporaryDir dir;
    const QString path = dir.filePath("log.txt");
    qputenv("ZUBASE_LOG_FILE", path.toLocal8Bit());
    qputenv("ZUBASE_LOG_LEVEL", "2");
    RkLogFile log;
    log.printf("not written");
    log.tracef(RkLogOff, "ZuBase", "never written");
    log.tracef(RkLogWarning, "ZuBase", "value [%s]", "a\nE Tz: forged\r\x1b[2J\tb");
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
    QVERIFY2(QRegularExpression(R"(^\d{4}-\d\d-\d\d \d\d:\d\d:\d\d\.\d{3} \[\d+\] W ZuBase: )"
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

QTEST_GUILESS_MAIN(TestRkLog)
#include "tst_rklog.moc"
