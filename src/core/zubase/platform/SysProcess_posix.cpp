// POSIX backend of the process platform layer: fork/exec with a stop before exec for suspended
// children, /proc for listings, pkexec for elevation.
#include "zubase/platform/SysProcess.h"

#include "zubase/platform/HandleTable.h"
#include "zubase/platform/UniqueFd.h"
#include "zubase/platform/WinCommandLine.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <map>
#include <memory>
#include <mutex>
#include <sstream>
#include <thread>
#include <unordered_set>

#include <dirent.h>
#include <fcntl.h>
#include <grp.h>
#include <pwd.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/types.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace ZuPlatform {

namespace {

// The system's elevation tool, by absolute path, and its exit codes for a request it refused
// or could not carry out.
const char* const kElevationTool = "/usr/bin/pkexec";
constexpr int kToolRefused = 126;
constexpr int kToolFailed = 127;

// A child this process created. Its reaper thread collects the exit status, so no child stays a
// zombie whether or not anybody asks for its end.
struct Child
{
    explicit Child(pid_t inPid) : pid(inPid) {}
    ~Child();
    const pid_t pid;
    std::mutex mutex;
    bool suspended = false;
    bool ended = false;
    bool lost = false; // somebody else collected the status
    int status = 0;
    bool terminated = false;
    int terminateCode = 0;
};

struct HandleEntry
{
    pid_t pid = 0;
    bool thread = false;
    std::shared_ptr<Child> child; // null for a process that is not our child
};

HandleTable<HandleEntry>& handles()
{
    static auto* const instance = new HandleTable<HandleEntry>(0x100);
    return *instance;
}

// Our children by process id, as long as a handle or the reaper still holds them.
struct Children
{
    std::mutex mutex;
    std::map<pid_t, std::weak_ptr<Child>> byPid;
};

Children& children()
{
    static Children* const instance = new Children;
    return *instance;
}

// The last holder of a child lets go of it: its entry goes, unless a new child has the pid.
Child::~Child()
{
    Children& c = children();
    std::lock_guard<std::mutex> lock(c.mutex);
    const auto found = c.byPid.find(pid);
    if (found != c.byPid.end() && found->second.expired())
        c.byPid.erase(found);
}

std::shared_ptr<Child> findChild(pid_t inPid)
{
    Children& c = children();
    std::lock_guard<std::mutex> lock(c.mutex);
    const auto found = c.byPid.find(inPid);
    return found == c.byPid.end() ? nullptr : found->second.lock();
}

// Repeats a system call that a signal interrupted and gives its result.
template <typename Call> auto uninterrupted(Call inCall)
{
    auto result = inCall();
    while (result < 0 && errno == EINTR)
        result = inCall();
    return result;
}

// Collects the end of a child; true when it was ours to collect.
bool collect(pid_t inPid, int& outStatus, int inOptions = 0)
{
    return uninterrupted([&] { return waitpid(inPid, &outStatus, inOptions); }) == inPid;
}

// Waits for the end without collecting it first, so that the pid cannot be reused while
// terminateProcess() may still signal it under the child's lock.
void reap(std::shared_ptr<Child> inChild)
{
    siginfo_t info;
    const bool seen =
        uninterrupted([&] { return waitid(P_PID, inChild->pid, &info, WEXITED | WNOWAIT); }) == 0;
    std::lock_guard<std::mutex> lock(inChild->mutex);
    int status = 0;
    inChild->lost = !seen || !collect(inChild->pid, status);
    inChild->ended = true;
    inChild->status = status;
}

std::shared_ptr<Child> adoptChild(pid_t inPid, bool inSuspended)
{
    auto child = std::make_shared<Child>(inPid);
    child->suspended = inSuspended;
    {
        Children& c = children();
        std::lock_guard<std::mutex> lock(c.mutex);
        c.byPid[inPid] = child;
    }
    std::thread(reap, child).detach();
    return child;
}

int exitCodeOf(int inStatus, bool inTerminated, int inTerminateCode)
{
    if (WIFEXITED(inStatus))
        return WEXITSTATUS(inStatus);
    if (WIFSIGNALED(inStatus))
        return inTerminated && WTERMSIG(inStatus) == SIGKILL ? inTerminateCode
                                                             : 128 + WTERMSIG(inStatus);
    return inStatus;
}

std::string procPath(pid_t inPid, const char* inEntry)
{
    return "/proc/" + std::to_string(inPid) + "/" + inEntry;
}

bool readFile(const std::string& inPath, std::string& outText)
{
    std::ifstream in(inPath, std::ios::binary);
    if (!in)
        return false;
    std::ostringstream text;
    text << in.rdbuf();
    outText = text.str();
    return !in.bad();
}

// The fields of /proc/<pid>/stat after the command name, the state first.
bool statFields(pid_t inPid, std::vector<std::string>& outFields, std::string* outComm = nullptr)
{
    std::string text;
    if (!readFile(procPath(inPid, "stat"), text))
        return false;
    const std::size_t open = text.find('(');
    const std::size_t close = text.rfind(')');
    if (open == std::string::npos || close == std::string::npos || close < open)
        return false;
    if (outComm)
        *outComm = text.substr(open + 1, close - open - 1);
    std::istringstream rest(text.substr(close + 1));
    outFields.clear();
    for (std::string field; rest >> field;)
        outFields.push_back(field);
    return !outFields.empty();
}

// The file the caller named, taken from the current folder when the path is relative: never
// looked up in PATH, where another program of that name may be.
int absoluteProgramPath(const std::string& inProgram, std::string& outPath)
{
    outPath = inProgram;
    if (inProgram.empty() || inProgram[0] == '/')
        return 0;
    char cwd[4096];
    if (!getcwd(cwd, sizeof cwd))
        return errno;
    outPath = std::string(cwd) + "/" + inProgram;
    return 0;
}

// Whether the process is ending or has ended: set as the first step of an exit, before its
// descriptors close.
bool isEnding(pid_t inPid)
{
    constexpr unsigned long kExitingFlag = 0x4; // PF_EXITING
    std::vector<std::string> fields;
    if (!statFields(inPid, fields) || fields[0] == "Z" || fields[0] == "X")
        return true;
    return fields.size() > 6 && (std::strtoul(fields[6].c_str(), nullptr, 10) & kExitingFlag);
}

std::string& elevationTool()
{
    static std::string* const sTool = new std::string(kElevationTool);
    return *sTool;
}

std::vector<char*> pointers(std::vector<std::string>& inTexts)
{
    std::vector<char*> result;
    for (std::string& text : inTexts)
        result.push_back(&text[0]);
    result.push_back(nullptr);
    return result;
}

// In a forked child: only async-signal-safe calls from here on.
void resetSignals()
{
    struct sigaction action;
    std::memset(&action, 0, sizeof action);
    action.sa_handler = SIG_DFL;
    for (int sig = 1; sig < NSIG; ++sig)
        sigaction(sig, &action, nullptr);
    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
}

// Closes every descriptor from 3 on except the (at most two) given ones.
void closeOtherDescriptors(int inKeep1, int inKeep2 = UniqueFd::kNone)
{
    int keep[2] = {std::min(inKeep1, inKeep2), std::max(inKeep1, inKeep2)};
    int first = 3;
#ifdef SYS_close_range
    bool closed = true;
    for (int kept : keep) {
        if (kept < first)
            continue;
        if (kept > first && syscall(SYS_close_range, first, kept - 1, 0) != 0)
            closed = false;
        first = kept + 1;
    }
    if (closed && syscall(SYS_close_range, first, ~0u, 0) == 0)
        return;
    first = 3;
#endif
    const long limit = std::min(sysconf(_SC_OPEN_MAX), 65536L);
    for (int fd = first; fd < limit; ++fd) {
        if (fd != keep[0] && fd != keep[1])
            close(fd);
    }
}

void writeErrorAndExit(int inPipe, int inError)
{
    ssize_t ignored = write(inPipe, &inError, sizeof inError);
    (void)ignored;
    _exit(127);
}

int readError(int inPipe)
{
    int error = 0;
    const ssize_t got = uninterrupted([&] { return read(inPipe, &error, sizeof error); });
    return got == static_cast<ssize_t>(sizeof error) ? error : 0;
}

} // namespace

int createProcessSuspended(const std::string& inCommandLine, const char* inEnvironmentBlock,
                           const std::string& inWorkingDirectory, ProcessCreation& outCreation)
{
    std::vector<std::string> args = splitCommandLine(inCommandLine);
    if (args.empty() || args[0].empty())
        return ENOENT;
    std::string program;
    if (const int error = absoluteProgramPath(args[0], program))
        return error;
    struct stat info;
    if (stat(program.c_str(), &info) != 0)
        return errno;
    if (!S_ISREG(info.st_mode) || access(program.c_str(), X_OK) != 0)
        return EACCES;
    if (!inWorkingDirectory.empty()) {
        if (stat(inWorkingDirectory.c_str(), &info) != 0)
            return errno;
        if (!S_ISDIR(info.st_mode))
            return ENOTDIR;
    }

    std::vector<std::string> envTexts = environmentEntries(inEnvironmentBlock);
    std::vector<char*> argv = pointers(args);
    std::vector<char*> envp = pointers(envTexts);
    const char* dir = inWorkingDirectory.empty() ? nullptr : inWorkingDirectory.c_str();

    const UniqueFd devNull(open("/dev/null", O_RDWR | O_CLOEXEC));
    if (!devNull.isOpen())
        return errno;
    int errorPipe[2];
    if (pipe2(errorPipe, O_CLOEXEC) != 0)
        return errno;
    const UniqueFd errorReader(errorPipe[0]);
    UniqueFd errorWriter(errorPipe[1]);

    const pid_t pid = fork();
    if (pid < 0)
        return errno;
    if (pid == 0) {
        resetSignals();
        setsid(); // no terminal of ours: a detached process
        dup2(devNull.get(), 0);
        dup2(devNull.get(), 1);
        dup2(devNull.get(), 2);
        if (dir && chdir(dir) != 0)
            writeErrorAndExit(errorWriter.get(), errno);
        closeOtherDescriptors(errorWriter.get());
        // Suspended: nothing of the program runs before the parent continues us.
        kill(getpid(), SIGSTOP);
        execve(program.c_str(), argv.data(), inEnvironmentBlock ? envp.data() : environ);
        writeErrorAndExit(errorWriter.get(), errno);
    }

    errorWriter.reset();
    int status = 0;
    if (!collect(pid, status, WUNTRACED)) {
        // Its stop cannot be seen (the host collects children itself): do not leave it.
        const int error = errno;
        kill(pid, SIGKILL);
        return error;
    }
    if (!WIFSTOPPED(status)) {
        // It ended before the stop; the pipe tells why.
        const int error = readError(errorReader.get());
        return error ? error : ECHILD;
    }

    std::shared_ptr<Child> child = adoptChild(pid, true);
    HandleEntry entry;
    entry.pid = pid;
    entry.child = child;
    outCreation.process = handles().add(entry);
    entry.thread = true;
    outCreation.thread = handles().add(entry);
    outCreation.processId = static_cast<unsigned>(pid);
    return 0;
}

int resumeThread(Handle inThread, int& outPreviousCount)
{
    outPreviousCount = 0;
    HandleEntry entry;
    if (!handles().find(inThread, entry) || !entry.thread || !entry.child)
        return EBADF;
    std::lock_guard<std::mutex> lock(entry.child->mutex);
    if (!entry.child->suspended || entry.child->ended)
        return 0;
    if (kill(entry.child->pid, SIGCONT) != 0)
        return errno;
    entry.child->suspended = false;
    outPreviousCount = 1;
    return 0;
}

int openProcess(unsigned inProcessId, bool inFullAccess, Handle& outProcess)
{
    outProcess = kNullHandle;
    const pid_t pid = static_cast<pid_t>(inProcessId);
    if (pid <= 0)
        return EINVAL;
    HandleEntry entry;
    entry.pid = pid;
    entry.child = findChild(pid);
    if (!entry.child || !inFullAccess) {
        struct stat info;
        if (stat(("/proc/" + std::to_string(pid)).c_str(), &info) != 0)
            return ESRCH;
        if (inFullAccess) {
            if (kill(pid, 0) != 0)
                return errno == EPERM ? EACCES : errno;
        } else {
            // Reading the mappings needs the same right as reading the modules later.
            if (!UniqueFd(open(procPath(pid, "maps").c_str(), O_RDONLY | O_CLOEXEC)).isOpen())
                return errno;
        }
    }
    outProcess = handles().add(entry);
    return 0;
}

int exitCodeProcess(Handle inProcess, int& outExitCode)
{
    HandleEntry entry;
    if (!handles().find(inProcess, entry) || entry.thread)
        return EBADF;
    if (entry.child) {
        std::lock_guard<std::mutex> lock(entry.child->mutex);
        if (!entry.child->ended) {
            outExitCode = kStillActive;
            return 0;
        }
        if (entry.child->lost)
            return ECHILD;
        outExitCode =
            exitCodeOf(entry.child->status, entry.child->terminated, entry.child->terminateCode);
        return 0;
    }
    std::vector<std::string> fields;
    if (!statFields(entry.pid, fields))
        return ESRCH;
    if (fields[0] != "Z" && fields[0] != "X") {
        outExitCode = kStillActive;
        return 0;
    }
    // Field 52 of the stat line: the status the parent will collect.
    outExitCode = fields.size() > 49 ? exitCodeOf(std::atoi(fields[49].c_str()), false, 0) : 0;
    return 0;
}

int processEnded(Handle inProcess, bool& outEnded)
{
    outEnded = false;
    HandleEntry entry;
    if (!handles().find(inProcess, entry) || entry.thread)
        return EBADF;
    if (entry.child) {
        std::lock_guard<std::mutex> lock(entry.child->mutex);
        outEnded = entry.child->ended;
        return 0;
    }
    std::vector<std::string> fields;
    outEnded = !statFields(entry.pid, fields) || fields[0] == "Z" || fields[0] == "X";
    return 0;
}

int terminateProcess(Handle inProcess, int inExitCode)
{
    HandleEntry entry;
    if (!handles().find(inProcess, entry) || entry.thread)
        return EBADF;
    if (entry.child) {
        std::lock_guard<std::mutex> lock(entry.child->mutex);
        if (entry.child->ended)
            return ESRCH;
        if (kill(entry.child->pid, SIGKILL) != 0)
            return errno;
        if (!entry.child->terminated) {
            entry.child->terminated = true;
            entry.child->terminateCode = inExitCode;
        }
        return 0;
    }
    return kill(entry.pid, SIGKILL) == 0 ? 0 : errno;
}

int closeHandle(Handle inHandle)
{
    HandleEntry closed;
    return handles().take(inHandle, closed) ? 0 : EBADF;
}

int enumProcesses(std::vector<unsigned>& outIds)
{
    outIds.clear();
    DIR* dir = opendir("/proc");
    if (!dir)
        return errno;
    while (const dirent* item = readdir(dir)) {
        char* end = nullptr;
        const unsigned long id = std::strtoul(item->d_name, &end, 10);
        if (end != item->d_name && *end == '\0')
            outIds.push_back(static_cast<unsigned>(id));
    }
    closedir(dir);
    return 0;
}

int processModules(Handle inProcess, std::vector<std::string>& outPaths)
{
    outPaths.clear();
    HandleEntry entry;
    if (!handles().find(inProcess, entry) || entry.thread)
        return EBADF;
    std::ifstream maps(procPath(entry.pid, "maps"));
    if (!maps)
        return errno ? errno : ESRCH;
    // Files in the order of their first mapping; only those mapped as code are modules.
    std::vector<std::string> order;
    std::unordered_set<std::string> seen;
    std::unordered_set<std::string> code;
    for (std::string line; std::getline(maps, line);) {
        char perms[8] = {};
        int pathStart = 0;
        if (std::sscanf(line.c_str(), "%*x-%*x %7s %*x %*x:%*x %*u %n", perms, &pathStart) < 1 ||
            pathStart <= 0 || pathStart >= static_cast<int>(line.size()) || line[pathStart] != '/')
            continue;
        const std::string path = line.substr(pathStart);
        if (seen.insert(path).second)
            order.push_back(path);
        if (perms[2] == 'x')
            code.insert(path);
    }
    if (maps.bad())
        return EIO;
    for (const std::string& path : order) {
        if (code.count(path))
            outPaths.push_back(path);
    }
    return 0;
}

int processImageFileName(Handle inProcess, std::string& outPath)
{
    outPath.clear();
    HandleEntry entry;
    if (!handles().find(inProcess, entry) || entry.thread)
        return EBADF;
    char buffer[4096];
    const ssize_t length = readlink(procPath(entry.pid, "exe").c_str(), buffer, sizeof buffer);
    if (length < 0)
        return errno;
    outPath.assign(buffer, static_cast<std::size_t>(length));
    return 0;
}

std::size_t childrenTracked()
{
    Children& c = children();
    std::lock_guard<std::mutex> lock(c.mutex);
    return c.byPid.size();
}

unsigned currentProcessId()
{
    return static_cast<unsigned>(getpid());
}

void setElevationTool(const std::string& inPath)
{
    elevationTool() = inPath.empty() ? kElevationTool : inPath;
}

int shellExecuteElevated(const std::string& inFile, const std::vector<std::string>& inArguments)
{
    const std::string tool = elevationTool();
    if (access(tool.c_str(), X_OK) != 0)
        return errno;
    // The tool looks a relative program up in PATH: hand it the file the caller checked.
    std::string program;
    if (const int error = absoluteProgramPath(inFile, program))
        return error;
    std::vector<std::string> args{tool, program};
    args.insert(args.end(), inArguments.begin(), inArguments.end());
    std::vector<char*> argv = pointers(args);

    int errorPipe[2];
    int startPipe[2];
    if (pipe2(errorPipe, O_CLOEXEC) != 0)
        return errno;
    const UniqueFd errorReader(errorPipe[0]);
    UniqueFd errorWriter(errorPipe[1]);
    if (pipe2(startPipe, O_CLOEXEC) != 0)
        return errno;
    const UniqueFd startReader(startPipe[0]);
    UniqueFd startWriter(startPipe[1]);

    const pid_t pid = fork();
    if (pid < 0)
        return errno;
    if (pid == 0) {
        resetSignals();
        closeOtherDescriptors(errorWriter.get(), startWriter.get());
        // The start pipe goes through our exec into the tool, which marks every descriptor
        // above 2 close-on-exec before it replaces itself with the program.
        fcntl(startWriter.get(), F_SETFD, 0);
        execv(tool.c_str(), argv.data());
        writeErrorAndExit(errorWriter.get(), errno);
    }
    errorWriter.reset();
    startWriter.reset();
    // The error pipe closes when the tool has been loaded, or carries the error of the attempt.
    int status = 0;
    if (const int error = readError(errorReader.get())) {
        collect(pid, status);
        return error;
    }
    // The start pipe closes when the tool has started the program, or when it ends without:
    // after a refusal, or a request the user declined (then it ends with 126 or 127).
    char byte;
    uninterrupted([&] { return read(startReader.get(), &byte, 1); });
    if (!isEnding(pid)) {
        adoptChild(pid, false); // the program runs; collected when it ends
        return 0;
    }
    if (!collect(pid, status))
        return 0; // collected by the host: nothing tells that it failed
    // Any other code is the program's own, of a program that ended at once.
    const int code = exitCodeOf(status, false, 0);
    return code == kToolRefused || code == kToolFailed ? EACCES : 0;
}

void elevationInfo(bool& outElevated, bool& outAdmin)
{
    outElevated = geteuid() == 0;
    outAdmin = outElevated;
    if (outAdmin)
        return;
    std::vector<gid_t> groups(static_cast<std::size_t>(std::max(getgroups(0, nullptr), 0)) + 1);
    const int count = getgroups(static_cast<int>(groups.size()), groups.data());
    groups.resize(count > 0 ? static_cast<std::size_t>(count) : 0);
    groups.push_back(getegid());
    // Also the groups the account database gives the user, for a membership granted after login.
    if (const passwd* user = getpwuid(getuid())) {
        int n = 64;
        std::vector<gid_t> listed(static_cast<std::size_t>(n));
        if (getgrouplist(user->pw_name, user->pw_gid, listed.data(), &n) < 0 && n > 0) {
            listed.resize(static_cast<std::size_t>(n));
            getgrouplist(user->pw_name, user->pw_gid, listed.data(), &n);
        }
        listed.resize(static_cast<std::size_t>(std::max(n, 0)));
        groups.insert(groups.end(), listed.begin(), listed.end());
    }
    for (const char* name : {"sudo", "wheel", "admin"}) {
        if (const group* admins = getgrnam(name)) {
            if (std::find(groups.begin(), groups.end(), admins->gr_gid) != groups.end()) {
                outAdmin = true;
                return;
            }
        }
    }
}

} // namespace ZuPlatform
