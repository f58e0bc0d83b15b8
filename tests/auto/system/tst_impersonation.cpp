// Accounts: logon through the host's callback, per-thread impersonation with a real account,
// privileges and the token dump.
#include "TestSupport.h"
#include "zubase/Impersonation.h"
#include "zubase/system/Impersonation_p.h"

#include <QHostInfo>

#include <atomic>
#include <grp.h>
#include <linux/capability.h>
#include <pwd.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

using TestSupport::logLines;

namespace {

void* const kProcessToken = reinterpret_cast<void*>(static_cast<intptr_t>(-1));

QString sUser;
QString sPassword;
int sCallbackCalls = 0;

void credentials(QString& outUser, QString& outPassword)
{
    ++sCallbackCalls;
    outUser = sUser;
    outPassword = sPassword;
}

// A group line of the token dump; without a name the group's own.
QString groupLine(gid_t inGid, bool inPrimary, QString inAccount = QString())
{
    if (inAccount.isNull())
        inAccount = "Unix Group\\\\" + QString::fromLocal8Bit(::getgrgid(inGid)->gr_name);
    return QStringLiteral("        [S-1-22-2-%1]  [%2]  [ SE_GROUP_MANDATORY "
                          "SE_GROUP_ENABLED_BY_DEFAULT SE_GROUP_ENABLED%3]")
        .arg(inGid)
        .arg(inAccount, inPrimary ? " SE_GROUP_OWNER" : "");
}

bool run(const QString& inTool, const QStringList& inArgs, const QByteArray& inInput = {})
{
    QProcess process;
    process.start(QStandardPaths::findExecutable(inTool, {"/usr/sbin", "/sbin"}), inArgs);
    process.write(inInput);
    process.closeWriteChannel();
    return process.waitForFinished(30000) && process.exitStatus() == QProcess::NormalExit &&
           process.exitCode() == 0;
}

// The calling thread's capability sets: effective, then permitted.
std::pair<std::uint64_t, std::uint64_t> ownCapabilities()
{
    __user_cap_header_struct header{_LINUX_CAPABILITY_VERSION_3, 0};
    __user_cap_data_struct data[_LINUX_CAPABILITY_U32S_3] = {};
    ::syscall(SYS_capget, &header, data);
    return {data[0].effective | std::uint64_t(data[1].effective) << 32,
            data[0].permitted | std::uint64_t(data[1].permitted) << 32};
}

bool adjust(void* inToken, const char* inName, bool inEnable)
{
    return ZuBase::win32TokenAdjustPrivilege(inToken, const_cast<char*>(inName), inEnable).isOk();
}

bool createFile(const QString& inPath)
{
    QFile file(inPath);
    return file.open(QIODevice::WriteOnly) && file.write("x") == 1;
}

} // namespace

class TestImpersonation : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanupTestCase();
    void logonNamesAndTexts();
    void tokenLogOfProcess();
    void tokenLogOfUnnamedGroup();
    void adjustPrivilege();
    void loginWithoutCallbackOrPassword();
    void logonOfRealAccount();
    void impersonationIsPerThread();
    void invalidTokens();

private:
    bool mRoot = false;
    bool mAccountMade = false;
    uid_t mUid = 0;
    gid_t mGid = 0;
};

void TestImpersonation::initTestCase()
{
    mRoot = ::geteuid() == 0;
    if (!mRoot)
        return;
    // A throwaway account with one supplementary group, and an entry larger than the usual
    // lookup buffer.
    sUser = QStringLiteral("zutst%1").arg(::getpid());
    sPassword = QStringLiteral("Pw-%1-secret").arg(::getpid());
    mAccountMade = run("useradd", {"-M", "-s", "/usr/sbin/nologin", "-G", "users", sUser}) &&
                   run("chpasswd", {}, (sUser + ':' + sPassword + '\n').toLocal8Bit()) &&
                   run("usermod", {"-c", QString(20000, 'c'), sUser});
    const passwd* entry = ::getpwnam(qPrintable(sUser));
    mAccountMade = mAccountMade && entry;
    mUid = entry ? entry->pw_uid : 0;
    mGid = entry ? entry->pw_gid : 0;
}

void TestImpersonation::cleanupTestCase()
{
    if (!sUser.isEmpty() && ::getpwnam(qPrintable(sUser)))
        run("userdel", {sUser});
}

void TestImpersonation::logonNamesAndTexts()
{
    // "name|domain|PAM user" of a logon name: the first backslash splits, this machine's name
    // and "." are local, a user principal name passes no domain.
    const auto split = [](const QString& inUser) {
        const ZuBase::LogonName logon = ZuBase::splitLogonName(inUser);
        return QStringList(
                   {logon.name, logon.hasDomain ? logon.domain : "-", ZuBase::pamUserName(logon)})
            .join('|');
    };
    const QString host = QHostInfo::localHostName().toUpper();
    QCOMPARE(split("CORP\\a\\b"), "a\\b|CORP|CORP\\a\\b");
    QCOMPARE(split(".\\alice"), "alice|.|alice");
    QCOMPARE(split(host + "\\alice"), "alice|" + host + "|alice");
    QCOMPARE(split("alice@corp.example"), "alice@corp.example|-|alice@corp.example");
    QCOMPARE(split("alice"), "alice|.|alice");

    // Group flags in table order, either logon-id bit; privileges in unpadded lower-case hex.
    QCOMPARE(ZuBase::groupFlagsText(0x6000007Fu),
             " SE_GROUP_MANDATORY SE_GROUP_ENABLED_BY_DEFAULT SE_GROUP_ENABLED SE_GROUP_OWNER "
             "SE_GROUP_USE_FOR_DENY_ONLY SE_GROUP_INTEGRITY SE_GROUP_INTEGRITY_ENABLED "
             "SE_GROUP_LOGON_ID SE_GROUP_RESOURCE");
    QCOMPARE(ZuBase::privilegeText("SeBackupPrivilege", 0xE000001A),
             QString("SeBackupPrivilege  [0xe000001a]"));
}

void TestImpersonation::tokenLogOfProcess()
{
    RkLogCapture capture;
    ZuBase::win32TokenLog("process", kProcessToken);
    const QStringList lines = logLines(capture, "");
    QCOMPARE(lines.mid(0, 3),
             QStringList({"<token> [process]", "    <TokenGroups>", groupLine(::getegid(), true)}));
    const int groupsEnd = lines.indexOf("    </TokenGroups>");
    QCOMPARE(lines.at(groupsEnd + 1), QString("    <TokenPrivileges>"));
    QCOMPARE(lines.mid(lines.size() - 2),
             QStringList({"    </TokenPrivileges>", "</token> [process]"}));
    const QStringList privileges = lines.mid(groupsEnd + 2, lines.size() - groupsEnd - 4);
    QCOMPARE(privileges.filter(QRegularExpression(R"(^        \S+  \[0x[0-9a-f]+\]$)")),
             privileges);
    if (mRoot)
        QVERIFY(privileges.contains("        SeRestorePrivilege  [0x2]") &&
                privileges.contains("        cap_kill  [0x2]"));
    // The queries of a dump change no identity: nothing of them above debug level.
    QCOMPARE(logLines(capture, "Tz", RkLogInfo), QStringList());
    QVERIFY(logLines(capture, "Tz").contains("::LookupAccountSid -> ok"));
}

void TestImpersonation::tokenLogOfUnnamedGroup()
{
    if (!mRoot)
        QSKIP("changing a thread's groups needs root");
    // A group without a name, in this thread only.
    QStringList lines;
    std::thread worker([&lines] {
        const gid_t groups[] = {4242421};
        if (::syscall(SYS_setgroups, 1, groups) != 0)
            return;
        RkLogCapture capture;
        ZuBase::win32TokenLog("unnamed", kProcessToken);
        lines = logLines(capture, "");
    });
    worker.join();
    QVERIFY(lines.contains(groupLine(4242421, false, "\\\\ERROR_NONE_MAPPED")));
}

void TestImpersonation::adjustPrivilege()
{
    if (!mRoot)
        QSKIP("capabilities to adjust are held only by root");
    // A held privilege by its usual name or a capability's own name; an unknown name and a
    // token that is no token fail.
    RkLogCapture capture;
    const uint descriptors = QDir("/proc/self/fd").count();
    QVERIFY(adjust(kProcessToken, "SeRestorePrivilege", true) &&
            adjust(kProcessToken, "cap_fowner", true));
    QCOMPARE(QDir("/proc/self/fd").count(), descriptors); // none left open
    QVERIFY(!adjust(kProcessToken, "SeNoSuchPrivilege", true) &&
            !adjust(nullptr, "SeRestorePrivilege", true));
    const QStringList errors = logLines(capture, nullptr, RkLogError);
    QCOMPARE(errors.size(), 2);
    QVERIFY(errors.at(0).startsWith("::LookupPrivilegeValue SeNoSuchPrivilege -> 0, last error"));
    QVERIFY(errors.at(1).startsWith("::AdjustTokenPrivileges SeRestorePrivilege -> 0, last "
                                    "error 9:"));

    // Through the process token a change reaches every thread, also one that was running
    // before the call; a removal is for good. Done in a process of its own, which ends with one
    // bit set per broken promise.
    const pid_t pid = ::fork();
    if (pid == 0) {
        const std::uint64_t kill = 1u << CAP_KILL, fowner = 1u << CAP_FOWNER;
        std::atomic<int> step{0};
        std::pair<std::uint64_t, std::uint64_t> seen[2]; // the bystander's sets after each step
        std::thread bystander([&] {
            __user_cap_header_struct header{_LINUX_CAPABILITY_VERSION_3, 0};
            __user_cap_data_struct data[_LINUX_CAPABILITY_U32S_3] = {};
            ::syscall(SYS_capget, &header, data);
            data[0].effective &= ~fowner; // out of effect in this thread only
            ::syscall(SYS_capset, &header, data);
            for (int i = 0; i < 2; ++i) {
                for (step = 2 * i + 1; step != 2 * i + 2;)
                    ::usleep(1000);
                seen[i] = ownCapabilities();
            }
        });
        while (step != 1)
            ::usleep(1000);
        int broken = adjust(kProcessToken, "cap_fowner", true) ? 0 : 1;
        for (step = 2; step != 3;)
            ::usleep(1000);
        broken |= adjust(kProcessToken, "cap_kill", false) ? 0 : 2;
        broken |= adjust(kProcessToken, "cap_kill", true) ? 0 : 4; // absent, no failure
        step = 4;
        bystander.join();
        broken |= seen[0].first & fowner ? 0 : 8;
        broken |= (seen[1].first | seen[1].second | ownCapabilities().second) & kill ? 16 : 0;
        ::_exit(broken);
    }
    int status = -1;
    QCOMPARE(::waitpid(pid, &status, 0), pid);
    QCOMPARE(status, 0);
    QVERIFY(ownCapabilities().second & (1u << CAP_KILL)); // this process is not touched
}

void TestImpersonation::loginWithoutCallbackOrPassword()
{
    QVERIFY(!ZuBase::Win32Impersonation::login());

    // An empty password means that no impersonation is wanted; a scope then changes nothing.
    const QStringList account{sUser, sPassword};
    sUser = "someone";
    sPassword.clear();
    sCallbackCalls = 0;
    ZuBase::Win32Impersonation::setImpersonationUserCallback(&credentials);
    QVERIFY(ZuBase::Win32Impersonation::login() && sCallbackCalls == 1);
    QString outUser = "x", outPassword = "y";
    ZuBase::Win32Impersonation::getImpersonationUser(outUser, outPassword);
    QCOMPARE(QStringList({outUser, outPassword}), QStringList({"someone", ""}));
    sUser = account[0];
    sPassword = account[1];
    RkLogCapture capture;
    {
        ZuBase::Win32Impersonation scope; // without a token: changes nothing, says nothing
    }
    QCOMPARE(logLines(capture), QStringList());

    // The PAM service: set, else from the environment, else the library's own.
    qputenv("ZUBASE_PAM_SERVICE", "from-environment");
    QCOMPARE(ZuBase::Win32Impersonation::pamServiceName(), "from-environment");
    ZuBase::Win32Impersonation::setPamServiceName("given");
    QCOMPARE(ZuBase::Win32Impersonation::pamServiceName(), "given");
    ZuBase::Win32Impersonation::setPamServiceName(QString());
    qunsetenv("ZUBASE_PAM_SERVICE");
    QCOMPARE(ZuBase::Win32Impersonation::pamServiceName(), "zubase");
}

void TestImpersonation::logonOfRealAccount()
{
    if (!mAccountMade)
        QSKIP("a throwaway account needs root, useradd and chpasswd");

    RkLogCapture capture;
    QString user = sUser, unknown = "zutst-nobody", wrong = "not-" + sPassword;
    QVERIFY(!ZuBase::Win32Impersonation::win32Login(user, wrong) &&
            !ZuBase::Win32Impersonation::win32Login(unknown, wrong));
    const QStringList errors = logLines(capture, nullptr, RkLogError);
    QVERIFY(errors.size() == 2 && errors.at(0).startsWith("::LogonUser " + sUser + " -> 0"));

    // Every accepted form of the name logs on.
    for (const QString& form : {".\\" + sUser, QHostInfo::localHostName() + "\\" + sUser, sUser}) {
        QString name = form, password = sPassword;
        void* token = ZuBase::Win32Impersonation::win32Login(name, password);
        QVERIFY2(token, qPrintable(form));
        if (form != sUser)
            continue;
        RkLogCapture dump;
        ZuBase::win32TokenLog("account", token);
        QCOMPARE(
            logLines(dump, ""),
            QStringList({"<token> [account]", "    <TokenGroups>", groupLine(mGid, true),
                         groupLine(::getgrnam("users")->gr_gid, false), "    </TokenGroups>",
                         "    <TokenPrivileges>", "    </TokenPrivileges>", "</token> [account]"}));
    }
    // The password never reaches the log.
    QCOMPARE(logLines(capture).filter(sPassword), QStringList());
}

void TestImpersonation::impersonationIsPerThread()
{
    if (!mAccountMade)
        QSKIP("a throwaway account needs root, useradd and chpasswd");

    // A failed logon answers false and leaves no token, so the next login asks again; a good
    // token is kept.
    const QString password = sPassword;
    sPassword = "wrong";
    sCallbackCalls = 0;
    ZuBase::Win32Impersonation::setImpersonationUserCallback(&credentials);
    QVERIFY(!ZuBase::Win32Impersonation::login());
    sPassword = password;
    RkLogCapture capture;
    QVERIFY(ZuBase::Win32Impersonation::login() && ZuBase::Win32Impersonation::login());
    QCOMPARE(sCallbackCalls, 2);

    QTemporaryDir dir;
    // The account must be able to create files in the folder.
    QVERIFY(QFile::setPermissions(dir.path(), QFileDevice::Permissions(0x7777)));
    QSemaphore impersonating, mainWrote;
    long workerId = 0;
    bool insideOk = false, afterOk = false;
    std::uint64_t effectiveInside = ~0u;
    std::thread worker([&] {
        workerId = ::syscall(SYS_gettid);
        {
            ZuBase::Win32Impersonation scope;
            // The account holds no privileges, also when the process token enables one.
            adjust(kProcessToken, "SeRestorePrivilege", true);
            effectiveInside = ownCapabilities().first;
            impersonating.release();
            mainWrote.acquire();
            insideOk = createFile(dir.filePath("inside"));
            ZuBase::Win32Impersonation copy(scope); // reverts as well, which does no harm
        }
        afterOk = createFile(dir.filePath("after"));
    });
    impersonating.acquire();
    // Meanwhile this thread is still itself.
    const bool mainOk = createFile(dir.filePath("main"));
    mainWrote.release();
    worker.join();

    QVERIFY(mainOk && insideOk && afterOk && effectiveInside == 0);
    const QFileInfo inside(dir.filePath("inside"));
    QCOMPARE(QList<uint>({inside.ownerId(), inside.groupId()}), QList<uint>({mUid, mGid}));
    QVERIFY(QFileInfo(dir.filePath("main")).ownerId() == 0 &&
            QFileInfo(dir.filePath("after")).ownerId() == 0);
    QCOMPARE(logLines(capture, "Tz", RkLogInfo),
             QStringList({"::LogonUser " + sUser + " -> ok",
                          QString("::ImpersonateLoggedOnUser %1 -> ok").arg(workerId),
                          "::RevertToSelf -> ok", "::RevertToSelf -> ok"}));
}

void TestImpersonation::invalidTokens()
{
    // Handles that were never handed out are refused, not followed.
    int notAToken = 0;
    QVERIFY(ZuBase::Win32Impersonation::impersonate(&notAToken).isBad());
    QVERIFY(!adjust(&notAToken, "cap_kill", false));
    RkLogCapture capture;
    const RkResult res = ZuBase::Win32Impersonation::impersonate(nullptr);
    QVERIFY(res.isBad() && res.toString() == "(0):   ");
    QVERIFY(logLines(capture).value(0).startsWith(
        QString("::ImpersonateLoggedOnUser %1 -> 0, last error").arg(::syscall(SYS_gettid))));
    // A dump of no token has its sections and nothing in them.
    capture.clear();
    ZuBase::win32TokenLog("none", nullptr);
    QCOMPARE(logLines(capture, ""),
             QStringList({"<token> [none]", "    <TokenGroups>", "    </TokenGroups>",
                          "    <TokenPrivileges>", "    </TokenPrivileges>", "</token> [none]"}));
    QVERIFY(logLines(capture, nullptr, RkLogError)
                .value(0)
                .startsWith("::GetTokenInformation -> 0, last error 9"));
}

QTEST_GUILESS_MAIN(TestImpersonation)
#include "tst_impersonation.moc"
