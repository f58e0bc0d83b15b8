// Processes: command line, environment and log block as the child and the log see them,
// suspension, end and exit codes, termination, listings, elevation and exit.
#include "zubase/Process.h"
#include "zubase/ZuProcess.h"

#include "rklib/RkLogFile.h"

#include <QDir>
#include <QElapsedTimer>
#include <QFile>
#include <QRegularExpression>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QtTest>

#include <cstdio>

#include <dirent.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

const QString sHelpers = QStringLiteral(ZUBASE_TEST_HELPER_DIR);
const QString sWhere = QStringLiteral("src/core/zubase/Process:ZuBase::Process::");

QString helper(const char* inName)
{
    return sHelpers + '/' + QLatin1String(inName);
}

// Failure lines of the log without their source line numbers.
QStringList failureLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const std::string& text : inCapture.texts("Tz"))
        lines << QString::fromStdString(text).replace(QRegularExpression(R"(\(\d+\): )"), ": ");
    return lines;
}

QStringList uncategorised(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries())
        if (entry.category.empty())
            lines << QString::fromStdString(entry.text);
    return lines;
}

// What zu_dump wrote: "cwd", "fds", "arg" and "env" lines.
struct Dump
{
    QString cwd;
    QString fds;
    QStringList args;
    QStringList env;
};

Dump readDump(const QString& inPath)
{
    Dump dump;
    QFile file(inPath);
    if (!file.open(QIODevice::ReadOnly))
        return dump;
    for (const QByteArray& line : file.readAll().split('\n')) {
        const int tab = line.indexOf('\t');
        if (tab < 0)
            continue;
        const QByteArray key = line.left(tab);
        const QString value = QString::fromLocal8Bit(line.mid(tab + 1));
        if (key == "cwd")
            dump.cwd = value;
        else if (key == "fds")
            dump.fds = value.trimmed();
        else if (key == "arg")
            dump.args << value;
        else if (key == "env")
            dump.env << value;
    }
    return dump;
}

char procState(unsigned inPid)
{
    QFile stat(QStringLiteral("/proc/%1/stat").arg(inPid));
    if (!stat.open(QIODevice::ReadOnly))
        return '\0';
    const QByteArray text = stat.readAll();
    const int close = text.lastIndexOf(')');
    return close >= 0 && close + 2 < text.size() ? text.at(close + 2) : '\0';
}

// Children of this process that have ended and were not collected.
QList<unsigned> zombieChildren()
{
    QList<unsigned> zombies;
    const QString self = QString::number(getpid());
    for (const QString& entry : QDir(QStringLiteral("/proc")).entryList(QDir::Dirs)) {
        bool isPid = false;
        const unsigned pid = entry.toUInt(&isPid);
        if (!isPid)
            continue;
        QFile stat(QStringLiteral("/proc/%1/stat").arg(entry));
        if (!stat.open(QIODevice::ReadOnly))
            continue;
        const QByteArray text = stat.readAll();
        const QList<QByteArray> fields = text.mid(text.lastIndexOf(')') + 2).split(' ');
        if (fields.size() > 1 && fields[0] == "Z" && fields[1] == self.toLatin1())
            zombies << pid;
    }
    return zombies;
}

struct ExitCall
{
    int code = -1;
    QString message;
};
ExitCall sExitCall;
void recordExit(int inCode, QString inMessage)
{
    sExitCall.code = inCode;
    sExitCall.message = inMessage;
}
int sLogCallbackCalls = 0;
void countLogCallback(RkLogLevel, const RkString&)
{
    ++sLogCallbackCalls;
}

} // namespace

class TestProcess : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void cleanupTestCase();
    void logBlockAndMissingExecutable();
    void argumentsReachChild_data();
    void argumentsReachChild();
    void environment_data();
    void environment();
    void workingDirectory_data();
    void workingDirectory();
    void creationFailures_data();
    void creationFailures();
    void suspendedUntilResume();
    void terminatedOnceWithExitCode_data();
    void terminatedOnceWithExitCode();
    void terminate_data();
    void terminate();
    void terminateWithoutProcess();
    void processListing();
    void modulesOfSelf();
    void imageOfNonAsciiPath();
    void elevatedStart_data();
    void elevatedStart();
    void elevationInformation();
    void exitWithCallback();
    void exitWithoutCallback();
    void zuProcessStandardStreams_data();
    void zuProcessStandardStreams();

private:
    QTemporaryDir mTemp;
    int mDumpCount = 0;
    QString nextDumpPath() { return mTemp.filePath(QStringLiteral("dump%1").arg(++mDumpCount)); }
};

void TestProcess::initTestCase()
{
    QVERIFY(mTemp.isValid());
    QVERIFY(QFile::exists(helper("zu_dump")));
}

void TestProcess::cleanupTestCase()
{
    // Every child of the run has been collected, whether its end was asked for or not.
    QTRY_COMPARE_WITH_TIMEOUT(zombieChildren(), QList<unsigned>(), 5000);
}

void TestProcess::logBlockAndMissingExecutable()
{
    RkLogCapture capture;
    ZuBase::Process process;
    process.mExePath = QStringLiteral("/nonexistent/tzserver");
    process.mArguments = QStringList{"a", "b"};
    process.mWorkingDirectory = QStringLiteral("/work dir");
    process.mEnvironment = QStringList{"A=1", "", "B=2"};
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    const RkResult res = process.start(false, true, false);
    QVERIFY(res.isBad());
    QCOMPARE(process.processId(), 0u);
    QCOMPARE(spy.count(), 0);
    QCOMPARE(uncategorised(capture),
             QStringList({"<Process::start() elevate=0>", "  <CommandLine>",
                          "    \"/nonexistent/tzserver\"  a b", "  </CommandLine>", "  <Dir>",
                          "    /work dir", "  </Dir>", "  <Environment inherit=1>", "    [B=2]",
                          "    []", "    [A=1]", "  </Environment>", "</Process::start()>"}));
    QCOMPARE(failureLines(capture),
             QStringList{sWhere + "start: Internal Error  cond[QFile::exists(mExePath)]"});

    // No arguments: the command line ends in one blank after the closing quote.
    capture.clear();
    process.mArguments.clear();
    process.mEnvironment.clear();
    QVERIFY(process.start(true, false, true).isBad());
    const QStringList lines = uncategorised(capture);
    QCOMPARE(lines.value(0), QStringLiteral("<Process::start() elevate=1>"));
    QCOMPARE(lines.value(2), QStringLiteral("    \"/nonexistent/tzserver\" "));
    QCOMPARE(lines.value(7), QStringLiteral("  <Environment inherit=0>"));
    QCOMPARE(lines.value(8), QStringLiteral("  </Environment>"));
}

void TestProcess::argumentsReachChild_data()
{
    QTest::addColumn<QStringList>("arguments");
    QTest::addColumn<QStringList>("received");

    QTest::newRow("none") << QStringList() << QStringList();
    QTest::newRow("plain") << QStringList{"one", "two"} << QStringList{"one", "two"};
    QTest::newRow("blank splits") << QStringList{"two words"} << QStringList{"two", "words"};
    QTest::newRow("caller quotes")
        << QStringList{"\"two words\"", "x"} << QStringList{"two words", "x"};
    QTest::newRow("tab splits") << QStringList{"a\tb"} << QStringList{"a", "b"};
    QTest::newRow("empty quoted") << QStringList{"\"\""} << QStringList{""};
    QTest::newRow("backslashes plain") << QStringList{"a\\\\b\\"} << QStringList{"a\\\\b\\"};
    QTest::newRow("escaped quote") << QStringList{"a\\\"b"} << QStringList{"a\"b"};
    QTest::newRow("backslash before quote")
        << QStringList{"\"c:\\dir\\\\\"", "next"} << QStringList{"c:\\dir\\", "next"};
    QTest::newRow("three backslashes") << QStringList{"a\\\\\\\"b"} << QStringList{"a\\\"b"};
    QTest::newRow("doubled quote in quotes") << QStringList{"\"a\"\"b\""} << QStringList{"a\"b"};
    QTest::newRow("quote mid word") << QStringList{"x\"y z\"w"} << QStringList{"xy zw"};
    QTest::newRow("only blank") << QStringList{" "} << QStringList();
}

void TestProcess::argumentsReachChild()
{
    QFETCH(QStringList, arguments);
    QFETCH(QStringList, received);

    const QString dump = nextDumpPath();
    ZuBase::Process process;
    process.mExePath = helper("zu_dump");
    process.mArguments = QStringList{dump, "5"} + arguments;
    QVERIFY(process.start(false, true, false).isOk());
    QCOMPARE(process.wait(), 5);
    QCOMPARE(process.exitCode(), 5);
    QCOMPARE(readDump(dump).args, received);
    process.detach();
}

void TestProcess::environment_data()
{
    QTest::addColumn<QStringList>("entries");
    QTest::addColumn<bool>("inherit");
    QTest::addColumn<QStringList>("received"); // null: the parent's environment

    QTest::newRow("empty block") << QStringList() << false << QStringList();
    QTest::newRow("entries in order")
        << QStringList{"B=2", "A=1"} << false << QStringList{"B=2", "A=1"};
    QTest::newRow("unusable entries dropped")
        << QStringList{"", "=hidden", "NOEQUALS", "EMPTY=", "X=a=b"} << false
        << QStringList{"EMPTY=", "X=a=b"};
    QTest::newRow("inherit ignores the list")
        << QStringList{"ONLY_IN_LIST=1"} << true << QStringList();
}

void TestProcess::environment()
{
    QFETCH(QStringList, entries);
    QFETCH(bool, inherit);
    QFETCH(QStringList, received);

    qputenv("ZU_TEST_PARENT_MARK", "present");
    const QString dump = nextDumpPath();
    ZuBase::Process process;
    process.mExePath = helper("zu_dump");
    process.mArguments = QStringList{dump, "0"};
    process.mEnvironment = entries;
    QVERIFY(process.start(false, inherit, false).isOk());
    QCOMPARE(process.wait(), 0);
    const QStringList env = readDump(dump).env;
    if (inherit) {
        QVERIFY(env.contains("ZU_TEST_PARENT_MARK=present"));
        for (const QString& entry : entries)
            QVERIFY(!env.contains(entry));
    } else {
        QCOMPARE(env, received);
    }
    process.detach();
}

void TestProcess::workingDirectory_data()
{
    QTest::addColumn<bool>("ownDirectory");
    QTest::newRow("empty: the caller's") << false;
    QTest::newRow("given") << true;
}

void TestProcess::workingDirectory()
{
    QFETCH(bool, ownDirectory);
    QTemporaryDir dir;
    const QString dump = nextDumpPath();
    ZuBase::Process process;
    process.mExePath = helper("zu_dump");
    process.mArguments = QStringList{dump, "0"};
    if (ownDirectory)
        process.mWorkingDirectory = dir.path();
    QVERIFY(process.start(false, true, false).isOk());
    QCOMPARE(process.wait(), 0);
    QCOMPARE(readDump(dump).cwd,
             QFileInfo(ownDirectory ? dir.path() : QDir::currentPath()).canonicalFilePath());
    process.detach();
}

void TestProcess::creationFailures_data()
{
    QTest::addColumn<bool>("plainFile");
    QTest::addColumn<QString>("directory");
    QTest::addColumn<QString>("lastError");

    QTest::newRow("not executable") << true << QString() << "last error 13: Permission denied";
    QTest::newRow("no such directory") << false << "/nonexistent/dir"
                                       << "last error 2: No such file or directory";
}

void TestProcess::creationFailures()
{
    QFETCH(bool, plainFile);
    QFETCH(QString, directory);
    QFETCH(QString, lastError);

    QString exe = helper("zu_dump");
    if (plainFile) {
        exe = mTemp.filePath("notes.txt");
        QFile file(exe);
        QVERIFY(file.open(QIODevice::WriteOnly));
        file.write("text\n");
    }
    RkLogCapture capture;
    ZuBase::Process process;
    process.mExePath = exe;
    process.mWorkingDirectory = directory;
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    QVERIFY(process.start(false, true, false).isBad());
    QCOMPARE(process.processId(), 0u);
    QCOMPARE(failureLines(capture),
             QStringList({sWhere + "start: ::CreateProcess  cond[b]", lastError}));
    QCOMPARE(spy.count(), 0);
}

void TestProcess::suspendedUntilResume()
{
    RkLogCapture capture;
    const QString dump = nextDumpPath();
    ZuBase::Process process;
    process.mExePath = helper("zu_dump");
    process.mArguments = QStringList{dump, "0"};
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    QVERIFY(process.start(false, true, false).isOk());
    const unsigned pid = process.processId();
    QVERIFY(pid != 0);
    QVERIFY(uncategorised(capture).contains(
        QStringLiteral("CreateProcess(): success pid[%1]").arg(pid)));

    // Stopped before the program was even loaded: the image is still ours.
    QCOMPARE(procState(pid), 'T');
    QCOMPARE(QFileInfo(QStringLiteral("/proc/%1/exe").arg(pid)).canonicalFilePath(),
             QFileInfo(QCoreApplication::applicationFilePath()).canonicalFilePath());
    QVERIFY(process.isRunning());
    QTest::qWait(300); // a few polls pass: still nothing
    QVERIFY(!QFile::exists(dump));
    QCOMPARE(spy.count(), 0);
    QCOMPARE(process.exitCode(), -1);

    process.resume();
    QTRY_VERIFY(QFile::exists(dump));
    QTRY_COMPARE_WITH_TIMEOUT(spy.count(), 1, 5000);
    QCOMPARE(process.exitCode(), 0);
    process.detach();
}

void TestProcess::terminatedOnceWithExitCode_data()
{
    QTest::addColumn<int>("code");
    QTest::newRow("0") << 0;
    QTest::newRow("3") << 3;
    QTest::newRow("255") << 255;
}

void TestProcess::terminatedOnceWithExitCode()
{
    QFETCH(int, code);
    ZuBase::Process process;
    process.mExePath = helper("zu_sleep");
    process.mArguments = QStringList{"0", QString::number(code)};
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    QVERIFY(process.start(false, true, false).isOk());
    const unsigned pid = process.processId();
    process.resume();
    QTRY_COMPARE_WITH_TIMEOUT(spy.count(), 1, 5000);
    QCOMPARE(process.exitCode(), code);
    QVERIFY(!process.isRunning());
    // Collected: no zombie left behind.
    QTRY_VERIFY(!QFile::exists(QStringLiteral("/proc/%1").arg(pid)));
    // A host that also calls the slot does not get a second signal.
    process.checkRunning();
    QTest::qWait(250);
    QCOMPARE(spy.count(), 1);
    process.detach();
}

void TestProcess::terminate_data()
{
    QTest::addColumn<bool>("resumed");
    QTest::addColumn<int>("code");
    QTest::newRow("running") << true << 7;
    QTest::newRow("still suspended") << false << 1234;
}

void TestProcess::terminate()
{
    QFETCH(bool, resumed);
    QFETCH(int, code);
    ZuBase::Process process;
    process.mExePath = helper("zu_sleep");
    process.mArguments = QStringList{"30000"};
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    QVERIFY(process.start(false, true, false).isOk());
    if (resumed)
        process.resume();
    QVERIFY(process.terminate(code).isOk());
    QCOMPARE(spy.count(), 0); // the polling reports the end
    QTRY_COMPARE_WITH_TIMEOUT(spy.count(), 1, 5000);
    QCOMPARE(process.exitCode(), code);

    // A second terminate finds the process gone.
    RkLogCapture capture;
    QVERIFY(process.terminate(code).isBad());
    QVERIFY(!failureLines(capture).isEmpty());
    process.detach();
}

void TestProcess::terminateWithoutProcess()
{
    RkLogCapture capture;
    ZuBase::Process process;
    QVERIFY(process.terminate(1).isBad());
    QVERIFY(capture.entries().empty());
    QVERIFY(!process.isRunning());
    QCOMPARE(process.wait(), -1);
}

void TestProcess::processListing()
{
    ZuBase::Process child;
    child.mExePath = helper("zu_sleep");
    child.mArguments = QStringList{"30000"};
    QVERIFY(child.start(false, true, false).isOk());

    // The system's own order, as the directory gives it.
    QList<unsigned> system;
    DIR* proc = opendir("/proc");
    QVERIFY(proc);
    while (const dirent* entry = readdir(proc)) {
        bool isPid = false;
        const unsigned pid = QByteArray(entry->d_name).toUInt(&isPid);
        if (isPid)
            system << pid;
    }
    closedir(proc);
    QList<QSharedPointer<ZuBase::Process>> list;
    QVERIFY(ZuBase::Process::processes(list).isOk());
    QList<unsigned> listed;
    for (const auto& process : list)
        listed << process->processId();
    QVERIFY(listed.contains(unsigned(getpid())));
    QVERIFY(listed.contains(child.processId()));
    // The reverse of the system's order, for the ids present in both lists.
    QList<unsigned> common;
    for (unsigned pid : system)
        if (listed.contains(pid))
            common.prepend(pid);
    QList<unsigned> listedCommon;
    for (unsigned pid : listed)
        if (system.contains(pid))
            listedCommon << pid;
    QCOMPARE(listedCommon, common);

    // A listed process is watched like any other: it runs, and its end is seen.
    const auto found = std::find_if(list.begin(), list.end(), [&](const auto& p) {
        return p->processId() == child.processId();
    });
    QVERIFY(found != list.end());
    QVERIFY((*found)->isRunning());
    QVERIFY((*found)->terminate(3).isOk());
    QTRY_VERIFY(!child.isRunning());
    QCOMPARE(child.exitCode(), 3);
    child.detach();
}

void TestProcess::modulesOfSelf()
{
    const QSharedPointer<ZuBase::Process> self = ZuBase::Process::self();
    QCOMPARE(self->processId(), unsigned(getpid()));
    const QString exe = QFileInfo(QCoreApplication::applicationFilePath()).canonicalFilePath();
    QString image;
    QVERIFY(self->imageFilePath(image).isOk());
    QCOMPARE(image, exe);

    QStringList modules;
    QVERIFY(self->modules(modules).isOk());
    QCOMPARE(modules.value(0), exe);
    QCOMPARE(modules.removeDuplicates(), 0);
    const QStringList zubase = modules.filter(QRegularExpression(R"(/libzubase\.so[.0-9]*$)"));
    QCOMPARE(zubase.size(), 1);
    QVERIFY(!modules.filter(QRegularExpression(R"(/libQt5Core\.so)")).isEmpty());
    QVERIFY(modules.filter(QRegularExpression(R"(locale-archive|\.qm$)")).isEmpty());

    // By module, through a link to the library: found under the library's own path.
    const QString link = QFileInfo(zubase.first()).absolutePath() + "/libzubase.so";
    QMultiMap<QString, QSharedPointer<ZuBase::Process>> map;
    QVERIFY(ZuBase::Process::processesByModule({link, "/nonexistent/lib.so"}, map).isOk());
    const QString key = QDir::toNativeSeparators(zubase.first().toLower());
    QCOMPARE(map.uniqueKeys(), QStringList{key});
    QList<unsigned> pids;
    for (const auto& process : map.values(key))
        pids << process->processId();
    QVERIFY(pids.contains(unsigned(getpid())));

    // A process that is gone has neither image nor modules, and says so without a record.
    RkLogCapture capture;
    ZuBase::Process gone;
    QVERIFY(gone.imageFilePath(image).isBad());
    QVERIFY(gone.modules(modules).isBad());
    QVERIFY(image.isEmpty() && modules.isEmpty());
    QVERIFY(capture.texts("Tz").empty());
}

void TestProcess::imageOfNonAsciiPath()
{
    const QString dir = mTemp.filePath(QStringLiteral("schläfer ü"));
    QVERIFY(QDir().mkpath(dir));
    const QString exe = dir + "/zu_sleep";
    QVERIFY(QFile::copy(helper("zu_sleep"), exe));
    ZuBase::Process process;
    process.mExePath = exe;
    process.mArguments = QStringList{"30000"};
    QVERIFY(process.start(false, true, false).isOk());
    process.resume();
    QTRY_COMPARE(
        QFileInfo(QStringLiteral("/proc/%1/exe").arg(process.processId())).canonicalFilePath(),
        exe);
    QString image;
    QVERIFY(process.imageFilePath(image).isOk());
    QCOMPARE(image, exe);
    QStringList modules;
    QVERIFY(process.modules(modules).isOk());
    QCOMPARE(modules.value(0), exe);
    QMultiMap<QString, QSharedPointer<ZuBase::Process>> map;
    QVERIFY(ZuBase::Process::processesByModule({exe}, map).isOk());
    QCOMPARE(map.size(), 1);
    QCOMPARE(map.first()->processId(), process.processId());
    QVERIFY(process.terminate(0).isOk());
    QCOMPARE(process.wait(), 0);
    process.detach();
}

void TestProcess::elevatedStart_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<bool>("decline");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QString>("lastError");

    const QString tool = sHelpers + "/elevation";
    QTest::newRow("granted") << tool << false << true << QString();
    QTest::newRow("declined") << tool << true << false << "last error 13: Permission denied";
    QTest::newRow("no tool") << "/nonexistent" << false << false
                             << "last error 2: No such file or directory";
}

void TestProcess::elevatedStart()
{
    QFETCH(QString, path);
    QFETCH(bool, decline);
    QFETCH(bool, ok);
    QFETCH(QString, lastError);

    const QByteArray oldPath = qgetenv("PATH");
    qputenv("PATH", path.toLocal8Bit());
    if (decline)
        qputenv("ZU_FAKE_PKEXEC_DECLINE", "1");
    const QString dump = nextDumpPath();
    RkLogCapture capture;
    ZuBase::Process process;
    process.mExePath = helper("zu_dump");
    process.mArguments = QStringList{dump, "0", "two words"};
    QSignalSpy spy(&process, &ZuBase::Process::terminated);
    const RkResult res = process.start(true, true, false);
    qputenv("PATH", oldPath);
    qunsetenv("ZU_FAKE_PKEXEC_DECLINE");

    QCOMPARE(res.isOk(), ok);
    if (ok) {
        QCOMPARE(process.processId(), 4711u);
        QTRY_VERIFY(QFile::exists(dump));
        QCOMPARE(readDump(dump).args, QStringList({"two", "words"}));
        QVERIFY(failureLines(capture).isEmpty());
        QTest::qWait(250);
        QCOMPARE(spy.count(), 0); // an elevated child is not watched
        // The fixed id names no process, even where the system has one of that number.
        capture.clear();
        QVERIFY(!process.isRunning());
        QCOMPARE(process.wait(), -1);
        QVERIFY(process.terminate(1).isBad());
        QCOMPARE(failureLines(capture),
                 QStringList({sWhere + "terminate: ::OpenProcess  cond[hProcess!=0]",
                              "last error 3: No such process"}));
    } else {
        QCOMPARE(process.processId(), 0u);
        QCOMPARE(failureLines(capture),
                 QStringList({sWhere + "start: ::ShellExecute  cond[int(hinst)>32]", lastError}));
        QVERIFY(!QFile::exists(dump));
    }
}

void TestProcess::elevationInformation()
{
    std::fflush(stdout);
    const QString capturePath = mTemp.filePath("stdout");
    const int saved = dup(STDOUT_FILENO);
    FILE* file = std::fopen(capturePath.toLocal8Bit().constData(), "w");
    QVERIFY(file);
    dup2(fileno(file), STDOUT_FILENO);
    const bool admin = ZuBase::Process::userIsAdmin();
    const bool again = ZuBase::Process::userIsAdmin();
    std::fflush(stdout);
    dup2(saved, STDOUT_FILENO);
    close(saved);
    std::fclose(file);

    const bool elevated = ZuBase::Process::elevated();
    QCOMPARE(elevated, geteuid() == 0);
    QCOMPARE(again, admin);
    if (elevated)
        QVERIFY(admin);
    QFile out(capturePath);
    QVERIFY(out.open(QIODevice::ReadOnly));
    QCOMPARE(out.readAll(), QStringLiteral("\nelevationInfo() elev %1  admin %2\n")
                                .arg(int(elevated))
                                .arg(int(admin))
                                .toLatin1());
}

void TestProcess::exitWithCallback()
{
    getTheLogInstance().setWriteCallback(&countLogCallback, RkLogDebug);
    getTheLogInstance().printf("seen by the callback");
    QCOMPARE(sLogCallbackCalls, 1);
    ZuBase::Process::setExitCallback(&recordExit);
    ZuBase::Process::exit(5, QStringLiteral("bye"));
    ZuBase::Process::setExitCallback(nullptr);
    QCOMPARE(sExitCall.code, 5);
    QCOMPARE(sExitCall.message, QStringLiteral("bye"));
    // The log's callback is gone, so that nothing reaches a host that is going away.
    getTheLogInstance().printf("not seen");
    QCOMPARE(sLogCallbackCalls, 1);
}

void TestProcess::exitWithoutCallback()
{
    const pid_t pid = fork();
    QVERIFY(pid >= 0);
    if (pid == 0) {
        ZuBase::Process::exit(9, QString());
        _exit(1); // not reached when exit() ends the process
    }
    int status = 0;
    QCOMPARE(waitpid(pid, &status, 0), pid);
    QVERIFY(WIFEXITED(status));
    QCOMPARE(WEXITSTATUS(status), 9);
}

void TestProcess::zuProcessStandardStreams_data()
{
    QTest::addColumn<bool>("closeStreams");
    QTest::addColumn<QString>("fds");
    QTest::newRow("closed") << true << "0:closed 1:closed 2:closed";
    QTest::newRow("kept") << false << "0:open 1:open 2:open";
}

void TestProcess::zuProcessStandardStreams()
{
    QFETCH(bool, closeStreams);
    QFETCH(QString, fds);
    const QString dump = nextDumpPath();
    ZuProcess process(nullptr, closeStreams);
    process.start(helper("zu_dump"), {dump, "4"});
    QVERIFY(process.stableWaitForFinished(10000));
    QCOMPARE(process.exitCode(), 4);
    QCOMPARE(readDump(dump).fds, fds);
}

QTEST_GUILESS_MAIN(TestProcess)
#include "tst_process.moc"
