#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkHandle.h"
#include "rklib/RkResult.h"

#include <QString>

namespace ZuBase {

// Runs work under a configured account: login() logs the account on once per process (the
// host's callback supplies user name and password, which are never logged or kept), and each
// Win32Impersonation scope lets the thread that makes it act as that account until the scope
// ends. Other threads keep their identity.
//
// On Linux the account is authenticated with PAM. The PAM service is the one given to
// setPamServiceName(), else the environment variable ZUBASE_PAM_SERVICE, else "zubase"
// (without /etc/pam.d/zubase, PAM uses its "other" service). User names may be
// "domain\name", "name@domain" or a plain local name; a domain that is "." or this machine's
// name means a local account, any other is handed to PAM as "domain\name". The token carries
// the user id, the group id and the supplementary groups; impersonation changes the calling
// thread's effective user, group and groups and needs a process with the right to change
// them (root).
class ZUBASE_EXPORT Win32Impersonation : public RkHandable
{
public:
    using UserCallback = void (*)(QString& user, QString& password);

    // Impersonates the logged-on account on the calling thread when login() obtained one.
    Win32Impersonation();
    // Copies only whether the thread is impersonated.
    Win32Impersonation(const Win32Impersonation& inOther);
    Win32Impersonation& operator=(const Win32Impersonation& inOther);
    // Reverts the thread to its own identity; must run on the thread that made the object.
    ~Win32Impersonation() override;

    // Logs the account on once, through the callback. False without a callback or when the
    // logon failed; true when logged on, or when the callback gives an empty user name or
    // password (no impersonation wanted).
    static bool login();
    // Makes the calling thread impersonate a token.
    static RkResult impersonate(void* inToken);
    // Logs the account on and returns its token, null on failure (logged as "::LogonUser").
    static void* win32Login(QString& inUser, QString& inPassword);
    // The credentials from the callback; both empty without one.
    static void getImpersonationUser(QString& outUser, QString& outPassword);
    static void setImpersonationUserCallback(UserCallback inCallback);

    // The PAM service used to authenticate (see above); an empty name restores the default.
    static void setPamServiceName(const QString& inService);
    static QString pamServiceName();

private:
    void revert();
    bool isImpersonated() const;

    bool mImpersonated = false;

    static void* sAccessToken;
    static UserCallback sImpersonationUserCallback;
};

// Enables or removes one privilege of a token; a token of -1 means the current process. On
// Linux privileges are capabilities of the calling thread ("SeRestorePrivilege" is
// CAP_DAC_OVERRIDE, "SeBackupPrivilege" CAP_DAC_READ_SEARCH, others by their capability name
// such as "cap_net_raw"); removing one drops it for good, and enabling one that is not held
// leaves it absent without a failure.
ZUBASE_EXPORT RkResult win32TokenAdjustPrivilege(void* const inToken, char* const inPrivilegeName,
                                                 bool inEnable);
// Writes the groups and privileges of a token (-1: the current process) to the log between
// "<token> [title]" and "</token> [title]".
ZUBASE_EXPORT void win32TokenLog(QString inTitle, void* const inToken);

} // namespace ZuBase
