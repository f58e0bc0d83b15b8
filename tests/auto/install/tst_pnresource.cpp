// Installation start-up, the parameter-file reader, the other versions and the shell-extension
// detection: real installation trees in a temporary folder with blanks in its name, fake server
// executables that print chosen "--version" outputs, and the registry file as it ends up on disk.
#include "TestSupport.h"
#include "pnresources/PnResourceLayer.h"
#include "pnresources/VelmarMesh.h"
#include "zubase/DellBackupAndRecoveryHelper.h"
#include "zubase/PnResource.h"
#include "zubase/install/DellBackupAndRecoveryHelper_p.h"
#include "zubase/install/PnResource_p.h"

#include <QCoreApplication>
#include <QDir>
#include <QProcess>
#include <QSettings>
#include <QTemporaryDir>
#include <QtTest>

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

using TestSupport::logLines;

namespace {

const char* const kSubFolders[] = {"/bin/arch-Win/", "/bin/arch-Win64VC9-Optimize/", "/"};
const QString kUpdating = "Updating OtherVersion info in PernelRegistry.";

QByteArray readFile(const QString& inPath)
{
    QFile file(inPath);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray("<missing>");
}

bool writeFile(const QString& inPath, const QByteArray& inData)
{
    QDir().mkpath(QFileInfo(inPath).absolutePath());
    QFile file(inPath);
    return file.open(QIODevice::WriteOnly) && file.write(inData) == inData.size();
}

// The other versions of the registry as "version=folder;...".
QString otherVersions(const char* inOwn)
{
    std::map<RkVersion, std::string> versions;
    PnResource::getOtherVersions(versions, RkVersion(inOwn));
    QStringList texts;
    for (const auto& [version, folder] : versions)
        texts << QString::fromStdString(version.toString()) + "=" +
                     QFile::decodeName(folder.c_str());
    return texts.join(';');
}

} // namespace

class TestPnResource : public QObject
{
    Q_OBJECT

    QTemporaryDir mDir{QDir::tempPath() + "/zu install XXXXXX"};
    QString mBase; // this test's folder: $T in the tables
    QString mRoot; // the running installation: $R
    QString registry() const { return mRoot + "/share/dicom/PernelRegistry"; }
    QString expand(QString inText) const
    {
        return inText.replace("$T", mBase).replace("$R", mRoot);
    }
    QByteArray local(const QString& inText) const { return QFile::encodeName(expand(inText)); }
    QStringList warnings(const RkLogCapture& inCapture) const
    {
        return logLines(inCapture, nullptr, RkLogWarning).replaceInStrings(mBase, "$T");
    }

    // "folder|candidate|output": an installation with the fake server in candidate folder 0, 1
    // or 2 ("-": none; a trailing "h": it hangs after printing). Returns the server's path.
    QString install(const QString& inInstallation)
    {
        const QStringList parts = inInstallation.split('|');
        QDir().mkpath(mBase + "/" + parts[0]);
        if (parts[1] == "-")
            return QString();
        const QString exe =
            mBase + "/" + parts[0] + kSubFolders[parts[1].left(1).toInt()] + "tzserver.exe";
        QDir().mkpath(QFileInfo(exe).absolutePath());
        QFile::copy(TestSupport::helper("fake_tzserver"), exe);
        writeFile(exe + ".out", parts[2].toUtf8());
        if (parts[1].endsWith('h'))
            writeFile(exe + ".hang", "");
        return exe;
    }

    // The registry: a comment, the block, LocalDirectory, the given lines.
    void start(const QByteArray& inLines)
    {
        QVERIFY(writeFile(registry(),
                          local("# r\nR {\n LocalDirectory \"$R/local\"\n") + inLines + "}\n"));
        PnResource::initialize(QFile::encodeName(mRoot + "/bin/arch-Win"), nullptr);
        QCOMPARE(PnResource::registryBundle().size(), 1 + inLines.count('\n'));
    }

private Q_SLOTS:
    void initTestCase() { QVERIFY(!PnClientConfig::sStartedViaTzClient); }

    void init()
    {
        static int sCount = 0;
        mBase = mDir.path() + "/case " + QString::number(++sCount);
        mRoot = mBase + "/own";
        for (const char* sub : {"/local", "/bin/arch-Win", "/share/dicom"})
            QVERIFY(QDir().mkpath(mRoot + sub));
        qunsetenv("PERNEL_REGISTRY");
        PnClientConfig::sStartedViaTzClient = false;
    }

    void parameterFile_data()
    {
        QTest::addColumn<QByteArray>("text");
        QTest::addColumn<QString>("expected"); // name=value|..., or the refusal
        // clang-format off
        QTest::newRow("values") << QByteArray("# c\n\nReg {\n  A0 1\n\tB \"two  words\"  # n\n  C \"\"\n  D x#y\n"
                                              "  # c\n  Z.e-1_x \"C:\\Apps\\Old\"\n}\n\n# c\n")
                                << "A0=1|B=two  words|C=|D=x#y|Z.e-1_x=C:\\Apps\\Old";
        QTest::newRow("CR LF, BOM, repeats") << QByteArray("\xEF\xBB\xBF{\r\n A \"\xC3\xA9\"\r\n a 2\r\n A 3\r\n}\r\n") << "A=\xC3\xA9|a=2|A=3";
        QTest::newRow("empty") << QByteArray() << "m: no parameter block";
        QTest::newRow("no brace") << QByteArray("A 1\n") << "m: line 1: the parameter block must open with '{'";
        QTest::newRow("truncated") << QByteArray("{\n A 1\n A") << "m: line 3: a blank and a value must follow the name";
        QTest::newRow("not closed") << QByteArray("{\n A 1\n") << "m: the closing '}' is missing";
        QTest::newRow("no value") << QByteArray("{\n A  # c\n}") << "m: line 2: the value is missing";
        QTest::newRow("open quote") << QByteArray("{\n A \"x\n}") << "m: line 2: the quoted value is not closed";
        QTest::newRow("after quote") << QByteArray("{\n A \"x\"y\n}") << "m: line 2: unexpected text after the value";
        QTest::newRow("bad name") << QByteArray("{\n 1A x\n}") << "m: line 2: a parameter name is expected";
        QTest::newRow("after brace") << QByteArray("{\n} x\n") << "m: line 2: the closing '}' must stand alone on its line";
        QTest::newRow("after block") << QByteArray("{\n}\nB 1\n") << "m: line 3: only comments may follow the closing '}'";
        QTest::newRow("NUL") << QByteArray("{\n A x\0y\n}", 11) << "m: line 2: control character";
        QTest::newRow("too large") << "{\n}\n#" + QByteArray(1 << 20, 'x') << "m: larger than 1048576 bytes";
        // Latin-1, overlong, surrogate, beyond U+10FFFF, cut short.
        int n = 0;
        for (const char* bad : {"\xC3\xA9\xE9", "\xC0\xAF", "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xE2\x82"})
            QTest::addRow("not UTF-8 %d", ++n) << "{\n}\n#" + QByteArray(bad) << "m: not UTF-8 text";
        // clang-format on
    }
    void parameterFile()
    {
        QFETCH(QByteArray, text);
        RkResult result;
        const std::unique_ptr<VelmarMesh> mesh =
            VelmarMesh::parse(text.toStdString(), "m", &result);
        QStringList parts;
        for (int i = 0; mesh && i < mesh->size(); ++i) {
            const auto* parameter = dynamic_cast<const DvParameter*>((*mesh)[i]);
            parts << QString::fromUtf8(parameter->getName().c_str()) + "=" +
                         QString::fromUtf8(parameter->getString().c_str());
        }
        for (const RkResult::Record& record : result.records())
            parts << QString::fromStdString(record.message);
        QTEST(parts.join('|'), "expected");
        QCOMPARE(!mesh, result.isBad());
    }

    void startUp_data()
    {
        QTest::addColumn<QString>("start");       // below the root
        QTest::addColumn<QString>("environment"); // PERNEL_REGISTRY, "-": unset
        QTest::addColumn<QString>("argument");    // "-": null
        QTest::addColumn<bool>("viaClient");
        QTest::addColumn<QString>("expected");
        // clang-format off
        QTest::newRow("root") << "" << "-" << "-" << true << "$R/share/dicom/PernelRegistry";
        QTest::newRow("client") << "" << "-" << "s/tzclient/R" << true << "$R/s/tzserver/R";
        QTest::newRow("no client") << "" << "-" << "s/tzclient/R" << false << "$R/s/tzclient/R";
        QTest::newRow("empty environment") << "" << "" << "-" << false << "$R/share/dicom/PernelRegistry";
        QTest::newRow("environment, program folder") << "/bin/arch-Win" << "c/R" << "o/R" << false << "$R/c/R";
        QTest::newRow("absolute environment") << "" << "$R/tzclient/R" << "-" << true << "$R/tzclient/R";
        // clang-format on
    }
    void startUp()
    {
        QFETCH(QString, start);
        QFETCH(QString, environment);
        QFETCH(QString, argument);
        QFETCH(bool, viaClient);
        QFETCH(QString, expected);
        if (environment != "-")
            qputenv("PERNEL_REGISTRY", local(environment));
        PnClientConfig::sStartedViaTzClient = viaClient;
        const QByteArray file = argument.toLocal8Bit();
        PnResource::initialize(local(mRoot + start), argument == "-" ? nullptr : file.data());
        QCOMPARE(QFile::decodeName(PnResource::getRoot()), mRoot);
        QCOMPARE(QFile::decodeName(PnResource::registryFilePath().c_str()), expand(expected));
    }

    // Settings from a readable registry, the defaults otherwise; $P: the registry.
    void registryFallback_data()
    {
        QTest::addColumn<QByteArray>("content"); // "-": no file
        QTest::addColumn<QString>("logged");
        const QString read = "PnResource::readRegistry( \"$P\" ) [success]";
        const QString failed = "PnResource::readRegistry( \"$P\" ) [fail]|$P: ";
        const QString fallback = "|Couldn't read registry file $P.\nUsing default settings.";
        // clang-format off
        QTest::newRow("readable") << QByteArray("R {\n WebServiceEnabled 1\n WebServiceHost h\n LocalDirectory \"$R/l\"\n"
                                                " VolumeDirectory \"$R/v\"\n}\n") << read;
        QTest::newRow("no volume directory") << QByteArray("R {\n VolumeDirectory \"$R/none\"\n}\n")
            << read + "|src/core/pnresources/PnResourceLayer:PnResource::checkDirectories: Volume directory $R/none not found."
                      "  cond[isDirectory(volume)]";
        QTest::newRow("missing") << QByteArray("-") << failed + "cannot be read: No such file or directory" + fallback;
        QTest::newRow("truncated") << QByteArray("R {\n L /x\n W") << failed + "line 3: a blank and a value must follow the name" + fallback;
        // clang-format on
    }
    void registryFallback()
    {
        QFETCH(QByteArray, content);
        QFETCH(QString, logged);
        if (content != "-")
            QVERIFY(
                writeFile(registry(), QByteArray(content).replace("$R", QFile::encodeName(mRoot))));
        QVERIFY(QDir().mkpath(mRoot + "/l") && QDir().mkpath(mRoot + "/v"));
        PnResource::setWebServiceHost("stale");
        RkLogCapture capture;
        PnResource::initialize(QFile::encodeName(mRoot), nullptr);
        QCOMPARE(logLines(capture).join('|'), expand(logged).replace("$P", registry()));
        const bool read = logged.contains("[success]");
        QCOMPARE(PnResource::isWebServiceEnabled(), content.contains("Enabled 1"));
        QCOMPARE(PnResource::getWebServiceHost(), content.contains("Host h") ? "h" : "localhost");
        QCOMPARE(PnResource::getWebServiceLoginName(), getpwuid(geteuid())->pw_name);
        QCOMPARE(QFile::decodeName(PnResource::getLocalDirectory()),
                 mRoot + (content.contains("$R/l") ? "/l" : "/local"));
        QCOMPARE(PnResource::registryBundle().size(), read ? content.count('\n') - 2 : 0);
    }

    // The protocol version: the name, one separator, the number, not at the very start; the
    // version text: one line up to the first ")", storable.
    void versionOutput_data()
    {
        QTest::addColumn<QByteArray>("output");
        QTest::addColumn<QByteArray>("expected"); // protocol|text
        // clang-format off
        QTest::newRow("usual") << QByteArray("Version 6.0.3 (b 7)\nProtocol Version 6.0\n") << QByteArray("6.0|6.0.3 (b 7)");
        QTest::newRow("at the start") << QByteArray("Protocol Version 6.0") << QByteArray("|");
        QTest::newRow("ends after the name") << QByteArray("x Protocol Version") << QByteArray("|");
        QTest::newRow("two separators") << QByteArray("x Protocol Version  7.1") << QByteArray("|");
        QTest::newRow("only a parenthesis") << QByteArray(")") << QByteArray("|)");
        QTest::newRow("first parenthesis") << QByteArray("Version 1 (a)(b)") << QByteArray("|1 (a)");
        QTest::newRow("its line") << QByteArray("B\r\nVersion 6 (b)\r\n") << QByteArray("|6 (b)");
        QTest::newRow("control character") << QByteArray("Version 6\x01 (x)") << QByteArray("|");
        QTest::newRow("not UTF-8") << QByteArray("Version \xff (x)") << QByteArray("|");
        // clang-format on
    }
    void versionOutput()
    {
        QFETCH(QByteArray, output);
        const PnResource::VersionProbe probe = PnResource::parseVersionOutput(output);
        QTEST(probe.protocolVersion + '|' + probe.versionText, "expected");
    }

    void update_data()
    {
        QTest::addColumn<QStringList>("entries");       // OtherVersion values
        QTest::addColumn<QStringList>("installations"); // see install()
        QTest::addColumn<QString>("versions");          // the map, with 8.0 as own version
        QTest::addColumn<QStringList>("probed");        // installations whose server ran
        QTest::addColumn<QStringList>("logged");        // warnings and errors
        QTest::addColumn<QStringList>("lines"); // the new entries; "-": the file is unchanged
        const auto row = [](const char* inName, QStringList inEntries, QStringList inInstallations,
                            QString inVersions, QStringList inProbed, QStringList inLogged,
                            QStringList inLines) {
            QTest::newRow(inName) << inEntries << inInstallations << inVersions << inProbed
                                  << inLogged << inLines;
        };
        // clang-format off
        row("trusted up to 4", {"1.0 $T/v1", "4.9 $T/v4", "5.1 $T/v5"},
            {"v1|2|x Protocol Version 9.9", "v4|0|x Protocol Version 9.9", "v5|1|x\nProtocol Version 5.1 (y)"},
            "1.0=$T/v1;4.9=$T/v4;5.1=$T/v5", {"v5"}, {}, {"-"});
        row("old form", {"$T/Old Inst"}, {"Old Inst|0|Version 6.0.3 (build 17)\nProtocol Version 6.0\n"},
            "6.0=$T/Old Inst", {"Old Inst"}, {}, {"\"6.0 $T/Old Inst\" # 6.0.3 (build 17)"});
        row("incorrect", {"7.0 $T/v7"}, {"v7|2|tz Version 7.1 (b)\nProtocol Version=7.1\n"}, "7.1=$T/v7", {"v7"},
            {"Incorrect protocol version 7.0 in PernelRegistry, should be 7.1."}, {"\"7.1 $T/v7\" # tz Version 7.1 (b)"});
        row("no version", {"$T/nv", "6.5 $T/v65"}, {"nv|0|Protocol Version 6.0 (y)", "v65|0|garbage"}, "6.5=$T/v65",
            {"nv", "v65"}, {"Could not determine protocol version for $T/nv.", "Could not determine protocol version for $T/v65."},
            {"\"6.5 $T/v65\" # "});
        row("missing", {"4.0 $T/gone", "4.1 $T/noexe", "4.2 $T/ok"}, {"noexe|-|", "ok|0|"}, "4.2=$T/ok", {},
            {"Other version folder $T/gone not found.", "Other version executable $T/noexe/tzserver.exe not found."},
            {"\"4.2 $T/ok\" # "});
        row("same as own", {"8.0 $T/v8", "4.0 $T/v40"}, {"v8|0|x Protocol Version 8.0.0", "v40|1|"}, "4.0=$T/v40", {"v8"},
            {"$T/v8 has same protocol version 8.0 as this instance, ignoring."}, {"\"4.0 $T/v40\" # "});
        row("duplicate", {"4.1 $T/a", "4.3 $T/b", "4.1.0 $T/c"}, {"a|0|", "b|0|", "c|0|"}, "4.1=$T/c;4.3=$T/b", {},
            {"Protocol version 4.1.0 already defined, ignoring previous entry."}, {"\"4.3 $T/b\" # ", "\"4.1.0 $T/c\" # "});
        row("hanging", {"$T/slow"}, {"slow|0h|Version 6.2 (b)\nProtocol Version 6.2\n"}, "6.2=$T/slow", {"slow"}, {},
            {"\"6.2 $T/slow\" # 6.2 (b)"});
        // clang-format on
    }
    void update()
    {
        QFETCH(QStringList, entries);
        QFETCH(QStringList, installations);
        QFETCH(QString, versions);
        QFETCH(QStringList, lines);
        QStringList servers;
        for (const QString& installation : installations)
            servers << install(installation);
        QByteArray registryLines;
        for (int i = 0; i < entries.size(); ++i)
            registryLines +=
                " OtherVersion" + QByteArray::number(i + 1) + " \"" + local(entries[i]) + "\"\n";
        start(registryLines);
        const QByteArray before = readFile(registry());

        RkLogCapture capture;
        QCOMPARE(otherVersions("8.0"), expand(versions));
        QStringList ran; // the probe gets the one argument as such
        for (int i = 0; i < servers.size(); ++i) {
            const QByteArray args = readFile(servers[i] + ".args");
            if (args != "<missing>")
                ran << installations[i].section('|', 0, 0) + (args == "--version\n" ? "" : args);
        }
        QTEST(ran, "probed");
        QTEST(warnings(capture), "logged");

        const bool rewritten = lines != QStringList("-");
        QByteArray expected = local("# r\nR {\n LocalDirectory \"$R/local\"\n");
        for (int i = 0; i < lines.size(); ++i)
            expected +=
                "    OtherVersion" + QByteArray::number(i + 1) + " " + local(lines[i]) + "\n";
        QCOMPARE(readFile(registry()), rewritten ? expected + "}\n" : before);
        QCOMPARE(readFile(registry() + ".bak"), rewritten ? before : "<missing>");
        QCOMPARE(logLines(capture).contains(kUpdating), rewritten);
    }

    // Read with CR LF line ends, written with LF; a second call finds nothing to change.
    void repeatedUpdateAndBackupNames()
    {
        install("v6|0|Version 6.0 (r)\nProtocol Version 6.0\n");
        QVERIFY(writeFile(registry() + ".bak", "1") && writeFile(registry() + ".bak2", "2"));
        const QByteArray before = local("R {\r\n A B\r\n OtherVersion1 \"$T/v6\"\r\n}\r\n\r\n");
        QVERIFY(writeFile(registry(), before));
        PnResource::initialize(QFile::encodeName(mRoot), nullptr);
        for (int call = 1; call <= 2; ++call) {
            RkLogCapture capture;
            QCOMPARE(otherVersions("7.0"), "6.0=" + mBase + "/v6");
            QCOMPARE(logLines(capture).contains(kUpdating), call == 1);
        }
        QCOMPARE(readFile(registry()),
                 local("R {\n A B\n    OtherVersion1 \"6.0 $T/v6\" # 6.0 (r)\n}\n"));
        QCOMPARE(readFile(registry() + ".bak") + readFile(registry() + ".bak2"), "12");
        QCOMPARE(readFile(registry() + ".bak3"), before);
        QVERIFY(!QFile::exists(registry() + ".bak4"));
    }

    void unexpectedFormat_data()
    {
        QTest::addColumn<QByteArray>("content"); // the registry when it is to be updated
        QTest::newRow("comment after the block")
            << QByteArray("R {\n OtherVersion1 /gone\n}\n# end\n");
        QTest::newRow("only the brace") << QByteArray("OtherVersion1 /gone\n}\n\n");
        QTest::newRow("block named OtherVersion")
            << QByteArray("OtherVersionB {\n A 1\n OtherVersion1 /gone\n}\n");
    }
    void unexpectedFormat()
    {
        QFETCH(QByteArray, content);
        start(" OtherVersion1 /gone\n");
        QVERIFY(writeFile(registry(), content));
        RkLogCapture capture;
        QCOMPARE(otherVersions("8.0"), "");
        QCOMPARE(warnings(capture),
                 QStringList({"Other version folder /gone not found.",
                              "PernelRegistry has unexpected format, can't update."}));
        QCOMPARE(readFile(registry()), content);
        QCOMPARE(QDir(mRoot + "/share/dicom").entryList(QDir::Files),
                 QStringList("PernelRegistry"));
    }

    // Three entries grow by their comments, a short stale one goes: the new file is larger than
    // the old one, whose size is the child's file-size limit.
    void fullDiskKeepsRegistry()
    {
        QByteArray content = local("R {\n");
        for (const QString name : {"1", "2", "3"}) {
            install(name + "|0|");
            content += local("OtherVersion \"4." + name + " $T/" + name + "\"\n");
        }
        content += "OtherVersion /x\n}\n";
        QVERIFY(writeFile(registry(), content));
        QProcess child;
        child.start(TestSupport::helper("zu_registry_rewrite"),
                    {mRoot, QString::number(content.size()), "8.0"});
        QVERIFY(child.waitForFinished(60000));
        QCOMPARE(child.exitCode(), 0);
        const QString log = QString::fromLocal8Bit(child.readAllStandardError());
        QVERIFY2(log.contains(" W Failed to write PernelRegistry, can't update."), qPrintable(log));
        QCOMPARE(readFile(registry()), content);
        QCOMPARE(QDir(mRoot + "/share/dicom").entryList(QDir::Files),
                 QStringList("PernelRegistry"));
    }

    // The reader refuses a double quote in a quoted value, but a host's bundle may hold one.
    void unstorableFolder()
    {
        install("q\"|0|");
        install("fine|0|");
        start("");
        DvParamBundle bundle;
        for (const char* name : {"q\"", "fine"})
            bundle.add(
                std::make_unique<DvParameter>("OtherVersion", (local("4.1 $T/") + name).data()));
        PnResource::readFromBundle(bundle);
        RkLogCapture capture;
        QCOMPARE(otherVersions("8.0"), "4.1=" + mBase + "/fine");
        QCOMPARE(warnings(capture),
                 QStringList(
                     "Other version folder $T/q\" cannot be stored in PernelRegistry, ignoring."));
        QCOMPARE(readFile(registry()), local("# r\nR {\n LocalDirectory \"$R/local\"\n    "
                                             "OtherVersion1 \"4.1 $T/fine\" # \n}\n"));
    }

    // Fixed on first use in the process: this is the only test that asks.
    void userFolders()
    {
        const QString data = mBase + "/data home/d";
        qputenv("XDG_DATA_HOME", QFile::encodeName(data));
        QCOMPARE(QFile::decodeName(PnResource::getAppDataAbsPath("/f")), data + "/Pernel/Tessel");
        qputenv("XDG_DATA_HOME", "/elsewhere");
        QCOMPARE(QFile::decodeName(PnResource::getAppDataAbsPath("/f")), data + "/Pernel/Tessel");
        struct stat info = {};
        QVERIFY(::stat(QFile::encodeName(data).constData(), &info) == 0 &&
                (info.st_mode & 0777) == 0700);
        const QString dir = QCoreApplication::applicationDirPath();
        QCOMPARE(QFile::decodeName(PnResource::getProcessStartupDirectory().c_str()), dir);
        QCOMPARE(QFile::decodeName(PnResource::processStartupDirectory().c_str()), dir);
        qputenv("XDG_CONFIG_HOME", QFile::encodeName(mBase + "/config"));
        QCOMPARE(PnResource::applicationSettings().fileName(),
                 mBase + "/config/Pernel/Tessel.conf");
    }

    // The paths are built with backslashes: here they are plain file names.
    void shellExtensions()
    {
        for (const char* text : {"1.8", "1.8.0.12", "", "1.9", "2.8"})
            QCOMPARE(DellBackupAndRecoveryHelper::isMaliciousVersionText(text),
                     QByteArray(text).startsWith("1.8"));
        const QString pf = mBase + "/pf", x86 = mBase + "/x86";
        const QString shell = "\\Dell Backup and Recovery\\Components\\Shell\\";
        const QStringList present{pf + shell + "DBRShellExtension.dll",
                                  x86 + shell + "DBROverlayIconBackuped.dll",
                                  x86 + shell + "DBRShellExtension.dll"};
        for (const QString& path : present)
            QVERIFY(writeFile(path, ""));
        QCOMPARE(DellBackupAndRecoveryHelper::shellExtensionDllList(pf, x86), present);
        QCOMPARE(DellBackupAndRecoveryHelper::shellExtensionDllList(x86, x86), present.mid(1));
        // No program-files folders and no registry on Linux.
        QVERIFY(DellBackupAndRecoveryHelper::getShellExtensionDllList().isEmpty() &&
                !DellBackupAndRecoveryHelper::isMaliciousVersion());
    }
};

QTEST_GUILESS_MAIN(TestPnResource)
#include "tst_pnresource.moc"
