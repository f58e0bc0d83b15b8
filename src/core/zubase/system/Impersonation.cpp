#include "zubase/Impersonation.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/platform/SysAccounts.h"
#include "zubase/platform/SysTypes.h"
#include "zubase/system/Impersonation_p.h"

#include <QByteArray>
#include <QHostInfo>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace {

QString& pamServiceSetting()
{
    static QString sService;
    return sService;
}

// Overwrites a secret before its memory is given back, on every way out of its scope.
template <typename Text> class WipedOnExit
{
public:
    explicit WipedOnExit(Text& ioText) : mText(ioText) {}
    ~WipedOnExit()
    {
        ::explicit_bzero(static_cast<void*>(mText.data()), sizeof(*mText.data()) * mText.size());
        mText.clear();
    }
    WipedOnExit(const WipedOnExit&) = delete;
    WipedOnExit& operator=(const WipedOnExit&) = delete;

private:
    Text& mText;
};

ZuPlatform::AccountToken* accountToken(void* inToken)
{
    return static_cast<ZuPlatform::AccountToken*>(inToken);
}

QString sidText(ZuPlatform::SidKind inKind, std::uint32_t inId)
{
    switch (inKind) {
    case ZuPlatform::SidKind::UnixUser:
        return QStringLiteral("S-1-22-1-%1").arg(inId);
    case ZuPlatform::SidKind::UnixGroup:
        return QStringLiteral("S-1-22-2-%1").arg(inId);
    }
    return QString();
}

QString groupLine(const ZuPlatform::TokenGroupEntry& inGroup)
{
    QString sid = sidText(inGroup.kind, inGroup.id);
    if (Tz::logWinFunc(sid.isEmpty() ? 0 : 1, 1, "::ConvertSidToStringSid", nullptr, false, EINVAL))
        sid = QStringLiteral("UNKNOWN-SID");
    std::string domain;
    std::string name;
    const int error = ZuPlatform::accountsLookupSid(inGroup.kind, inGroup.id, domain, name);
    const bool noneMapped = error == ZuPlatform::kAccountsNoneMapped;
    Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::LookupAccountSid", nullptr, false,
                   noneMapped ? ENOENT : error);
    if (noneMapped) {
        name = "ERROR_NONE_MAPPED";
        domain.clear();
    }
    return ZuBase::groupText(sid, QString::fromLocal8Bit(domain.c_str()),
                             QString::fromLocal8Bit(name.c_str()), inGroup.attributes);
}

QString privilegeLine(const ZuPlatform::TokenPrivilegeEntry& inPrivilege)
{
    std::string name;
    const int error = ZuPlatform::accountsLookupPrivilegeName(inPrivilege.privilege, name);
    if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::LookupPrivilegeName", nullptr, false, error))
        name = "[unknown]";
    return ZuBase::privilegeText(QString::fromLatin1(name.c_str()), inPrivilege.attributes);
}

} // namespace

// Sized query, then the data; the buffer is empty after any failure.
static RkResult win32TokenGetInformation(void* const inToken, ZuPlatform::TokenInformation inClass,
                                         std::vector<unsigned char>& outData)
{
    RkResult res;
    outData.clear();
    std::size_t dwSize = 0; // the size the data needs; the name is part of the record
    int error =
        ZuPlatform::accountsGetTokenInformation(accountToken(inToken), inClass, nullptr, 0, dwSize);
    if (error != 0 && error != ERANGE) {
        Tz::logWinFunc(0, 1, "::GetTokenInformation", nullptr, false, error);
        res.makeBad(1);
        return res;
    }
    if (dwSize == 0)
        return res;
    outData.resize(dwSize);
    if (Tz::fail(RK_CHECK(outData.size() == dwSize, "outData.size()==dwSize", "Internal Error"))) {
        outData.clear();
        res.makeBad(1);
        return res;
    }
    error = ZuPlatform::accountsGetTokenInformation(accountToken(inToken), inClass, outData.data(),
                                                    outData.size(), dwSize);
    if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::GetTokenInformation", nullptr, false, error)) {
        outData.clear();
        res.makeBad(1);
        return res;
    }
    outData.resize(dwSize);
    return res;
}

// One block of the token dump: the entries of one information class, a line each.
template <typename Entry>
static void logTokenSection(RkLogFile& ioLog, void* const inToken,
                            ZuPlatform::TokenInformation inClass, const char* inName,
                            QString (*inLine)(const Entry&))
{
    ioLog.printf("    <%s>", inName);
    std::vector<unsigned char> data;
    if (win32TokenGetInformation(inToken, inClass, data).isOk()) {
        const std::size_t count = data.size() / sizeof(Entry);
        for (std::size_t i = 0; i < count; ++i) {
            Entry entry;
            std::memcpy(&entry, data.data() + i * sizeof entry, sizeof entry);
            ioLog.printf("        %s", Q2M(inLine(entry)).constData());
        }
    }
    ioLog.printf("    </%s>", inName);
}

namespace ZuBase {

void* Win32Impersonation::sAccessToken = nullptr;
Win32Impersonation::UserCallback Win32Impersonation::sImpersonationUserCallback = nullptr;

LogonName splitLogonName(const QString& inUser)
{
    LogonName logon;
    const int backslash = inUser.indexOf(QLatin1Char('\\'));
    if (backslash >= 0) {
        logon.domain = inUser.left(backslash);
        logon.name = inUser.mid(backslash + 1);
        logon.hasDomain = true;
    } else if (inUser.contains(QLatin1Char('@'))) {
        logon.name = inUser;
    } else {
        logon.name = inUser;
        logon.domain = QStringLiteral(".");
        logon.hasDomain = true;
    }
    return logon;
}

QString pamUserName(const LogonName& inName)
{
    if (!inName.hasDomain)
        return inName.name;
    const QString domain = inName.domain;
    const QString host = QHostInfo::localHostName();
    const QString shortHost = host.section(QLatin1Char('.'), 0, 0);
    const bool local = domain.isEmpty() || domain == QLatin1String(".") ||
                       domain.compare(QLatin1String("localhost"), Qt::CaseInsensitive) == 0 ||
                       domain.compare(host, Qt::CaseInsensitive) == 0 ||
                       domain.compare(shortHost, Qt::CaseInsensitive) == 0;
    return local ? inName.name : domain + QLatin1Char('\\') + inName.name;
}

QString groupFlagsText(std::uint32_t inAttributes)
{
    struct Flag
    {
        std::uint32_t mask;
        const char* text;
    };
    static const Flag kFlags[] = {
        {0x1, " SE_GROUP_MANDATORY"},
        {0x2, " SE_GROUP_ENABLED_BY_DEFAULT"},
        {0x4, " SE_GROUP_ENABLED"},
        {0x8, " SE_GROUP_OWNER"},
        {0x10, " SE_GROUP_USE_FOR_DENY_ONLY"},
        {0x20, " SE_GROUP_INTEGRITY"},
        {0x40, " SE_GROUP_INTEGRITY_ENABLED"},
        {0xC0000000u, " SE_GROUP_LOGON_ID"},
        {0x20000000, " SE_GROUP_RESOURCE"},
    };
    QString text;
    for (const Flag& flag : kFlags) {
        if (inAttributes & flag.mask)
            text += QLatin1String(flag.text);
    }
    return text;
}

QString groupText(const QString& inSid, const QString& inDomain, const QString& inName,
                  std::uint32_t inAttributes)
{
    return QStringLiteral("[%1]  [%2\\\\%3]  [%4]")
        .arg(inSid, inDomain, inName, groupFlagsText(inAttributes));
}

QString privilegeText(const QString& inName, std::uint32_t inAttributes)
{
    return QStringLiteral("%1  [0x%2]").arg(inName, QString::number(inAttributes, 16));
}

Win32Impersonation::Win32Impersonation()
{
    if (sAccessToken)
        mImpersonated = impersonate(sAccessToken).isOk();
}

Win32Impersonation::Win32Impersonation(const Win32Impersonation& inOther)
    : RkHandable(inOther), mImpersonated(inOther.mImpersonated)
{}

Win32Impersonation& Win32Impersonation::operator=(const Win32Impersonation& inOther)
{
    mImpersonated = inOther.mImpersonated;
    return *this;
}

Win32Impersonation::~Win32Impersonation()
{
    revert();
}

void Win32Impersonation::revert()
{
    if (!mImpersonated)
        return;
    const int error = ZuPlatform::accountsRevertToSelf();
    Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::RevertToSelf", nullptr, true, error);
    mImpersonated = false;
}

bool Win32Impersonation::isImpersonated() const
{
    return mImpersonated;
}

bool Win32Impersonation::login()
{
    if (sAccessToken)
        return true;
    if (!sImpersonationUserCallback)
        return false;
    QString user;
    QString password;
    const WipedOnExit<QString> wipedPassword(password);
    getImpersonationUser(user, password);
    if (user.isEmpty() || password.isEmpty())
        return true; // no impersonation wanted
    sAccessToken = win32Login(user, password);
    return sAccessToken != nullptr;
}

RkResult Win32Impersonation::impersonate(void* inToken)
{
    RkResult res;
    int error = 0;
    if (inToken == ZuPlatform::kCurrentProcessToken) {
        // The process's own token: the thread takes the identity it has anyway.
        ZuPlatform::AccountToken* own = nullptr;
        error = ZuPlatform::accountsOpenProcessToken(own);
        if (error == 0)
            error = ZuPlatform::accountsImpersonate(own);
        ZuPlatform::accountsCloseToken(own);
    } else {
        error = ZuPlatform::accountsImpersonate(accountToken(inToken));
    }
    const QByteArray threadId =
        QByteArray::number(qulonglong(ZuPlatform::accountsCurrentThreadId()));
    if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::ImpersonateLoggedOnUser", threadId.constData(),
                       true, error))
        res << RkResult(RkResult::Error, "", "");
    return res;
}

void* Win32Impersonation::win32Login(QString& inUser, QString& inPassword)
{
    const LogonName logon = splitLogonName(inUser);
    const std::string pamUser = Q2M(pamUserName(logon)).toStdString();
    // The password only lives in these buffers for the call and is wiped after it. It goes in
    // the local 8-bit encoding, as the account database stores it here: Latin-1 would turn
    // every character beyond it into '?' and let such passwords collide.
    QByteArray passwordBytes = inPassword.toLocal8Bit();
    const WipedOnExit<QByteArray> wipedBytes(passwordBytes);
    std::string password(passwordBytes.constData(), static_cast<std::size_t>(passwordBytes.size()));
    const WipedOnExit<std::string> wipedPassword(password);
    ZuPlatform::AccountToken* token = nullptr;
    const int error =
        ZuPlatform::accountsLogon(Q2M(pamServiceName()).toStdString(), pamUser, password, token);
    Tz::logWinFunc(token ? 1 : 0, 1, "::LogonUser", Q2M(inUser).constData(), true, error);
    return token;
}

void Win32Impersonation::getImpersonationUser(QString& outUser, QString& outPassword)
{
    outUser.clear();
    outPassword.clear();
    if (sImpersonationUserCallback)
        sImpersonationUserCallback(outUser, outPassword);
}

void Win32Impersonation::setImpersonationUserCallback(UserCallback inCallback)
{
    sImpersonationUserCallback = inCallback;
}

void Win32Impersonation::setPamServiceName(const QString& inService)
{
    pamServiceSetting() = inService;
}

QString Win32Impersonation::pamServiceName()
{
    if (!pamServiceSetting().isEmpty())
        return pamServiceSetting();
    const QString fromEnvironment = qEnvironmentVariable("ZUBASE_PAM_SERVICE");
    if (!fromEnvironment.isEmpty())
        return fromEnvironment;
    return QStringLiteral("zubase");
}

RkResult win32TokenAdjustPrivilege(void* const inToken, char* const inPrivilegeName, bool inEnable)
{
    RkResult res;
    ZuPlatform::AccountToken* token = accountToken(inToken);
    bool opened = false;
    if (inToken == ZuPlatform::kCurrentProcessToken) {
        token = nullptr;
        const int error = ZuPlatform::accountsOpenProcessToken(token);
        if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::OpenProcessToken", nullptr, false, error) ||
            static_cast<void*>(token) == ZuPlatform::kCurrentProcessToken || !token) {
            res.makeBad(1);
            return res;
        }
        opened = true;
    }
    const std::uint32_t attributes =
        inEnable ? (ZuPlatform::kPrivilegeEnabled | ZuPlatform::kPrivilegeUsedForAccess)
                 : ZuPlatform::kPrivilegeRemoved;
    const char* name = inPrivilegeName ? inPrivilegeName : "";
    std::uint32_t privilege = 0;
    int error = ZuPlatform::accountsLookupPrivilegeValue(name, privilege);
    if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::LookupPrivilegeValue", name, false, error)) {
        res.makeBad(1);
    } else {
        error = ZuPlatform::accountsAdjustPrivilege(token, privilege, attributes);
        if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::AdjustTokenPrivileges", name, false, error))
            res.makeBad(1);
    }
    if (opened)
        ZuPlatform::accountsCloseToken(token);
    return res;
}

void win32TokenLog(QString inTitle, void* const inToken)
{
    RkLogFile& log = getTheLogInstance();
    const QByteArray title = Q2M(inTitle);
    log.printf("<token> [%s]", title.constData());
    void* token = inToken;
    bool opened = false;
    if (inToken == ZuPlatform::kCurrentProcessToken) {
        ZuPlatform::AccountToken* processToken = nullptr;
        const int error = ZuPlatform::accountsOpenProcessToken(processToken);
        if (Tz::logWinFunc(error == 0 ? 1 : 0, 1, "::OpenProcessToken", nullptr, false, error)) {
            log.printf("</token> [%s]", title.constData());
            return;
        }
        token = processToken;
        opened = true;
    }

    logTokenSection(log, token, ZuPlatform::TokenInformation::Groups, "TokenGroups", groupLine);
    logTokenSection(log, token, ZuPlatform::TokenInformation::Privileges, "TokenPrivileges",
                    privilegeLine);
    log.printf("</token> [%s]", title.constData());
    if (opened)
        ZuPlatform::accountsCloseToken(accountToken(token));
}

} // namespace ZuBase
