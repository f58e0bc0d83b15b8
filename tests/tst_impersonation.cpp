// Accounts: logon through the host's callback, per-thread impersonation with a real account,
// privileges and the token dump.
#include "zubase/Impersonation.h"
#include "zubase/Impersonation_p.h"

#include "rklib/RkLogFile.h"

#include <QFile>
#include <QFileInfo>
#include <QHostInfo>
#include <QProcess>
#include <QRegularExpression>
#include <QSemaphore>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QtTest>

#include <grp.h>
#include <pwd.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <thread>
#include <unistd.h>

namespace {

void* const sProcessToken = reinterpret_cast<void*>(static_cast<intptr_t>(-1));

QString sUser;
QString sPassword;
int sCallbackCalls = 0;

void credentials(QString& outUser, QString& outPassword)
{
    ++sCallbackCalls;
    outUser = sUser;
    outPassword = sPassword;
}

// The lines of the token dump: information lines without a category.
QStringList dumpLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries()) {
        if (entry.category.empty() && entry.level == RkLogInfo)
            lines << QString::fromStdString(entry.text);
    }
    return lines;
}

QStringList errorLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries()) {
        if (entry.level >= RkLogError)
            lines << QString::fromStdString(entry.text);
    }
    return lines;
}

QString groupName(gid_t inGid)
{
    const group* entry = ::getgrgid(inGid);
    return entry ? QString::fromLocal8Bit(entry->gr_name) : QString();
}

QString ownerFlags(bool inPrimary)
{
    return QStringLiteral(" SE_GROUP_MANDATORY SE_GROUP_ENABLED_BY_DEFAULT SE_GROUP_ENABLED") +
           (inPrimary ? " SE_GROUP_OWNER" : "");
}

bool run(const QString& inProgram, const QStringList& inArgs, const QByteArray& inInput = {})
{
    QProcess process;
    process.start(inProgram, inArgs);
    if (!process.waitForStarted(10000))
        return false;
    process.write(inInput);
    process.closeWriteChannel();
    return process.waitForFinished(30000) && process.exitStatus() == QProcess::NormalExit &&
           process.exitCode() == 0;
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

private slots:
    void initTestCase();
    void cleanupTestCase();
    void splitLogonName_data();
    void splitLogonName();
    void groupFlags_data();
    void groupFlags();
    void tokenLogOfProcess();
    void tokenLogOfNoToken();
    void tokenLogOfUnnamedGroup();
    void adjustPrivilege();
    void loginWithoutCallbackOrPassword();
    void logonOfRealAccount();
    void impersonationIsPerThread();
    void impersonateFailure();

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
    const QString useradd = QStandardPaths::findExecutable("useradd", {"/usr/sbin", "/sbin"});
    const QString chpasswd = QStandardPaths::findExecutable("chpasswd", {"/usr/sbin", "/sbin"});
    if (useradd.isEmpty() || chpasswd.isEmpty())
        return;
    // A throwaway account with one supplementary group.
    sUser = QStringLiteral("zutst%1").arg(::getpid());
    sPassword = QStringLiteral("Pw-%1-secret").arg(::getpid());
    mAccountMade = run(useradd, {"-M", "-s", "/usr/sbin/nologin", "-G", "users", sUser}) &&
                   run(chpasswd, {}, (sUser + ':' + sPassword + '\n').toLocal8Bit());
    if (const passwd* entry = ::getpwnam(qPrintable(sUser))) {
        mUid = entry->pw_uid;
        mGid = entry->pw_gid;
    } else {
        mAccountMade = false;
    }
}

void TestImpersonation::cleanupTestCase()
{
    if (!sUser.isEmpty() && ::getpwnam(qPrintable(sUser)))
        run(QStandardPaths::findExecutable("userdel", {"/usr/sbin", "/sbin"}), {sUser});
}

void TestImpersonation::splitLogonName_data()
{
    QTest::addColumn<QString>("user");
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("domain");
    QTest::addColumn<bool>("hasDomain");
    QTest::addColumn<QString>("pamUser");

    QTest::newRow("domain and name") << "CORP\\alice"
                                     << "alice"
                                     << "CORP" << true << "CORP\\alice";
    QTest::newRow("first backslash splits") << "CORP\\a\\b"
                                            << "a\\b"
                                            << "CORP" << true << "CORP\\a\\b";
    QTest::newRow("local domain") << ".\\alice"
                                  << "alice"
                                  << "." << true << "alice";
    QTest::newRow("this machine") << QHostInfo::localHostName() + "\\alice"
                                  << "alice" << QHostInfo::localHostName() << true << "alice";
    QTest::newRow("this machine in capitals")
        << QHostInfo::localHostName().toUpper() + "\\alice"
        << "alice" << QHostInfo::localHostName().toUpper() << true << "alice";
    QTest::newRow("principal name") << "alice@corp.example"
                                    << "alice@corp.example"
                                    << "" << false << "alice@corp.example";
    QTest::newRow("plain name") << "alice"
                                << "alice"
                                << "." << true << "alice";
}

void TestImpersonation::splitLogonName()
{
    QFETCH(QString, user);
    QFETCH(QString, name);
    QFETCH(QString, domain);
    QFETCH(bool, hasDomain);
    QFETCH(QString, pamUser);
    const ZuBase::LogonName logon = ZuBase::splitLogonName(user);
    QCOMPARE(logon.name, name);
    QCOMPARE(logon.domain, domain);
    QCOMPARE(logon.hasDomain, hasDomain);
    QCOMPARE(ZuBase::pamUserName(logon), pamUser);
}

void TestImpersonation::groupFlags_data()
{
    QTest::addColumn<uint>("attributes");
    QTest::addColumn<QString>("flags");
    QTest::newRow("none") << 0u << "";
    QTest::newRow("logon id") << 0xC0000007u
                              << " SE_GROUP_MANDATORY SE_GROUP_ENABLED_BY_DEFAULT "
                                 "SE_GROUP_ENABLED SE_GROUP_LOGON_ID";
    QTest::newRow("either logon id bit") << 0x40000000u << " SE_GROUP_LOGON_ID";
    QTest::newRow("every flag in table order")
        << 0xE000007Fu
        << " SE_GROUP_MANDATORY SE_GROUP_ENABLED_BY_DEFAULT SE_GROUP_ENABLED SE_GROUP_OWNER "
           "SE_GROUP_USE_FOR_DENY_ONLY SE_GROUP_INTEGRITY SE_GROUP_INTEGRITY_ENABLED "
           "SE_GROUP_LOGON_ID SE_GROUP_RESOURCE";
    QTest::newRow("deny only") << 0x10u << " SE_GROUP_USE_FOR_DENY_ONLY";
}

void TestImpersonation::groupFlags()
{
    QFETCH(uint, attributes);
    QFETCH(QString, flags);
    QCOMPARE(ZuBase::groupFlagsText(attributes), flags);
    QCOMPARE(ZuBase::groupText("S-1-22-2-100", "Unix Group", "users", attributes),
             "[S-1-22-2-100]  [Unix Group\\\\users]  [" + flags + "]");
    QCOMPARE(ZuBase::privilegeText("SeDebugPrivilege", attributes),
             "SeDebugPrivilege  [0x" + QString::number(attributes, 16) + "]");
    QCOMPARE(ZuBase::privilegeText("SeBackupPrivilege", 3), QString("SeBackupPrivilege  [0x3]"));
}

void TestImpersonation::tokenLogOfProcess()
{
    RkLogCapture capture;
    ZuBase::win32TokenLog("process", sProcessToken);
    const QStringList lines = dumpLines(capture);
    QVERIFY(lines.size() >= 7);
    QCOMPARE(lines.mid(0, 2), QStringList({"<token> [process]", "    <TokenGroups>"}));
    const gid_t gid = ::getegid();
    QCOMPARE(lines.at(2), QStringLiteral("        [S-1-22-2-%1]  [Unix Group\\\\%2]  [%3]")
                              .arg(gid)
                              .arg(groupName(gid), ownerFlags(true)));
    const int groupsEnd = lines.indexOf("    </TokenGroups>");
    QVERIFY(groupsEnd > 2);
    QCOMPARE(lines.at(groupsEnd + 1), QString("    <TokenPrivileges>"));
    QCOMPARE(lines.mid(lines.size() - 2),
             QStringList({"    </TokenPrivileges>", "</token> [process]"}));
    const QStringList privileges = lines.mid(groupsEnd + 2, lines.size() - groupsEnd - 4);
    for (const QString& line : privileges)
        QVERIFY2(QRegularExpression(R"(^        \S+  \[0x[0-9a-f]+\]$)").match(line).hasMatch(),
                 qPrintable(line));
    if (mRoot) {
        QVERIFY(privileges.contains("        SeRestorePrivilege  [0x2]"));
        QVERIFY(privileges.contains("        cap_kill  [0x2]"));
    }
    QCOMPARE(errorLines(capture), QStringList());
}

void TestImpersonation::tokenLogOfNoToken()
{
    RkLogCapture capture;
    ZuBase::win32TokenLog("none", nullptr);
    QCOMPARE(dumpLines(capture),
             QStringList({"<token> [none]", "    <TokenGroups>", "    </TokenGroups>",
                          "    <TokenPrivileges>", "    </TokenPrivileges>", "</token> [none]"}));
    const QStringList errors = errorLines(capture);
    QCOMPARE(errors.size(), 2);
    QVERIFY(errors.at(0).startsWith("::GetTokenInformation -> 0, last error"));
}

void TestImpersonation::tokenLogOfUnnamedGroup()
{
    if (!mRoot)
        QSKIP("changing a thread's groups needs root");
    // Only this thread gets a group without a name; the rest of the process is not touched.
    QStringList lines;
    std::thread worker([&lines] {
        const gid_t groups[] = {4242421};
        if (::syscall(SYS_setgroups, 1, groups) != 0)
            return;
        RkLogCapture capture;
        ZuBase::win32TokenLog("unnamed", sProcessToken);
        lines = dumpLines(capture);
    });
    worker.join();
    QVERIFY(lines.contains("        [S-1-22-2-4242421]  [\\\\ERROR_NONE_MAPPED]  [" +
                           ownerFlags(false) + "]"));
    gid_t own[64];
    const int count = ::getgroups(64, own);
    QVERIFY(count >= 0);
    QVERIFY(!std::count(own, own + count, gid_t(4242421)));
}

void TestImpersonation::adjustPrivilege()
{
    if (!mRoot)
        QSKIP("capabilities to adjust are held only by root");
    // Removing a privilege is for good, so it is done on a thread of its own.
    RkLogCapture capture;
    bool enableOk = false, byCapName = false, unknownBad = false, removeOk = false, againOk = false;
    QStringList after;
    std::thread worker([&] {
        enableOk =
            ZuBase::win32TokenAdjustPrivilege(sProcessToken, (char*)"SeRestorePrivilege", true)
                .isOk();
        byCapName =
            ZuBase::win32TokenAdjustPrivilege(sProcessToken, (char*)"cap_fowner", true).isOk();
        unknownBad =
            ZuBase::win32TokenAdjustPrivilege(sProcessToken, (char*)"SeNoSuchPrivilege", true)
                .isBad();
        removeOk =
            ZuBase::win32TokenAdjustPrivilege(sProcessToken, (char*)"cap_kill", false).isOk();
        againOk = ZuBase::win32TokenAdjustPrivilege(sProcessToken, (char*)"cap_kill", true).isOk();
        RkLogCapture dump;
        ZuBase::win32TokenLog("after", sProcessToken);
        after = dumpLines(dump);
    });
    worker.join();
    QVERIFY(enableOk);
    QVERIFY(byCapName);
    QVERIFY(unknownBad);
    QVERIFY(removeOk);
    QVERIFY(againOk);
    QVERIFY(!after.isEmpty());
    // Removed for good: enabling it again leaves it absent.
    QVERIFY(!after.contains("        cap_kill  [0x2]"));
    QVERIFY(!after.contains("        cap_kill  [0x0]"));
    QVERIFY(after.contains("        SeRestorePrivilege  [0x2]"));
    const QStringList errors = errorLines(capture);
    QCOMPARE(errors.size(), 1);
    QVERIFY2(errors.at(0).startsWith("::LookupPrivilegeValue SeNoSuchPrivilege -> 0, last error"),
             qPrintable(errors.at(0)));
    // Only a token that is no token makes the adjustment itself fail.
    QVERIFY(ZuBase::win32TokenAdjustPrivilege(nullptr, (char*)"SeRestorePrivilege", true).isBad());
    QVERIFY(errorLines(capture).at(1).startsWith(
        "::AdjustTokenPrivileges SeRestorePrivilege -> 0, last error 9:"));

    // The other threads keep it.
    RkLogCapture mainDump;
    ZuBase::win32TokenLog("main", sProcessToken);
    QVERIFY(dumpLines(mainDump).contains("        cap_kill  [0x2]"));
}

void TestImpersonation::loginWithoutCallbackOrPassword()
{
    QVERIFY(!ZuBase::Win32Impersonation::login());

    // An empty password means that no impersonation is wanted.
    const QString user = sUser;
    const QString password = sPassword;
    sUser = "someone";
    sPassword.clear();
    sCallbackCalls = 0;
    ZuBase::Win32Impersonation::setImpersonationUserCallback(&credentials);
    QVERIFY(ZuBase::Win32Impersonation::login());
    QCOMPARE(sCallbackCalls, 1);
    QString outUser = "x", outPassword = "y";
    ZuBase::Win32Impersonation::getImpersonationUser(outUser, outPassword);
    QCOMPARE(outUser, QString("someone"));
    QCOMPARE(outPassword, QString());
    sUser = user;
    sPassword = password;

    // Without a token a scope changes nothing.
    QTemporaryDir dir;
    RkLogCapture capture;
    {
        ZuBase::Win32Impersonation scope;
        QVERIFY(createFile(dir.filePath("plain")));
    }
    QCOMPARE(QFileInfo(dir.filePath("plain")).ownerId(), ::geteuid());
    QVERIFY(capture.texts("Tz").empty());
}

void TestImpersonation::logonOfRealAccount()
{
    if (!mRoot)
        QSKIP("creating a throwaway account and checking its password needs root");
    if (!mAccountMade)
        QSKIP("useradd/chpasswd could not create the throwaway account");

    RkLogCapture capture;
    QString user = sUser;
    QString wrong = "not-" + sPassword;
    QCOMPARE(ZuBase::Win32Impersonation::win32Login(user, wrong), nullptr);
    QString unknown = "zutst-nobody";
    QCOMPARE(ZuBase::Win32Impersonation::win32Login(unknown, wrong), nullptr);
    QStringList errors = errorLines(capture);
    QCOMPARE(errors.size(), 2);
    QVERIFY2(errors.at(0).startsWith("::LogonUser " + sUser + " -> 0, last error"),
             qPrintable(errors.at(0)));

    // Every accepted form of the name logs on.
    for (const QString& form : {sUser, ".\\" + sUser, QHostInfo::localHostName() + "\\" + sUser}) {
        QString name = form;
        QString password = sPassword;
        void* token = ZuBase::Win32Impersonation::win32Login(name, password);
        QVERIFY2(token, qPrintable(form));
        if (form == sUser) {
            RkLogCapture dump;
            ZuBase::win32TokenLog("account", token);
            const QStringList lines = dumpLines(dump);
            const gid_t users = ::getgrnam("users")->gr_gid;
            QCOMPARE(lines, QStringList({
                                "<token> [account]",
                                "    <TokenGroups>",
                                QStringLiteral("        [S-1-22-2-%1]  [Unix Group\\\\%2]  [%3]")
                                    .arg(mGid)
                                    .arg(groupName(mGid), ownerFlags(true)),
                                QStringLiteral("        [S-1-22-2-%1]  [Unix Group\\\\users]  [%2]")
                                    .arg(users)
                                    .arg(ownerFlags(false)),
                                "    </TokenGroups>",
                                "    <TokenPrivileges>",
                                "    </TokenPrivileges>",
                                "</token> [account]",
                            }));
        }
    }
    // The password never reaches the log.
    for (const std::string& text : capture.texts())
        QVERIFY(!QString::fromStdString(text).contains(sPassword));
}

void TestImpersonation::impersonationIsPerThread()
{
    if (!mRoot)
        QSKIP("changing a thread's identity needs root");
    if (!mAccountMade)
        QSKIP("useradd/chpasswd could not create the throwaway account");

    // A failed logon answers false and leaves no token, so the next login asks again.
    const QString password = sPassword;
    sPassword = "wrong";
    sCallbackCalls = 0;
    QVERIFY(!ZuBase::Win32Impersonation::login());
    sPassword = password;

    RkLogCapture capture;
    QVERIFY(ZuBase::Win32Impersonation::login());
    QCOMPARE(sCallbackCalls, 2);
    QVERIFY(ZuBase::Win32Impersonation::login()); // the token is kept
    QCOMPARE(sCallbackCalls, 2);

    QTemporaryDir dir;
    // The account must be able to create files in the folder.
    QCOMPARE(::chmod(QFile::encodeName(dir.path()).constData(), 0777), 0);
    QSemaphore impersonating, mainWrote;
    long workerId = 0;
    bool insideOk = false, afterOk = false;
    std::thread worker([&] {
        workerId = ::syscall(SYS_gettid);
        {
            ZuBase::Win32Impersonation scope;
            impersonating.release();
            mainWrote.acquire();
            insideOk = createFile(dir.filePath("inside"));
            // A copy carries the flag and reverts as well, which does no harm.
            ZuBase::Win32Impersonation copy(scope);
            Q_UNUSED(copy);
        }
        afterOk = createFile(dir.filePath("after"));
    });
    impersonating.acquire();
    // Meanwhile this thread is still itself.
    const bool mainOk = createFile(dir.filePath("main"));
    mainWrote.release();
    worker.join();

    QVERIFY(mainOk && insideOk && afterOk);
    const QFileInfo inside(dir.filePath("inside"));
    QCOMPARE(inside.ownerId(), mUid);
    QCOMPARE(inside.groupId(), mGid);
    QCOMPARE(QFileInfo(dir.filePath("main")).ownerId(), uint(0));
    QCOMPARE(QFileInfo(dir.filePath("after")).ownerId(), uint(0));
    QCOMPARE(::geteuid(), uid_t(0));

    QStringList tz;
    for (const RkLogEntry& entry : capture.entries()) {
        if (entry.category == "Tz" && entry.level >= RkLogInfo)
            tz << QString::fromStdString(entry.text);
    }
    QCOMPARE(tz, QStringList({"::LogonUser " + sUser + " -> ok",
                              QString("::ImpersonateLoggedOnUser %1 -> ok").arg(workerId),
                              "::RevertToSelf -> ok", "::RevertToSelf -> ok"}));
}

void TestImpersonation::impersonateFailure()
{
    RkLogCapture capture;
    // Handles that were never handed out are refused, not followed.
    int notAToken = 0;
    QVERIFY(ZuBase::Win32Impersonation::impersonate(&notAToken).isBad());
    QVERIFY(ZuBase::win32TokenAdjustPrivilege(&notAToken, (char*)"cap_kill", false).isBad());
    capture.clear();
    const RkResult res = ZuBase::Win32Impersonation::impersonate(nullptr);
    QVERIFY(res.isBad());
    QCOMPARE(int(res.records().size()), 1);
    QCOMPARE(int(res.records().front().code), 2);
    QVERIFY(res.records().front().message.empty() && res.records().front().detail.empty());
    const QStringList errors = errorLines(capture);
    QCOMPARE(errors.size(), 1);
    QVERIFY(errors.at(0).startsWith(
        QString("::ImpersonateLoggedOnUser %1 -> 0, last error").arg(::syscall(SYS_gettid))));
}

QTEST_GUILESS_MAIN(TestImpersonation)
#include "tst_impersonation.moc"
