#include "zubase/platform/SysAccounts.h"

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <dirent.h>
#include <grp.h>
#include <linux/capability.h>
#include <mutex>
#include <pwd.h>
#include <security/pam_appl.h>
#include <set>
#include <signal.h>
#include <strings.h>
#include <sys/capability.h>
#include <sys/syscall.h>
#include <thread>
#include <unistd.h>

namespace ZuPlatform {

struct AccountToken
{
    // A process token reads and adjusts the calling thread's live state.
    bool process = false;
    uid_t uid = 0;
    gid_t gid = 0;
    std::vector<gid_t> groups; // the primary group first
};

namespace {

// The identity a thread had before it first impersonated; restored by accountsRevertToSelf().
struct SavedIdentity
{
    bool impersonating = false;
    uid_t ruid = 0, euid = 0, suid = 0;
    gid_t rgid = 0, egid = 0, sgid = 0;
    std::vector<gid_t> groups;
};
thread_local SavedIdentity tSaved;
// Whether the thread impersonates, apart from tSaved so that a signal handler may read it.
thread_local bool tImpersonating __attribute__((tls_model("initial-exec"))) = false;

// Live tokens: a handle that was never handed out or is already closed is refused, as the
// system refuses an invalid handle, instead of being dereferenced.
std::mutex sTokensMutex;
std::set<const AccountToken*> sTokens;

AccountToken* registerToken(AccountToken* inToken)
{
    std::lock_guard<std::mutex> lock(sTokensMutex);
    sTokens.insert(inToken);
    return inToken;
}

bool isLive(const AccountToken* inToken)
{
    std::lock_guard<std::mutex> lock(sTokensMutex);
    return inToken && sTokens.count(inToken) != 0;
}

// The raw system calls change the calling thread only; the libc wrappers would change every
// thread of the process.
int threadSetGroups(const std::vector<gid_t>& inGroups)
{
    return ::syscall(SYS_setgroups, inGroups.size(), inGroups.data()) == 0 ? 0 : errno;
}
int threadSetResGid(gid_t inReal, gid_t inEffective, gid_t inSaved)
{
    return ::syscall(SYS_setresgid, inReal, inEffective, inSaved) == 0 ? 0 : errno;
}
int threadSetResUid(uid_t inReal, uid_t inEffective, uid_t inSaved)
{
    return ::syscall(SYS_setresuid, inReal, inEffective, inSaved) == 0 ? 0 : errno;
}

// Puts the saved groups back; the first error wins.
int restoreGroups(const SavedIdentity& inSaved)
{
    const int error = threadSetResGid(inSaved.rgid, inSaved.egid, inSaved.sgid);
    const int groupsError = threadSetGroups(inSaved.groups);
    return error != 0 ? error : groupsError;
}

std::vector<gid_t> currentGroups()
{
    const int count = ::getgroups(0, nullptr);
    std::vector<gid_t> groups(count > 0 ? static_cast<std::size_t>(count) : 0);
    if (count > 0) {
        const int got = ::getgroups(count, groups.data());
        groups.resize(got > 0 ? static_cast<std::size_t>(got) : 0);
    }
    return groups;
}

struct PrivilegeName
{
    const char* name;
    cap_value_t capability;
};
// The capabilities that do the work of the account privileges of the same purpose.
const PrivilegeName kPrivilegeNames[] = {
    {"SeBackupPrivilege", CAP_DAC_READ_SEARCH}, {"SeRestorePrivilege", CAP_DAC_OVERRIDE},
    {"SeTakeOwnershipPrivilege", CAP_CHOWN},    {"SeSecurityPrivilege", CAP_FOWNER},
    {"SeShutdownPrivilege", CAP_SYS_BOOT},      {"SeSystemtimePrivilege", CAP_SYS_TIME},
    {"SeDebugPrivilege", CAP_SYS_PTRACE},       {"SeIncreaseBasePriorityPrivilege", CAP_SYS_NICE},
    {"SeLoadDriverPrivilege", CAP_SYS_MODULE},  {"SeTcbPrivilege", CAP_SYS_ADMIN},
    {"SeImpersonatePrivilege", CAP_SETUID},     {"SeAssignPrimaryTokenPrivilege", CAP_SETGID},
    {"SeAuditPrivilege", CAP_AUDIT_WRITE},      {"SeIncreaseQuotaPrivilege", CAP_SYS_RESOURCE},
    {"SeLockMemoryPrivilege", CAP_IPC_LOCK},
};

struct Credentials
{
    const std::string* user;
    const std::string* password;
};

int conversation(int inCount, const struct pam_message** inMessages,
                 struct pam_response** outResponses, void* inData)
{
    if (inCount <= 0 || !outResponses)
        return PAM_CONV_ERR;
    const auto* credentials = static_cast<const Credentials*>(inData);
    auto* responses = static_cast<pam_response*>(
        std::calloc(static_cast<std::size_t>(inCount), sizeof(pam_response)));
    if (!responses)
        return PAM_BUF_ERR;
    for (int i = 0; i < inCount; ++i) {
        const char* answer = nullptr;
        switch (inMessages[i]->msg_style) {
        case PAM_PROMPT_ECHO_OFF:
            answer = credentials->password->c_str();
            break;
        case PAM_PROMPT_ECHO_ON:
            answer = credentials->user->c_str();
            break;
        default: // information and error texts need no answer
            break;
        }
        if (answer) {
            responses[i].resp = ::strdup(answer);
            if (!responses[i].resp) {
                for (int k = 0; k < i; ++k) {
                    if (responses[k].resp) {
                        ::explicit_bzero(responses[k].resp, std::strlen(responses[k].resp));
                        std::free(responses[k].resp);
                    }
                }
                std::free(responses);
                return PAM_BUF_ERR;
            }
        }
    }
    *outResponses = responses;
    return PAM_SUCCESS;
}

int pamError(int inCode)
{
    switch (inCode) {
    case PAM_SUCCESS:
        return 0;
    case PAM_AUTH_ERR:
    case PAM_MAXTRIES:
    case PAM_CRED_INSUFFICIENT:
        return EACCES;
    case PAM_USER_UNKNOWN:
        return ENOENT;
    case PAM_ACCT_EXPIRED:
    case PAM_NEW_AUTHTOK_REQD:
    case PAM_AUTHTOK_EXPIRED:
        return EKEYEXPIRED;
    case PAM_PERM_DENIED:
        return EPERM;
    default:
        return EIO;
    }
}

// Runs an account lookup (getpwnam_r, getpwuid_r, getgrgid_r) with a buffer that grows while
// the entry does not fit: groups with long member lists and accounts with long comments need
// more than the usual size.
template <typename Entry, typename Lookup>
int lookupEntry(Lookup inLookup, Entry& outEntry, std::vector<char>& outBuffer, Entry*& outFound)
{
    constexpr std::size_t kFirstSize = 16384;
    constexpr std::size_t kLargestSize = std::size_t(1) << 24;
    outBuffer.resize(kFirstSize);
    int rc;
    while ((rc = inLookup(&outEntry, outBuffer.data(), outBuffer.size(), &outFound)) == ERANGE &&
           outBuffer.size() < kLargestSize)
        outBuffer.resize(outBuffer.size() * 2);
    return rc;
}

int accountOf(const std::string& inUser, AccountToken& outToken)
{
    std::vector<char> buffer;
    passwd entry;
    passwd* found = nullptr;
    const int rc = lookupEntry(
        [&inUser](passwd* outEntry, char* outText, std::size_t inSize, passwd** outFound) {
            return ::getpwnam_r(inUser.c_str(), outEntry, outText, inSize, outFound);
        },
        entry, buffer, found);
    if (rc != 0)
        return rc;
    if (!found)
        return ENOENT;
    outToken.uid = found->pw_uid;
    outToken.gid = found->pw_gid;
    int count = 64;
    std::vector<gid_t> groups(static_cast<std::size_t>(count));
    while (::getgrouplist(found->pw_name, found->pw_gid, groups.data(), &count) < 0) {
        groups.resize(static_cast<std::size_t>(count));
    }
    groups.resize(static_cast<std::size_t>(count));
    outToken.groups.clear();
    outToken.groups.push_back(found->pw_gid);
    for (gid_t group : groups) {
        if (group != found->pw_gid)
            outToken.groups.push_back(group);
    }
    return 0;
}

// The kernel keeps capabilities per thread, while the process token covers every thread: a
// change through it reaches each thread by a signal whose handler applies it to that thread.
// (libpsx does this only for threads started through its wrapped pthread_create, which misses
// those that libstdc++ and Qt start.) Each thread applies the change to its own sets, so an
// impersonating thread, whose effective set the identity change emptied, gains nothing.
std::atomic<std::uint64_t> sRemovedCapabilities{0}; // dropped for good by every thread
std::atomic<int> sEnabledCapability{-1};            // raised by the broadcast under way
std::atomic<int> sBroadcast{0};                     // number of the broadcast under way
std::atomic<int> sAnswers{0};
std::atomic<int> sFailures{0};
std::mutex sBroadcastMutex;

int broadcastSignal()
{
    return SIGRTMIN + 9;
}

// Async-signal-safe: raw system calls only.
int applyToThisThread(int inEnabled)
{
    __user_cap_header_struct header{_LINUX_CAPABILITY_VERSION_3, 0};
    __user_cap_data_struct data[_LINUX_CAPABILITY_U32S_3];
    if (::syscall(SYS_capget, &header, data) != 0)
        return errno;
    const std::uint64_t removed = sRemovedCapabilities.load();
    bool change = false;
    for (int word = 0; word < _LINUX_CAPABILITY_U32S_3; ++word) {
        const std::uint32_t mask = static_cast<std::uint32_t>(removed >> (32 * word));
        change = change ||
                 ((data[word].effective | data[word].permitted | data[word].inheritable) & mask);
        data[word].effective &= ~mask;
        data[word].permitted &= ~mask;
        data[word].inheritable &= ~mask;
    }
    // An impersonating thread acts as the account, which holds no privileges.
    if (inEnabled >= 0 && !tImpersonating) {
        __user_cap_data_struct& word = data[inEnabled / 32];
        const std::uint32_t bit = 1u << (inEnabled % 32);
        if ((word.permitted & bit) && !(word.effective & bit)) {
            word.effective |= bit;
            change = true;
        }
    }
    if (!change)
        return 0;
    return ::syscall(SYS_capset, &header, data) == 0 ? 0 : errno;
}

void onBroadcast(int, siginfo_t* inInfo, void*)
{
    const int savedErrno = errno;
    if (inInfo->si_code == SI_QUEUE && inInfo->si_pid == ::getpid()) {
        // A late signal of an earlier broadcast still drops what was removed, nothing more.
        const bool current = inInfo->si_value.sival_int == sBroadcast.load();
        const int error = applyToThisThread(current ? sEnabledCapability.load() : -1);
        if (current) {
            if (error != 0)
                sFailures.fetch_add(1);
            sAnswers.fetch_add(1);
        }
    }
    errno = savedErrno;
}

std::vector<pid_t> threadsOfProcess()
{
    std::vector<pid_t> threads;
    if (DIR* dir = ::opendir("/proc/self/task")) {
        while (const dirent* entry = ::readdir(dir)) {
            if (entry->d_name[0] != '.')
                threads.push_back(static_cast<pid_t>(std::atoi(entry->d_name)));
        }
        ::closedir(dir);
    }
    return threads;
}

// Applies the change to this thread, then to every other one; threads that start meanwhile are
// found on the next look. EAGAIN when a thread did not answer in time (it blocks the signal;
// it still drops a removed privilege once it takes the signal).
int changeProcessCapability(int inCapability, bool inRemove)
{
    std::lock_guard<std::mutex> lock(sBroadcastMutex);
    static const bool handlerInstalled = [] {
        struct sigaction action;
        std::memset(&action, 0, sizeof action);
        action.sa_sigaction = &onBroadcast;
        action.sa_flags = SA_SIGINFO | SA_RESTART;
        sigemptyset(&action.sa_mask);
        return ::sigaction(broadcastSignal(), &action, nullptr) == 0;
    }();
    if (inRemove)
        sRemovedCapabilities.fetch_or(std::uint64_t(1) << inCapability);
    const int enabled = inRemove ? -1 : inCapability;
    if (const int error = applyToThisThread(enabled))
        return error;
    if (!handlerInstalled)
        return ENOSYS;

    sEnabledCapability = enabled;
    const int broadcast = sBroadcast.fetch_add(1) + 1;
    sAnswers = 0;
    sFailures = 0;
    const pid_t process = ::getpid();
    std::set<pid_t> asked{static_cast<pid_t>(::syscall(SYS_gettid))};
    int sent = 0;
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(2);
    bool lookAgain = true;
    while (lookAgain && std::chrono::steady_clock::now() < deadline) {
        lookAgain = false;
        for (pid_t thread : threadsOfProcess()) {
            if (!asked.insert(thread).second)
                continue;
            siginfo_t info;
            std::memset(&info, 0, sizeof info);
            info.si_signo = broadcastSignal();
            info.si_code = SI_QUEUE;
            info.si_pid = process;
            info.si_uid = ::getuid();
            info.si_value.sival_int = broadcast;
            if (::syscall(SYS_rt_tgsigqueueinfo, process, thread, broadcastSignal(), &info) == 0) {
                ++sent;
                lookAgain = true;
            }
        }
        while (sAnswers.load() < sent && std::chrono::steady_clock::now() < deadline)
            std::this_thread::sleep_for(std::chrono::microseconds(200));
    }
    sEnabledCapability = -1;
    if (sAnswers.load() < sent)
        return EAGAIN;
    return sFailures.load() == 0 ? 0 : EPERM;
}

} // namespace

int accountsLogon(const std::string& inService, const std::string& inUser,
                  const std::string& inPassword, AccountToken*& outToken)
{
    outToken = nullptr;
    if (inUser.empty())
        return ENOENT;
    Credentials credentials{&inUser, &inPassword};
    const pam_conv conv{&conversation, &credentials};
    pam_handle_t* pam = nullptr;
    int rc = ::pam_start(inService.c_str(), inUser.c_str(), &conv, &pam);
    if (rc != PAM_SUCCESS)
        return EIO;
    rc = ::pam_authenticate(pam, PAM_SILENT | PAM_DISALLOW_NULL_AUTHTOK);
    if (rc == PAM_SUCCESS)
        rc = ::pam_acct_mgmt(pam, PAM_SILENT | PAM_DISALLOW_NULL_AUTHTOK);
    // A module may map the name it was given to the account's own name.
    std::string account = inUser;
    if (rc == PAM_SUCCESS) {
        const void* item = nullptr;
        if (::pam_get_item(pam, PAM_USER, &item) == PAM_SUCCESS && item)
            account = static_cast<const char*>(item);
    }
    ::pam_end(pam, rc);
    if (rc != PAM_SUCCESS)
        return pamError(rc);

    auto* token = new AccountToken;
    const int error = accountOf(account, *token);
    if (error != 0) {
        delete token;
        return error;
    }
    outToken = registerToken(token);
    return 0;
}

int accountsOpenProcessToken(AccountToken*& outToken)
{
    auto* token = new AccountToken;
    token->process = true;
    token->uid = ::geteuid();
    token->gid = ::getegid();
    token->groups.push_back(token->gid);
    for (gid_t group : currentGroups()) {
        if (group != token->gid)
            token->groups.push_back(group);
    }
    outToken = registerToken(token);
    return 0;
}

void accountsCloseToken(AccountToken* inToken)
{
    {
        std::lock_guard<std::mutex> lock(sTokensMutex);
        if (sTokens.erase(inToken) == 0)
            return;
    }
    delete inToken;
}

int accountsImpersonate(const AccountToken* inToken)
{
    if (!isLive(inToken))
        return EBADF;
    // Start from the thread's own identity, so that the privileges needed for the change are
    // in effect and a later revert finds what to return to.
    if (tSaved.impersonating) {
        if (const int error = accountsRevertToSelf())
            return error;
    }
    SavedIdentity saved;
    ::getresuid(&saved.ruid, &saved.euid, &saved.suid);
    ::getresgid(&saved.rgid, &saved.egid, &saved.sgid);
    saved.groups = currentGroups();

    const gid_t unchangedGid = static_cast<gid_t>(-1);
    const uid_t unchangedUid = static_cast<uid_t>(-1);
    if (const int error = threadSetGroups(inToken->groups))
        return error;
    // Only the effective group and user change: the saved ones keep the way back, and the
    // permitted capabilities stay (out of effect) for it.
    int error = threadSetResGid(unchangedGid, inToken->gid, unchangedGid);
    if (error == 0)
        error = threadSetResUid(unchangedUid, inToken->uid, unchangedUid);
    if (error != 0) {
        restoreGroups(saved);
        return error;
    }
    saved.impersonating = true;
    tSaved = std::move(saved);
    tImpersonating = true;
    return 0;
}

int accountsRevertToSelf()
{
    if (!tSaved.impersonating)
        return 0;
    // The user first: becoming the own user again brings back the privileges for the rest.
    if (const int error = threadSetResUid(tSaved.ruid, tSaved.euid, tSaved.suid))
        return error;
    const int error = restoreGroups(tSaved);
    tSaved = SavedIdentity();
    tImpersonating = false;
    return error;
}

unsigned long accountsCurrentThreadId()
{
    return static_cast<unsigned long>(::syscall(SYS_gettid));
}

namespace {

// Hands token entries to a caller's buffer; ERANGE with the size needed when it is too small.
template <typename Entry>
int copyEntries(const std::vector<Entry>& inEntries, void* ioBuffer, std::size_t inSize,
                std::size_t& outNeeded)
{
    outNeeded = inEntries.size() * sizeof(Entry);
    if (inSize < outNeeded)
        return ERANGE;
    if (outNeeded)
        std::memcpy(ioBuffer, inEntries.data(), outNeeded);
    return 0;
}

} // namespace

int accountsGetTokenInformation(const AccountToken* inToken, TokenInformation inClass,
                                void* ioBuffer, std::size_t inSize, std::size_t& outNeeded)
{
    outNeeded = 0;
    if (!isLive(inToken))
        return EBADF;
    if (inClass == TokenInformation::Groups) {
        std::vector<TokenGroupEntry> entries;
        for (std::size_t i = 0; i < inToken->groups.size(); ++i) {
            // The primary group also owns what the account creates.
            const std::uint32_t attributes = kGroupMandatory | kGroupEnabledByDefault |
                                             kGroupEnabled | (i == 0 ? kGroupOwner : 0);
            entries.push_back({SidKind::UnixGroup, inToken->groups[i], attributes});
        }
        return copyEntries(entries, ioBuffer, inSize, outNeeded);
    }

    std::vector<TokenPrivilegeEntry> entries;
    if (inToken->process) {
        cap_t caps = ::cap_get_proc();
        if (!caps)
            return errno;
        for (cap_value_t cap = 0; cap <= CAP_LAST_CAP; ++cap) {
            cap_flag_value_t permitted = CAP_CLEAR;
            cap_flag_value_t effective = CAP_CLEAR;
            if (::cap_get_flag(caps, cap, CAP_PERMITTED, &permitted) != 0)
                continue;
            ::cap_get_flag(caps, cap, CAP_EFFECTIVE, &effective);
            if (permitted == CAP_SET)
                entries.push_back({static_cast<std::uint32_t>(cap),
                                   effective == CAP_SET ? kPrivilegeEnabled : 0u});
        }
        ::cap_free(caps);
    }
    return copyEntries(entries, ioBuffer, inSize, outNeeded);
}

int accountsLookupPrivilegeValue(const std::string& inName, std::uint32_t& outPrivilege)
{
    outPrivilege = 0;
    for (const PrivilegeName& entry : kPrivilegeNames) {
        if (::strcasecmp(entry.name, inName.c_str()) == 0) {
            outPrivilege = static_cast<std::uint32_t>(entry.capability);
            return 0;
        }
    }
    cap_value_t cap = 0;
    if (inName.empty() || ::cap_from_name(inName.c_str(), &cap) != 0 || cap < 0 ||
        cap > CAP_LAST_CAP)
        return EINVAL;
    outPrivilege = static_cast<std::uint32_t>(cap);
    return 0;
}

int accountsLookupPrivilegeName(std::uint32_t inPrivilege, std::string& outName)
{
    outName.clear();
    if (inPrivilege > static_cast<std::uint32_t>(CAP_LAST_CAP))
        return EINVAL;
    for (const PrivilegeName& entry : kPrivilegeNames) {
        if (static_cast<std::uint32_t>(entry.capability) == inPrivilege) {
            outName = entry.name;
            return 0;
        }
    }
    char* name = ::cap_to_name(static_cast<cap_value_t>(inPrivilege));
    if (!name)
        return errno ? errno : EINVAL;
    outName = name;
    ::cap_free(name);
    return 0;
}

int accountsAdjustPrivilege(AccountToken* inToken, std::uint32_t inPrivilege,
                            std::uint32_t inAttributes)
{
    if (!isLive(inToken))
        return EBADF;
    if (inPrivilege > static_cast<std::uint32_t>(CAP_LAST_CAP))
        return EINVAL;
    // As with account tokens elsewhere, a privilege that is not held is simply not assigned:
    // that is no failure, the privilege just stays absent.
    if (!inToken->process)
        return 0; // a logged-on account holds no capabilities
    const bool remove = (inAttributes & kPrivilegeRemoved) != 0;
    return changeProcessCapability(static_cast<int>(inPrivilege), remove);
}

namespace {

// The name of a user or group id through getpwuid_r() or getgrgid_r().
template <typename Id, typename Entry>
int lookupName(int (*inLookup)(Id, Entry*, char*, std::size_t, Entry**), char* Entry::*inName,
               Id inId, const char* inDomain, std::string& outDomain, std::string& outName)
{
    std::vector<char> buffer;
    Entry entry;
    Entry* found = nullptr;
    const int rc = lookupEntry(
        [&](Entry* outEntry, char* outText, std::size_t inSize, Entry** outFound) {
            return inLookup(inId, outEntry, outText, inSize, outFound);
        },
        entry, buffer, found);
    if (rc != 0)
        return rc;
    if (!found)
        return kAccountsNoneMapped;
    outDomain = inDomain;
    outName = found->*inName;
    return 0;
}

} // namespace

int accountsLookupSid(SidKind inKind, std::uint32_t inId, std::string& outDomain,
                      std::string& outName)
{
    outDomain.clear();
    outName.clear();
    if (inKind == SidKind::UnixUser)
        return lookupName(&::getpwuid_r, &passwd::pw_name, uid_t(inId), "Unix User", outDomain,
                          outName);
    if (inKind == SidKind::UnixGroup)
        return lookupName(&::getgrgid_r, &group::gr_name, gid_t(inId), "Unix Group", outDomain,
                          outName);
    return EINVAL;
}

} // namespace ZuPlatform
