#pragma once

// Internal, Qt-free: accounts, access tokens, per-thread impersonation and privileges.
// Every function returns 0 or an errno-style code.
//
// On Linux an account is logged on through PAM; its token carries the user id, the primary
// group id and the supplementary groups. Impersonation changes only the calling thread's
// effective user, group and supplementary groups (the kernel keeps credentials per thread).
// Privileges are capabilities, which the kernel keeps per thread; the "process token" reads the
// calling thread's and changes those of every thread.

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ZuPlatform {

struct AccountToken;

// Returned by accountsLookupSid() for an id without an account or group name.
constexpr int kAccountsNoneMapped = -1332;

// Kinds of security identifiers: Unix users (S-1-22-1-<uid>) and groups (S-1-22-2-<gid>).
enum class SidKind : std::uint32_t
{
    UnixUser = 1,
    UnixGroup = 2
};

// Group attribute bits as tokens carry them.
constexpr std::uint32_t kGroupMandatory = 0x1;
constexpr std::uint32_t kGroupEnabledByDefault = 0x2;
constexpr std::uint32_t kGroupEnabled = 0x4;
constexpr std::uint32_t kGroupOwner = 0x8;
// Privilege attribute bits.
constexpr std::uint32_t kPrivilegeEnabled = 0x2;
constexpr std::uint32_t kPrivilegeRemoved = 0x4;
constexpr std::uint32_t kPrivilegeUsedForAccess = 0x80000000u;

enum class TokenInformation
{
    Groups,
    Privileges
};

// One entry of the Groups information: a group and its attributes.
struct TokenGroupEntry
{
    SidKind kind;
    std::uint32_t id;
    std::uint32_t attributes;
};

// One entry of the Privileges information: a privilege (a capability number) and its
// attributes.
struct TokenPrivilegeEntry
{
    std::uint32_t privilege;
    std::uint32_t attributes;
};

// Authenticates inUser with inPassword through the PAM service inService and checks that the
// account may log on; on success outToken is a new token (release with accountsCloseToken).
// EACCES: wrong password; ENOENT: unknown user; EKEYEXPIRED: account or password expired.
int accountsLogon(const std::string& inService, const std::string& inUser,
                  const std::string& inPassword, AccountToken*& outToken);
// A token for the calling thread's own identity and privileges.
int accountsOpenProcessToken(AccountToken*& outToken);
void accountsCloseToken(AccountToken* inToken);

// The calling thread takes the token's identity; other threads keep theirs.
int accountsImpersonate(const AccountToken* inToken);
// The calling thread returns to the identity it had before its first impersonation.
int accountsRevertToSelf();
// The kernel's id of the calling thread.
unsigned long accountsCurrentThreadId();

// Copies the requested information as an array of TokenGroupEntry or TokenPrivilegeEntry into
// ioBuffer. outNeeded is the size it needs; ERANGE when inSize is smaller.
int accountsGetTokenInformation(const AccountToken* inToken, TokenInformation inClass,
                                void* ioBuffer, std::size_t inSize, std::size_t& outNeeded);

// Privilege names: the usual account privilege names for the capabilities that stand for them
// ("SeRestorePrivilege" is CAP_DAC_OVERRIDE, ...), else the capability's own name
// ("cap_net_raw"). EINVAL for an unknown name or number.
int accountsLookupPrivilegeValue(const std::string& inName, std::uint32_t& outPrivilege);
int accountsLookupPrivilegeName(std::uint32_t inPrivilege, std::string& outName);
// With kPrivilegeEnabled raises the privilege in the effective set; one that the token does not
// hold (or any, for a thread that impersonates) stays absent without a failure, as the system
// leaves unassigned privileges. With kPrivilegeRemoved drops it from the effective, permitted
// and inheritable sets for good. Through the process token the change reaches every thread of
// the process, also those that were running before; EAGAIN when a thread that blocks signals
// could not be reached in time.
int accountsAdjustPrivilege(AccountToken* inToken, std::uint32_t inPrivilege,
                            std::uint32_t inAttributes);

// Domain ("Unix User" or "Unix Group") and name of a user or group id; kAccountsNoneMapped
// when the id has no name.
int accountsLookupSid(SidKind inKind, std::uint32_t inId, std::string& outDomain,
                      std::string& outName);

} // namespace ZuPlatform
