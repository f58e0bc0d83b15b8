#include "zubase/Process.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/platform/SysProcess.h"
#include "zubase/platform/WinCommandLine.h"
#include "zubase/system/Process_p.h"

#include "rklib/RkDbC.h"
#include "rklib/RkThread.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QSet>
#include <QTimer>

#include <cerrno>
#include <cstdio>
#include <unistd.h>

namespace ZuBase {

namespace ProcessText {

QByteArray quotedExecutable(const QString& inExePath)
{
    return '"' + Q2M(inExePath) + '"';
}

QByteArray argumentString(const QStringList& inArguments)
{
    QByteArray text;
    for (const QString& argument : inArguments)
        text += ' ' + argument.toLatin1();
    return text;
}

QByteArray commandLine(const QString& inExePath, const QStringList& inArguments)
{
    return quotedExecutable(inExePath) + ' ' + argumentString(inArguments);
}

QByteArray environmentBlock(const QStringList& inEnvironment)
{
    QByteArray block;
    for (const QString& entry : inEnvironment) {
        const QByteArray bytes = Q2M(entry);
        if (bytes.indexOf('=') <= 0)
            continue; // empty, without "=" or with a nameless value
        block += bytes;
        block += '\0';
    }
    block += '\0';
    block += '\0';
    return block;
}

} // namespace ProcessText

namespace {

constexpr int kPollInterval = 100;
constexpr unsigned long kWaitInterval = 10;
// The process id an elevated start leaves: the system does not tell the real one.
constexpr unsigned int kElevatedProcessId = 4711;

struct ElevationCache
{
    bool filled = false;
    bool elevated = false;
    bool admin = false;
};
ElevationCache sElevatedCache;
ElevationCache sAdminCache;

void elevationInfo(ElevationCache& outCache)
{
    ZuPlatform::elevationInfo(outCache.elevated, outCache.admin);
    outCache.filled = true;
}

QString fileName(const std::string& inPath)
{
    return QFile::decodeName(QByteArray::fromStdString(inPath));
}

QString normalisedModulePath(const QString& inPath)
{
    return QDir::toNativeSeparators(QFileInfo(inPath).canonicalFilePath().toLower());
}

// A process handle that is closed when the call that opened it returns.
struct ProcessHandle
{
    ~ProcessHandle()
    {
        if (value != ZuPlatform::kNullHandle)
            ZuPlatform::closeHandle(value);
    }
    ZuPlatform::Handle value = ZuPlatform::kNullHandle;
};

// The exit code kStillActive is also the code of a child terminated with it: only the
// process's own state tells whether it still runs.
bool hasEnded(ZuPlatform::Handle inProcess)
{
    bool ended = false;
    return ZuPlatform::processEnded(inProcess, ended) == 0 && ended;
}

// A process that cannot be opened gives a bad result without a record.
RkResult openResult(int inError)
{
    RkResult res;
    if (inError != 0)
        res.makeBad(1);
    return res;
}

} // namespace

void (*Process::sExitCallback)(int, QString) = nullptr;

Process::Process() = default;

Process::~Process() = default;

RkResult Process::start(bool inElevate, bool inInheritEnvironment, bool)
{
    RkResult res;
    mExitCode = -1;
    closeHandles(); // of an earlier start that was not detached; none is open from here on
    mTerminatedEmitted = false;
    mPlaceholderId = false;

    const QByteArray quotedExe = ProcessText::quotedExecutable(mExePath);
    const QByteArray arguments = ProcessText::argumentString(mArguments);
    const QByteArray commandLine = quotedExe + ' ' + arguments;
    const QByteArray environment = ProcessText::environmentBlock(mEnvironment);

    RkLogFile& log = getTheLogInstance();
    log.printf("<Process::start() elevate=%d>", inElevate ? 1 : 0);
    log.printf("  <CommandLine>");
    log.printf("    %s", commandLine.constData());
    log.printf("  </CommandLine>");
    log.printf("  <Dir>");
    log.printf("    %s", Q2M(mWorkingDirectory).constData());
    log.printf("  </Dir>");
    log.printf("  <Environment inherit=%d>", inInheritEnvironment ? 1 : 0);
    for (int i = mEnvironment.size() - 1; i >= 0; --i)
        log.printf("    [%s]", Q2M(mEnvironment.at(i)).constData());
    log.printf("  </Environment>");
    log.printf("</Process::start()>");

    ZU_CHECK_RETURN(res,
                    RK_CHECK(QFile::exists(mExePath), "QFile::exists(mExePath)", "Internal Error"));

    if (inElevate) {
        const std::vector<std::string> file = ZuPlatform::splitCommandLine(quotedExe.toStdString());
        std::vector<std::string> parameters =
            ZuPlatform::splitCommandLine("x" + arguments.toStdString());
        parameters.erase(parameters.begin());
        const int error =
            ZuPlatform::shellExecuteElevated(file.empty() ? std::string() : file[0], parameters);
        // Recorded as the instance check of ShellExecute.
        const bool launched = error == 0;
        ZU_CHECK_WIN_RETURN(res, RK_CHECK(launched, "int(hinst)>32", "::ShellExecute"), error);
        mProcessId = kElevatedProcessId;
        mPlaceholderId = true;
        return res;
    }

    ZuPlatform::ProcessCreation creation;
    const int error = ZuPlatform::createProcessSuspended(
        commandLine.toStdString(), inInheritEnvironment ? nullptr : environment.constData(),
        Q2M(mWorkingDirectory).toStdString(), creation);
    const bool created = error == 0; // recorded as "b"
    ZU_CHECK_WIN_RETURN(res, RK_CHECK(created, "b", "::CreateProcess"), error);
    mProcessHandle = creation.process;
    mThreadHandle = creation.thread;

    log.printf("CreateProcess(): success pid[%d]", static_cast<int>(creation.processId));
    mProcessId = creation.processId;
    checkRunning(); // starts the polling, or reports a child that has ended already
    return res;
}

void Process::resume()
{
    int previousCount = 0;
    ZuPlatform::resumeThread(mThreadHandle, previousCount);
}

int Process::wait()
{
    resume();
    while (isRunning())
        RkThread::msleep(kWaitInterval);
    return mExitCode;
}

bool Process::isRunning()
{
    if (mProcessId == 0)
        return false;
    ProcessHandle process;
    if (openWatched(true, process.value) != 0)
        return false;
    int code = 0;
    const int error = ZuPlatform::exitCodeProcess(process.value, code);
    if (error != 0) {
        Tz::failWin(RK_CHECK(false, "false", "::GetExitCodeProcess"), error);
        return false;
    }
    if (code == ZuPlatform::kStillActive && !hasEnded(process.value))
        return true;
    mExitCode = code;
    return false;
}

void Process::checkRunning()
{
    if (!isRunning()) {
        // Once per start, even when the host also calls this slot itself.
        if (!mTerminatedEmitted) {
            mTerminatedEmitted = true;
            Q_EMIT terminated();
        }
        return;
    }
    if (mPollArmed)
        return;
    mPollArmed = true;
    QTimer::singleShot(kPollInterval, this, [this] {
        mPollArmed = false;
        checkRunning();
    });
}

RkResult Process::terminate(int inExitCode)
{
    RkResult res;
    if (mProcessId == 0) {
        res.makeBad(1);
        return res;
    }
    ProcessHandle hProcess;
    int error = openWatched(true, hProcess.value);
    ZU_CHECK_WIN_RETURN(
        res, RK_CHECK(hProcess.value != ZuPlatform::kNullHandle, "hProcess!=0", "::OpenProcess"),
        error);
    error = ZuPlatform::terminateProcess(hProcess.value, inExitCode);
    const bool terminated = error == 0; // recorded as "isOk"
    ZU_CHECK_WIN_RETURN(res, RK_CHECK(terminated, "isOk", "::TerminateProcess"), error);
    return res;
}

int Process::openWatched(bool inFullAccess, std::intptr_t& outHandle) const
{
    // The id left by an elevated start names no process here (on Windows it cannot be a
    // process id at all); a process that happens to have it must not be touched.
    if (mPlaceholderId) {
        outHandle = ZuPlatform::kNullHandle;
        return ESRCH;
    }
    return ZuPlatform::openProcess(mProcessId, inFullAccess, outHandle);
}

void Process::detach()
{
    closeHandles();
}

void Process::closeHandles()
{
    // Reset afterwards, so that a second detach() closes nothing.
    for (std::intptr_t* handle : {&mProcessHandle, &mThreadHandle}) {
        if (*handle != ZuPlatform::kNullHandle)
            ZuPlatform::closeHandle(*handle);
        *handle = ZuPlatform::kNullHandle;
    }
}

RkResult Process::imageFilePath(QString& outPath)
{
    outPath.clear();
    ProcessHandle process;
    RkResult res = openResult(openWatched(false, process.value));
    if (res.isBad())
        return res;
    std::string path;
    const int error = ZuPlatform::processImageFileName(process.value, path);
    const std::size_t len = error == 0 ? path.size() : 0;
    ZU_CHECK_WIN_RETURN(res, RK_CHECK(len > 0, "len>0", "Internal Error"), error);
    outPath = fileName(path);
    return res;
}

RkResult Process::modules(QStringList& outPaths)
{
    outPaths.clear();
    ProcessHandle process;
    RkResult res = openResult(openWatched(false, process.value));
    if (res.isBad())
        return res;
    std::vector<std::string> paths;
    const int error = ZuPlatform::processModules(process.value, paths);
    const bool listed = error == 0; // recorded as "bret!=0"
    ZU_CHECK_WIN_RETURN(res, RK_CHECK(listed, "bret!=0", "Internal Error"), error);
    for (const std::string& path : paths) {
        const std::size_t len = path.size();
        if (Tz::fail(RK_CHECK(len > 0, "len>0", "Internal Error")))
            continue;
        outPaths << fileName(path);
    }
    return res;
}

RkResult Process::processes(QList<QSharedPointer<Process>>& outList)
{
    RkResult res;
    outList.clear();
    std::vector<unsigned> ids;
    const int error = ZuPlatform::enumProcesses(ids);
    const bool listed = error == 0; // recorded as "ret!=0"
    ZU_CHECK_WIN_RETURN(res, RK_CHECK(listed, "ret!=0", "EnumProcesses"), error);
    for (auto id = ids.rbegin(); id != ids.rend(); ++id) {
        QSharedPointer<Process> process(new Process);
        process->mProcessId = *id;
        outList << process;
    }
    return res;
}

RkResult Process::processesByModule(const QStringList& inModulePaths,
                                    QMultiMap<QString, QSharedPointer<Process>>& outMap)
{
    outMap.clear();
    QSet<QString> wanted;
    for (const QString& path : inModulePaths) {
        // A path that names no file normalises to nothing, which would match every module
        // whose file has gone (deleted after it was loaded).
        const QString normalised = normalisedModulePath(path);
        if (!normalised.isEmpty())
            wanted.insert(normalised);
    }
    QList<QSharedPointer<Process>> list;
    RkResult res = processes(list);
    if (res.isBad())
        return res;
    for (const QSharedPointer<Process>& process : list) {
        QStringList paths;
        process->modules(paths);
        for (const QString& path : paths) {
            const QString normalised = normalisedModulePath(path);
            if (wanted.contains(normalised))
                outMap.insert(normalised, process);
        }
    }
    return res;
}

QSharedPointer<Process> Process::self()
{
    QSharedPointer<Process> process(new Process);
    process->mProcessId = ZuPlatform::currentProcessId();
    return process;
}

bool Process::elevated()
{
    if (!sElevatedCache.filled)
        elevationInfo(sElevatedCache);
    return sElevatedCache.elevated;
}

bool Process::userIsAdmin()
{
    if (!sAdminCache.filled) {
        elevationInfo(sAdminCache);
        std::printf("\nelevationInfo() elev %d  admin %d\n", sAdminCache.elevated ? 1 : 0,
                    sAdminCache.admin ? 1 : 0);
        std::fflush(stdout);
    }
    return sAdminCache.admin;
}

void Process::exit(int inCode, QString inMessage)
{
    rk_DbC_callbackSet(nullptr);
    getTheLogInstance().setWriteCallback(nullptr, RkLogOff);
    if (sExitCallback) {
        sExitCallback(inCode, inMessage);
        return;
    }
    _exit(inCode);
}

void Process::setExitCallback(void (*inCallback)(int, QString))
{
    sExitCallback = inCallback;
}

void Process::flagAllDescriptorsToCloseOnExec() {}

} // namespace ZuBase
