// Processes: command line, environment and log block as the child and the log see them,
// suspension, end and exit codes, termination, listings, elevation and exit.
#include "TestSupport.h"

#include "zubase/Process.h"
#include "zubase/ZuProcess.h"
#include "zubase/platform/SysProcess.h"

#include "rklib/RkDbC.h"

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

using TestSupport::failureLines;
using TestSupport::helper;
using TestSupport::logLines;

namespace {

const QString kWhere = QStringLiteral("src/core/zubase/Process:ZuBase::Process::");

// The values of one kind that zu_dump wrote ("cwd", "fds", "arg" or "env"), in order.
QStringList dumped(const QString& inPath, const QByteArray& inKey)
{
    QStringList values;
    QFile file(inPath);
    if (file.open(QIODevice::ReadOnly))
        for (const QByteArray& line : file.readAll().split('\n'))
            if (line.startsWith(inKey + '\t'))
                values << QString::fromLocal8Bit(line.mid(inKey.size() + 1));
    return values;
}

QString fakeElevationTool()
{
    return helper("elevation") + "/pkexec";
}

} // namespace

class TestProcess : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void logBlock();
    void startFailures_data();
    void startFailures();
    void childSeesItsStart_data();
    void childSeesItsStart();
    void suspendedThenEnds_data();
    void suspendedThenEnds();
    void listings();
    void elevatedStart();
    void startsTheCheckedFile_data();
    void startsTheCheckedFile();
    void elevationInformation();
    void exitWithAndWithoutCallback();
    void zuProcessStandardStreams();

private:
    // A process of inExe with inArguments, not started yet.
    void prepare(ZuBase::Process& ioProcess, const QString& inExe, const QStringList& inArguments)
    {
        ioProcess.mExePath = inExe;
        ioProcess.mArguments = inArguments;
    }
    QString nextDumpPath() { return mTemp.filePath(QStringLiteral("dump%1").arg(++mDumpCount)); }
    QTemporaryDir mTemp;
    int mDumpCount = 0;
};

void TestProcess::initTestCase()
{
    QVERIFY(mTemp.isValid());
    ZuPlatform::setElevationTool(fakeElevationTool().toStdString());
}

void TestProcess::logBlock()
{
    RkLogCapture capture;
    ZuBase::Process process;
    prepare(process, "/nonexistent/tzserver", {"a", "b"});
    process.mWorkingDirectory = QStringLiteral("/work dir");
    process.mEnvironment = QStringList{"A=1", "", "B=2"};
    QVERIFY(process.start(false, true, false).isBad());
    QCOMPARE(logLines(capture, ""),
             QStringList({"<Process::start() elevate=0>", "  <CommandLine>",
                          "    \"/nonexistent/tzserver\"  a b", "  </CommandLine>", "  <Dir>",
                          "    /work dir", "  </Dir>", "  <Environment inherit=1>", "    [B=2]",
                          "    []", "    [A=1]", "  </Environment>", "</Process::start()>"}));

    // No arguments: the command line ends in one blank after the closing quote.
    capture.clear();
    process.mArguments.clear();
    process.mEnvironment.clear();
    QVERIFY(process.start(true, false, true).isBad());
    const QStringList lines = logLines(capture, "");
    QVERIFY(lines.value(0) == "<Process::start() elevate=1>" &&
            lines.value(2) == "    \"/nonexistent/tzserver\" ");
    QCOMPARE(lines.mid(7, 2), QStringList({"  <Environment inherit=0>", "  </Environment>"}));
}

void TestProcess::startFailures_data()
{
    QTest::addColumn<QString>("exe");
    QTest::addColumn<QString>("directory");
    QTest::addColumn<QString>("tool"); // elevation tool; null: to start unelevated
    QTest::addColumn<QStringList>("failures");

    const QString shellExecute = kWhere + "start: ::ShellExecute  cond[int(hinst)>32]";
    const QString dump = helper("zu_dump");
    QTest::newRow("missing executable")
        << "/nonexistent/tzserver" << QString() << QString()
        << QStringList{kWhere + "start: Internal Error  cond[QFile::exists(mExePath)]"};
    QTest::newRow("no such directory") << dump << "/nonexistent/dir" << QString()
                                       << QStringList{kWhere + "start: ::CreateProcess  cond[b]",
                                                      "last error 2: No such file or directory"};
    QTest::newRow("elevation declined")
        << dump << QString() << fakeElevationTool()
        << QStringList{shellExecute, "last error 13: Permission denied"};
    // The tool is not looked up in PATH, where the stand-in is.
    QTest::newRow("no elevation tool")
        << dump << QString() << "/nonexistent/pkexec"
        << QStringList{shellExecute, "last error 2: No such file or directory"};
    // A tool that cannot be run is no declined request.
    const QString broken = mTemp.filePath("broken-pkexec");
    QFile tool(broken);
    QVERIFY(tool.open(QIODevice::WriteOnly) && tool.write("no program") > 0 &&
            tool.setPermissions(tool.permissions() | QFile::ExeOwner));
    QTest::newRow("elevation tool broken")
        << dump << QString() << broken
        << QStringList{shellExecute, "last error 8: Exec format error"};
}

void TestProcess::startFailures()
{
    QFETCH(QString, exe);
    QFETCH(QString, directory);
    QFETCH(QString, tool);
    QFETCH(QStringList, failures);

    const QByteArray oldPath = qgetenv("PATH");
    qputenv("PATH", helper("elevation").toLocal8Bit());
    qputenv("ZU_FAKE_PKEXEC_DECLINE", "1");
    if (!tool.isNull())
        ZuPlatform::setElevationTool(tool.toStdString());
    const QString dump = nextDumpPath();
    RkLogCapture capture;
    ZuBase::Process process;
    prepare(process, exe, {dump, "0"});
    process.mWorkingDirectory = directory;
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    const RkResult res = process.start(!tool.isNull(), true, false);
    qputenv("PATH", oldPath);
    qunsetenv("ZU_FAKE_PKEXEC_DECLINE");
    ZuPlatform::setElevationTool(fakeElevationTool().toStdString());
    QCOMPARE(failureLines(capture), failures);
    QVERIFY(res.isBad() && process.processId() == 0 && spy.isEmpty() && !QFile::exists(dump));
    // Nothing to end or wait for, and no record for it.
    capture.clear();
    QVERIFY(process.terminate(1).isBad() && !process.isRunning() && process.wait() == -1);
    QVERIFY(capture.entries().empty());
}

void TestProcess::childSeesItsStart_data()
{
    QTest::addColumn<QStringList>("arguments");
    QTest::addColumn<QStringList>("environment");
    QTest::addColumn<bool>("inherit");
    QTest::addColumn<QByteArray>("key"); // what zu_dump reports
    QTest::addColumn<QStringList>("expected");

    QTest::newRow("blank splits") << QStringList{"two words"} << QStringList() << true
                                  << QByteArray("arg") << QStringList{"two", "words"};
    QTest::newRow("quotes and backslashes")
        << QStringList{"\"c:\\dir\\\\\"", "a\\\\b\\", "\"a\"\"b\""} << QStringList() << true
        << QByteArray("arg") << QStringList{"c:\\dir\\", "a\\\\b\\", "a\"b"};
    QTest::newRow("empty environment")
        << QStringList() << QStringList() << false << QByteArray("env") << QStringList();
    QTest::newRow("unusable entries dropped")
        << QStringList() << QStringList{"", "=hidden", "NOEQUALS", "EMPTY=", "X=a=b"} << false
        << QByteArray("env") << QStringList{"EMPTY=", "X=a=b"};
    // Inherited: the parent's entries, none of the list.
    QTest::newRow("inherit ignores the list")
        << QStringList() << QStringList{"ONLY_IN_LIST=1"} << true << QByteArray("env")
        << QStringList{"ZU_TEST_PARENT_MARK=present"};
    QTest::newRow("given directory") << QStringList() << QStringList() << true << QByteArray("cwd")
                                     << QStringList{QFileInfo(mTemp.path()).canonicalFilePath()};
}

void TestProcess::childSeesItsStart()
{
    QFETCH(QStringList, arguments);
    QFETCH(QStringList, environment);
    QFETCH(bool, inherit);
    QFETCH(QByteArray, key);
    QFETCH(QStringList, expected);

    qputenv("ZU_TEST_PARENT_MARK", "present");
    const QString dump = nextDumpPath();
    ZuBase::Process process;
    prepare(process, helper("zu_dump"), QStringList{dump, "5"} + arguments);
    process.mEnvironment = environment;
    process.mWorkingDirectory = key == "cwd" ? mTemp.path() : QString();
    QVERIFY_OK(process.start(false, inherit, false));
    QVERIFY(process.wait() == 5 && process.exitCode() == 5);
    QCOMPARE(dumped(dump, "fds"), QStringList{"0:null 1:null 2:null "}); // no streams of ours
    const QStringList values = dumped(dump, key);
    if (key == "env" && inherit)
        QVERIFY(values.contains(expected.first()) && !values.contains(environment.first()));
    else
        QCOMPARE(values, expected);
    process.detach();
}

void TestProcess::suspendedThenEnds_data()
{
    QTest::addColumn<int>("code");
    QTest::addColumn<bool>("terminate");
    QTest::addColumn<bool>("resume");
    QTest::newRow("exits 255") << 255 << false << true;
    QTest::newRow("terminated running") << 7 << true << true;
    QTest::newRow("terminated still suspended") << 1234 << true << false;
    QTest::newRow("terminated with the still-running code") << 259 << true << true;
}

void TestProcess::suspendedThenEnds()
{
    QFETCH(int, code);
    QFETCH(bool, terminate);
    QFETCH(bool, resume);

    const std::size_t tracked = ZuPlatform::childrenTracked();
    RkLogCapture capture;
    const QString dump = nextDumpPath();
    ZuBase::Process process;
    prepare(process, helper(terminate ? "zu_sleep" : "zu_dump"),
            terminate ? QStringList{"30000"} : QStringList{dump, QString::number(code)});
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    QVERIFY_OK(process.start(false, true, false));
    const unsigned pid = process.processId();
    QVERIFY(logLines(capture, "").contains(QString("CreateProcess(): success pid[%1]").arg(pid)));

    // Stopped before the program was even loaded: the image is still ours.
    QCOMPARE(QFileInfo(QString("/proc/%1/exe").arg(pid)).canonicalFilePath(),
             QFileInfo(QCoreApplication::applicationFilePath()).canonicalFilePath());
    QTest::qWait(250); // a few polls pass: still nothing
    QVERIFY(process.isRunning() && !QFile::exists(dump) && spy.isEmpty());
    QCOMPARE(process.exitCode(), -1);

    if (resume)
        process.resume();
    if (terminate) {
        QVERIFY_OK(process.terminate(code));
        QCOMPARE(spy.count(), 0); // the polling reports the end
    }
    QTRY_COMPARE_WITH_TIMEOUT(spy.count(), 1, 5000);
    QCOMPARE(QList<int>({process.exitCode(), process.wait()}), QList<int>({code, code}));
    QVERIFY(QFile::exists(dump) != terminate && !process.isRunning());
    QTRY_VERIFY(!QFile::exists(QString("/proc/%1").arg(pid))); // collected, no zombie
    // Once, even when the host also calls the slot.
    process.checkRunning();
    QTest::qWait(150);
    QCOMPARE(spy.count(), 1);
    // Terminating an ended process fails with a record.
    capture.clear();
    QVERIFY(process.terminate(code).isBad());
    QCOMPARE(failureLines(capture).value(0), kWhere + "terminate: ::TerminateProcess  cond[isOk]");
    // Once its handles are closed nothing of the child is kept.
    process.detach();
    QTRY_COMPARE(ZuPlatform::childrenTracked(), tracked);
}

void TestProcess::listings()
{
    // A child whose path is not ASCII, next to this process.
    const QString childExe = mTemp.filePath(QStringLiteral("schläfer ü/zu_sleep"));
    QVERIFY(QDir().mkpath(QFileInfo(childExe).path()) && QFile::copy(helper("zu_sleep"), childExe));
    ZuBase::Process child;
    prepare(child, childExe, {"30000"});
    QVERIFY_OK(child.start(false, true, false));
    child.resume();

    // All processes, in the reverse of the order the system lists them.
    const QStringList system = QDir("/proc").entryList({"[0-9]*"}, QDir::Dirs, QDir::Unsorted);
    QList<QSharedPointer<ZuBase::Process>> list{ZuBase::Process::self()}; // replaced
    const uint descriptors = QDir("/proc/self/fd").count();
    QVERIFY_OK(ZuBase::Process::processes(list));
    QCOMPARE(QDir("/proc/self/fd").count(), descriptors); // none left open
    QStringList listed, common;
    for (const auto& process : list)
        listed << QString::number(process->processId());
    for (const QString& pid : system)
        if (listed.contains(pid))
            common.prepend(pid);
    QCOMPARE(listed.count(QString::number(getpid())), 1);
    QCOMPARE(listed.filter(QRegularExpression("^(" + system.join('|') + ")$")), common);
    const auto listedChild = list.value(listed.indexOf(QString::number(child.processId())));

    // Image and modules (files mapped as code, each once); the kernel names the new image
    // before it has mapped it, so wait for the mapping.
    QStringList modules;
    QTRY_VERIFY(listedChild->modules(modules).isOk() && modules.value(0) == childExe);
    QString image;
    QVERIFY(listedChild->imageFilePath(image).isOk() && image == childExe);
    const QSharedPointer<ZuBase::Process> self = ZuBase::Process::self();
    QVERIFY(self->processId() == unsigned(getpid()) && self->isRunning()); // not our child
    QVERIFY_OK(self->modules(modules));
    QCOMPARE(modules.filter(QRegularExpression("^/")), modules); // files only
    QCOMPARE(modules.value(0),
             QFileInfo(QCoreApplication::applicationFilePath()).canonicalFilePath());
    QCOMPARE(modules.removeDuplicates(), 0);
    const QStringList qtCore = modules.filter(QRegularExpression(R"(/libQt5Core\.so[.0-9]*$)"));
    QCOMPARE(qtCore.size(), 1);
    QVERIFY(modules.filter(QRegularExpression(R"(locale-archive|\.qm$)")).isEmpty());

    // By module: normalised keys, the library also through a link to it.
    const QString link = QFileInfo(qtCore.first()).absolutePath() + "/libQt5Core.so";
    QMultiMap<QString, QSharedPointer<ZuBase::Process>> map;
    QVERIFY_OK(ZuBase::Process::processesByModule({link, childExe, "/nonexistent/x.so"}, map));
    QStringList keys{qtCore.first().toLower(), childExe.toLower()};
    keys.sort();
    QCOMPARE(map.uniqueKeys(), keys);
    QVERIFY(std::any_of(map.begin(), map.end(), [](const auto& inProcess) {
        return inProcess->processId() == unsigned(getpid());
    }));
    const auto byChild = map.values(childExe.toLower());
    QVERIFY(byChild.size() == 1 && byChild.first()->processId() == child.processId());

    // A listed process is watched like any other: its end is seen.
    QVERIFY_OK(listedChild->terminate(3));
    QCOMPARE(child.wait(), 3);
    child.detach();

    // A process that is gone has neither image nor modules, and says so without a record.
    RkLogCapture capture;
    ZuBase::Process gone;
    QVERIFY(gone.imageFilePath(image).isBad() && gone.modules(modules).isBad());
    QVERIFY(image.isEmpty() && modules.isEmpty() && capture.entries().empty());
}

void TestProcess::elevatedStart()
{
    const QString dump = nextDumpPath();
    RkLogCapture capture;
    ZuBase::Process process;
    prepare(process, helper("zu_dump"), {dump, "0", "two words"});
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    QVERIFY_OK(process.start(true, true, false));
    QCOMPARE(process.processId(), 4711u);
    QTRY_VERIFY(QFile::exists(dump));
    QCOMPARE(dumped(dump, "arg"), QStringList({"two", "words"}));
    QTest::qWait(150);
    QCOMPARE(spy.count(), 0); // an elevated child is not watched
    // The fixed id names no process, even where the system has one of that number.
    pid_t holder = 0;
    for (int i = 0; i < 50 && holder != 4711; ++i) {
        if (holder > 0 && ::kill(holder, SIGKILL) == 0)
            ::waitpid(holder, nullptr, 0);
        QFile lastPid("/proc/sys/kernel/ns_last_pid"); // the next process gets 4711
        if (lastPid.open(QIODevice::WriteOnly))
            lastPid.write("4710");
        lastPid.close();
        holder = ::fork();
        if (holder == 0) {
            ::pause();
            ::_exit(0);
        }
    }
    const bool untouched = !process.isRunning() && process.wait() == -1 &&
                           process.terminate(1).isBad() && ::waitpid(holder, nullptr, WNOHANG) == 0;
    ::kill(holder, SIGKILL);
    ::waitpid(holder, nullptr, 0);
    QVERIFY(untouched);
    QCOMPARE(failureLines(capture),
             QStringList({kWhere + "terminate: ::OpenProcess  cond[hProcess!=0]",
                          "last error 3: No such process"}));

    // A program with our own name (a host relaunching itself) is seen to start at once, and
    // the code it ends with later is its own business, not a declined request.
    const QString self =
        mTemp.filePath(QFileInfo(QCoreApplication::applicationFilePath()).fileName());
    QVERIFY(QFile::copy(helper("zu_sleep"), self));
    capture.clear();
    prepare(process, self, {"3000", "126"});
    QElapsedTimer timer;
    timer.start();
    QVERIFY_OK(process.start(true, true, false));
    QVERIFY2(timer.elapsed() < 2500, qPrintable(QString::number(timer.elapsed())));
    QVERIFY(process.processId() == 4711 && failureLines(capture).isEmpty());
}

void TestProcess::startsTheCheckedFile_data()
{
    QTest::addColumn<bool>("elevate");
    QTest::newRow("unelevated") << false;
    QTest::newRow("elevated") << true;
}

void TestProcess::startsTheCheckedFile()
{
    QFETCH(bool, elevate);
    // "zuprog" in the current folder is what start() checks; another one waits in PATH.
    QTemporaryDir here, onPath;
    QVERIFY(QFile::copy(helper("zu_dump"), here.filePath("zuprog")));
    QVERIFY(QFile::copy(helper("zu_sleep"), onPath.filePath("zuprog")));
    const QString previous = QDir::currentPath();
    const QByteArray oldPath = qgetenv("PATH");
    QDir::setCurrent(here.path());
    qputenv("PATH", onPath.path().toLocal8Bit());
    const QString dump = nextDumpPath();
    ZuBase::Process process;
    prepare(process, "zuprog", {dump, "0"});
    const RkResult res = process.start(elevate, true, false);
    QDir::setCurrent(previous);
    qputenv("PATH", oldPath);
    QVERIFY_OK(res);
    process.resume(); // an unelevated child starts suspended
    QTRY_VERIFY(QFile::exists(dump));
    process.detach();
}

void TestProcess::elevationInformation()
{
    // Root is elevated and an administrator; the answers are kept.
    const bool elevated = ZuBase::Process::elevated(), admin = ZuBase::Process::userIsAdmin();
    QVERIFY(elevated == (geteuid() == 0) && (admin || !elevated));
    QVERIFY(ZuBase::Process::elevated() == elevated && ZuBase::Process::userIsAdmin() == admin);
}

void TestProcess::exitWithAndWithoutCallback()
{
    // With a callback, exit() returns to its caller, and the log's callback is gone first so
    // that nothing reaches a host that is going away.
    static int logCalls = 0, exitCode = -1;
    static QString exitMessage;
    getTheLogInstance().setWriteCallback([](RkLogLevel, const RkString&) { ++logCalls; },
                                         RkLogDebug);
    getTheLogInstance().printf("seen by the callback");
    ZuBase::Process::setExitCallback([](int inCode, QString inMessage) {
        exitCode = inCode;
        exitMessage = inMessage;
    });
    rk_DbC_callbackSet(
        [](DbCEventType, const char*, const char*, unsigned, const char*, const char*) {});
    ZuBase::Process::exit(5, QStringLiteral("bye"));
    QVERIFY(!rk_DbC_callback());
    ZuBase::Process::setExitCallback(nullptr);
    getTheLogInstance().printf("not seen");
    QVERIFY(exitCode == 5 && logCalls == 1 && exitMessage == "bye");

    // Without one, the process ends with the code.
    const pid_t pid = fork();
    if (pid == 0) {
        ZuBase::Process::exit(9, QString());
        _exit(1); // not reached when exit() ends the process
    }
    int status = 0;
    QVERIFY(waitpid(pid, &status, 0) == pid && WIFEXITED(status) && WEXITSTATUS(status) == 9);
}

void TestProcess::zuProcessStandardStreams()
{
    for (const bool closeStreams : {true, false}) {
        const QString dump = nextDumpPath();
        ZuProcess process(nullptr, closeStreams);
        process.start(helper("zu_dump"), {dump, "4"});
        QVERIFY(process.stableWaitForFinished(10000) && process.exitCode() == 4);
        QCOMPARE(dumped(dump, "fds").value(0).trimmed(),
                 closeStreams ? "0:closed 1:closed 2:closed" : "0:open 1:open 2:open");
    }
}

QTEST_GUILESS_MAIN(TestProcess)
#include "tst_process.moc"
