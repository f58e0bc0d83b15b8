// Installation start-up and the other versions: real installation trees in a temporary folder
// (with blanks in its name), fake server executables that print chosen "--version" outputs, and
// the registry file as it is rewritten on disk.
#include "TestSupport.h"
#include "pnresources/PnResourceLayer.h"
#include "zubase/PnResource.h"
#include "zubase/install/PnResource_p.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QProcess>
#include <QSettings>
#include <QTemporaryDir>
#include <QtTest>

#include <sys/stat.h>

using TestSupport::logLines;

namespace {

const char* const kSubFolders[] = {"/bin/arch-Win/", "/bin/arch-Win64VC9-Optimize/", "/"};

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

// The registry's lines before the OtherVersion entries; the rewrite keeps them as they are.
QByteArray registryHead(const QString& inRoot)
{
    return "# Installation registry\nPernelRegistry {\n    LocalDirectory \"" +
           QFile::encodeName(inRoot) + "/local\"\n    Modality CT\n";
}

} // namespace

class TestPnResource : public QObject
{
    Q_OBJECT

private:
    QString mBase; // folder of the current test's trees, with blanks in its name
    QString mRoot; // the running installation
    QString registry() const { return mRoot + "/share/dicom/PernelRegistry"; }
    QString expand(QString inText) const { return inText.replace("$T", mBase); }
    QStringList expand(QStringList inTexts) const
    {
        for (QString& text : inTexts)
            text = expand(text);
        return inTexts;
    }
    // An installation below mBase: the fake server in candidate folder inCandidate ("-": none;
    // a trailing "h": it hangs after printing inOutput).
    void install(const QString& inFolder, const QString& inCandidate, const QByteArray& inOutput);
    void startWith(const QByteArray& inOtherVersionLines);

private slots:
    void init();
    void updateFoldersAndRegistryPath_data();
    void updateFoldersAndRegistryPath();
    void readRegistryFallsBackToDefaults_data();
    void readRegistryFallsBackToDefaults();
    void parseVersionOutput_data();
    void parseVersionOutput();
    void otherVersions_data();
    void otherVersions();
    void secondCallChangesNothing();
    void backupNamesCountUp();
    void unexpectedFormatIsLeftAlone_data();
    void unexpectedFormatIsLeftAlone();
    void fullDiskKeepsRegistry();
    void unstorableFolderIsSkipped();
    void userFolders();

private:
    QTemporaryDir mDir{QDir::tempPath() + "/zu install XXXXXX"};
};

void TestPnResource::install(const QString& inFolder, const QString& inCandidate,
                             const QByteArray& inOutput)
{
    const QString folder = mBase + "/" + inFolder;
    QVERIFY(QDir().mkpath(folder));
    if (inCandidate.startsWith("-"))
        return;
    const QString exe = folder + kSubFolders[inCandidate.left(1).toInt()] + "tzserver.exe";
    QVERIFY(QDir().mkpath(QFileInfo(exe).absolutePath()));
    QVERIFY(QFile::copy(TestSupport::helper("fake_tzserver"), exe));
    QVERIFY(writeFile(exe + ".out", inOutput));
    if (inCandidate.endsWith("h"))
        QVERIFY(writeFile(exe + ".hang", ""));
}

void TestPnResource::startWith(const QByteArray& inOtherVersionLines)
{
    QVERIFY(writeFile(registry(), registryHead(mRoot) + inOtherVersionLines + "}\n"));
    PnResource::initialize(QFile::encodeName(mRoot + "/bin/arch-Win"), nullptr);
    QCOMPARE(QString::fromLocal8Bit(PnResource::registryFilePath().c_str()), registry());
    QCOMPARE(PnResource::registryBundle().size(), 2 + inOtherVersionLines.count('\n'));
}

void TestPnResource::init()
{
    QVERIFY(mDir.isValid());
    static int sCount = 0;
    mBase = mDir.path() + "/case " + QString::number(++sCount);
    mRoot = mBase + "/own";
    QVERIFY(QDir().mkpath(mRoot + "/share/dicom"));
    QVERIFY(QDir().mkpath(mRoot + "/local"));
    QVERIFY(QDir().mkpath(mRoot + "/bin/arch-Win"));
    qunsetenv("PERNEL_REGISTRY");
    PnClientConfig::sStartedViaTzClient = false;
}

void TestPnResource::updateFoldersAndRegistryPath_data()
{
    QTest::addColumn<QString>("start");       // below the root
    QTest::addColumn<QString>("environment"); // PERNEL_REGISTRY, "-": unset
    QTest::addColumn<QString>("argument");    // registry file argument, "-": null
    QTest::addColumn<bool>("viaClient");
    QTest::addColumn<QString>("expected"); // $R: the root

    QTest::newRow("root, default") << ""
                                   << "-"
                                   << "-" << true << "$R/share/dicom/PernelRegistry";
    QTest::newRow("program folder") << "/bin/arch-Win"
                                    << "-"
                                    << "-" << false << "$R/share/dicom/PernelRegistry";
    QTest::newRow("relative argument via client")
        << ""
        << "-"
        << "share/tzclient/Reg" << true << "$R/share/tzserver/Reg";
    QTest::newRow("relative argument") << ""
                                       << "-"
                                       << "share/tzclient/Reg" << false << "$R/share/tzclient/Reg";
    QTest::newRow("relative environment wins") << "/bin/arch-Win"
                                               << "conf/Reg"
                                               << "other/Reg" << false << "$R/conf/Reg";
    QTest::newRow("absolute environment via client") << ""
                                                     << "$R/tzclient/Reg"
                                                     << "-" << true << "$R/tzclient/Reg";
    QTest::newRow("absolute argument") << ""
                                       << "-"
                                       << "/etc/tzclient/Reg" << true << "/etc/tzclient/Reg";
}

void TestPnResource::updateFoldersAndRegistryPath()
{
    QFETCH(QString, start);
    QFETCH(QString, environment);
    QFETCH(QString, argument);
    QFETCH(bool, viaClient);
    QFETCH(QString, expected);
    if (environment != "-")
        qputenv("PERNEL_REGISTRY", QFile::encodeName(environment.replace("$R", mRoot)));
    PnClientConfig::sStartedViaTzClient = viaClient;
    const QByteArray registryArgument = argument.toLocal8Bit();

    PnResource::initialize(QFile::encodeName(mRoot + start),
                           argument == "-" ? nullptr : registryArgument.constData());
    QCOMPARE(QString::fromLocal8Bit(PnResource::getRoot()), mRoot);
    QCOMPARE(QString::fromLocal8Bit(PnResource::registryFilePath().c_str()),
             expected.replace("$R", mRoot));
    QCOMPARE(QString::fromLocal8Bit(PnResource::getLocalDirectory()), mRoot + "/local");
}

void TestPnResource::readRegistryFallsBackToDefaults_data()
{
    QTest::addColumn<QByteArray>("content"); // "<none>": no file
    QTest::addColumn<QString>("reason"); // start of the warning before the fallback; empty: read

    QTest::newRow("readable") << QByteArray(
                                     "R {\n LocalDirectory \"$R/srv\"\n WebServiceHost h\n}\n")
                              << "";
    QTest::newRow("missing") << QByteArray("<none>") << "$P: cannot be read: ";
    QTest::newRow("truncated") << QByteArray("R {\n LocalDirectory /srv/x\n Web")
                               << "$P: line 3: a blank and a value must follow the name";
    QTest::newRow("unknown line") << QByteArray("R {\n LocalDirectory /srv/x\n=5\n}\n")
                                  << "$P: line 3: a parameter name is expected";
    QTest::newRow("not UTF-8") << QByteArray("R {\n LocalDirectory /srv/\xe9t\xe9\n}\n")
                               << "$P: not UTF-8 text";
}

void TestPnResource::readRegistryFallsBackToDefaults()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, reason);
    if (content != "<none>")
        QVERIFY(writeFile(registry(), content.replace("$R", QFile::encodeName(mRoot))));
    QVERIFY(QDir().mkpath(mRoot + "/srv"));
    PnResource::setWebServiceHost("stale");
    RkLogCapture capture;
    PnResource::initialize(QFile::encodeName(mRoot), nullptr);

    const QString fail = "Couldn't read registry file " + registry() + ".\nUsing default settings.";
    const QStringList lines = logLines(capture);
    QCOMPARE(lines.value(0), "PnResource::readRegistry( \"" + registry() + "\" ) [" +
                                 (reason.isEmpty() ? "success" : "fail") + "]");
    if (reason.isEmpty()) {
        QCOMPARE(lines.size(), 1);
        QCOMPARE(QString::fromLocal8Bit(PnResource::getLocalDirectory()), mRoot + "/srv");
        QCOMPARE(QString::fromLocal8Bit(PnResource::getVolumeDirectory()), mRoot + "/srv");
        QCOMPARE(PnResource::getWebServiceHost(), "h");
        return;
    }
    QCOMPARE(lines.size(), 3);
    QVERIFY2(lines[1].startsWith(reason.replace("$P", registry())), qPrintable(lines[1]));
    QCOMPARE(lines[2], fail);
    QCOMPARE(PnResource::registryBundle().size(), 0);
    QCOMPARE(QString::fromLocal8Bit(PnResource::getLocalDirectory()), mRoot + "/local");
    QCOMPARE(PnResource::getWebServiceHost(), "localhost");
    QVERIFY(!PnResource::isWebServiceEnabled());
}

void TestPnResource::parseVersionOutput_data()
{
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QByteArray>("protocol");
    QTest::addColumn<QByteArray>("text");

    QTest::newRow("usual") << QByteArray("Version 6.0.3 (build 17)\nProtocol Version 6.0\n")
                           << QByteArray("6.0") << QByteArray("6.0.3 (build 17)");
    QTest::newRow("at the very start")
        << QByteArray("Protocol Version 6.0\n") << QByteArray() << QByteArray();
    QTest::newRow("ends after the name")
        << QByteArray("x\nProtocol Version") << QByteArray() << QByteArray();
    QTest::newRow("ends after the separator")
        << QByteArray("x Protocol Version:") << QByteArray() << QByteArray();
    QTest::newRow("cut at the first non-digit")
        << QByteArray("x Protocol Version=7.1.2-beta)") << QByteArray("7.1.2")
        << QByteArray("x Protocol Version=7.1.2-beta)");
    QTest::newRow("two separators")
        << QByteArray("x Protocol Version  7.1") << QByteArray() << QByteArray();
    QTest::newRow("up to the first parenthesis")
        << QByteArray("Version 1 (a)(b)") << QByteArray() << QByteArray("1 (a)");
    QTest::newRow("line of the parenthesis")
        << QByteArray("Banner\r\nVersion 6.1 (build 9)\r\nProtocol Version 6.1\r\n")
        << QByteArray("6.1") << QByteArray("6.1 (build 9)");
    QTest::newRow("control character")
        << QByteArray("Version 6\x01 (x)") << QByteArray() << QByteArray();
    QTest::newRow("not UTF-8") << QByteArray("Version \xff (x)") << QByteArray() << QByteArray();
    QTest::newRow("UTF-8") << QByteArray("Version \xc3\xbc (x)") << QByteArray()
                           << QByteArray("\xc3\xbc (x)");
}

void TestPnResource::parseVersionOutput()
{
    QFETCH(QByteArray, output);
    QFETCH(QByteArray, protocol);
    QFETCH(QByteArray, text);
    const PnResource::VersionProbe probe = PnResource::parseVersionOutput(output);
    QCOMPARE(probe.protocolVersion, protocol);
    QCOMPARE(probe.versionText, text);
}

void TestPnResource::otherVersions_data()
{
    QTest::addColumn<QStringList>("entries");       // OtherVersion values, $T: the test folder
    QTest::addColumn<QStringList>("installations"); // folder|candidate|--version output
    QTest::addColumn<QString>("own");
    QTest::addColumn<QStringList>("versions"); // version=folder, in map order
    QTest::addColumn<QStringList>("probed");   // folders whose executable ran
    QTest::addColumn<QStringList>("warnings"); // log lines of level 2 and above
    QTest::addColumn<bool>("rewritten");
    QTest::addColumn<QStringList>("lines"); // the new OtherVersion lines

    const QStringList none;
    QTest::newRow("trusted 4.2") << QStringList{"4.2 $T/v4"}
                                 << QStringList{"v4|0|x Protocol Version 9.9 (y)"} << "8.0"
                                 << QStringList{"4.2=$T/v4"} << none << none << false << none;
    QTest::newRow("trusted 1.0") << QStringList{"1.0 $T/v1"}
                                 << QStringList{"v1|2|x Protocol Version 9.9"} << "8.0"
                                 << QStringList{"1.0=$T/v1"} << none << none << false << none;
    QTest::newRow("5.1 confirmed")
        << QStringList{"5.1 $T/v5"} << QStringList{"v5|1|tzserver\nProtocol Version 5.1\n"} << "8.0"
        << QStringList{"5.1=$T/v5"} << QStringList{"v5"} << none << false << none;
    QTest::newRow("old form")
        << QStringList{"$T/Old Inst"}
        << QStringList{"Old Inst|0|Version 6.0.3 (build 17)\nProtocol Version 6.0\n"} << "8.0"
        << QStringList{"6.0=$T/Old Inst"} << QStringList{"Old Inst"} << none << true
        << QStringList{"    OtherVersion1 \"6.0 $T/Old Inst\" # 6.0.3 (build 17)"};
    QTest::newRow("incorrect version")
        << QStringList{"7.0 $T/v7"}
        << QStringList{"v7|2|tzserver Version 7.1.2 (build 3)\nProtocol Version=7.1\n"} << "8.0"
        << QStringList{"7.1=$T/v7"} << QStringList{"v7"}
        << QStringList{"Incorrect protocol version 7.0 in PernelRegistry, should be 7.1."} << true
        << QStringList{"    OtherVersion1 \"7.1 $T/v7\" # tzserver Version 7.1.2 (build 3)"};
    QTest::newRow("old form without version")
        << QStringList{"$T/nover", "4.4 $T/v44"}
        << QStringList{"nover|0|Protocol Version 6.0 (first byte)", "v44|0|"} << "8.0"
        << QStringList{"4.4=$T/v44"} << QStringList{"nover"}
        << QStringList{"Could not determine protocol version for $T/nover."} << true
        << QStringList{"    OtherVersion1 \"4.4 $T/v44\" # "};
    QTest::newRow("6.5 without version")
        << QStringList{"6.5 $T/v65"} << QStringList{"v65|0|garbage"} << "8.0"
        << QStringList{"6.5=$T/v65"} << QStringList{"v65"}
        << QStringList{"Could not determine protocol version for $T/v65."} << false << none;
    QTest::newRow("missing folder and executable")
        << QStringList{"4.0 $T/gone", "4.1 $T/noexe", "4.2 $T/ok"}
        << QStringList{"noexe|-|", "ok|0|"} << "8.0" << QStringList{"4.2=$T/ok"} << none
        << QStringList{"Other version folder $T/gone not found.",
                       "Other version executable $T/noexe/tzserver.exe not found."}
        << true << QStringList{"    OtherVersion1 \"4.2 $T/ok\" # "};
    QTest::newRow("same as own")
        << QStringList{"8.0 $T/v8", "4.0 $T/v40"}
        << QStringList{"v8|0|x Protocol Version 8.0.0", "v40|1|"} << "8.0"
        << QStringList{"4.0=$T/v40"} << QStringList{"v8"}
        << QStringList{"$T/v8 has same protocol version 8.0 as this instance, ignoring."} << true
        << QStringList{"    OtherVersion1 \"4.0 $T/v40\" # "};
    QTest::newRow("duplicate")
        << QStringList{"4.1 $T/first", "4.3 $T/other", "4.1.0 $T/second"}
        << QStringList{"first|0|", "other|0|", "second|0|"} << "8.0"
        << QStringList{"4.1=$T/second", "4.3=$T/other"} << none
        << QStringList{"Protocol version 4.1.0 already defined, ignoring previous entry."} << true
        << QStringList{"    OtherVersion1 \"4.3 $T/other\" # ",
                       "    OtherVersion2 \"4.1.0 $T/second\" # "};
    QTest::newRow("hanging executable")
        << QStringList{"$T/slow"} << QStringList{"slow|0h|Version 6.2 (b)\nProtocol Version 6.2\n"}
        << "8.0" << QStringList{"6.2=$T/slow"} << QStringList{"slow"} << none << true
        << QStringList{"    OtherVersion1 \"6.2 $T/slow\" # 6.2 (b)"};
}

void TestPnResource::otherVersions()
{
    QFETCH(QStringList, entries);
    QFETCH(QStringList, installations);
    QFETCH(QString, own);
    QFETCH(QStringList, versions);
    QFETCH(QStringList, probed);
    QFETCH(QStringList, warnings);
    QFETCH(bool, rewritten);
    QFETCH(QStringList, lines);

    QStringList executables;
    for (const QString& spec : installations) {
        const QStringList parts = spec.split('|');
        install(parts[0], parts[1], parts[2].toUtf8());
        if (!parts[1].startsWith("-"))
            executables << parts[0] + kSubFolders[parts[1].left(1).toInt()] + "tzserver.exe";
    }
    QByteArray registryLines;
    for (int i = 0; i < entries.size(); ++i)
        registryLines += "    OtherVersion" + QByteArray::number(i + 1) + " \"" +
                         QFile::encodeName(expand(entries[i])) + "\"\n";
    startWith(registryLines);
    const QByteArray before = readFile(registry());

    RkLogCapture capture;
    std::map<RkVersion, std::string> found;
    PnResource::getOtherVersions(found, RkVersion(own.toStdString()));

    QStringList foundTexts;
    for (const auto& [version, folder] : found)
        foundTexts << QString::fromStdString(version.toString()) + "=" +
                          QString::fromLocal8Bit(folder.c_str());
    QCOMPARE(foundTexts, expand(versions));
    QStringList ran;
    for (const QString& exe : executables) {
        const QByteArray args = readFile(mBase + "/" + exe + ".args");
        if (args != "<missing>") {
            QCOMPARE(args, QByteArray("--version\n"));
            ran << exe.section('/', 0, 0);
        }
    }
    QCOMPARE(ran, probed);
    QCOMPARE(logLines(capture, nullptr, RkLogWarning), expand(warnings));

    QByteArray expected = before;
    if (rewritten) {
        expected = registryHead(mRoot);
        for (const QString& line : lines)
            expected += QFile::encodeName(expand(line)) + "\n";
        expected += "}\n";
        QCOMPARE(readFile(registry() + ".bak"), before);
    } else {
        QVERIFY(!QFile::exists(registry() + ".bak"));
    }
    QCOMPARE(readFile(registry()), expected);
    QCOMPARE(logLines(capture).contains("Updating OtherVersion info in PernelRegistry."),
             rewritten);
}

void TestPnResource::secondCallChangesNothing()
{
    install("v6", "0", "Version 6.0 (r)\nProtocol Version 6.0\n");
    // Read with CR LF line ends, written with LF.
    QVERIFY(writeFile(registry(), "R {\r\n    Name Value\r\n    OtherVersion1 \"" +
                                      QFile::encodeName(mBase) + "/v6\"\r\n}\r\n\r\n"));
    PnResource::initialize(QFile::encodeName(mRoot), nullptr);

    for (int call = 1; call <= 2; ++call) {
        RkLogCapture capture;
        std::map<RkVersion, std::string> found;
        PnResource::getOtherVersions(found, RkVersion("7.0"));
        QCOMPARE(found.size(), std::size_t(1));
        QCOMPARE(QString::fromLocal8Bit(found.at(RkVersion("6.0")).c_str()), mBase + "/v6");
        QCOMPARE(logLines(capture).contains("Updating OtherVersion info in PernelRegistry."),
                 call == 1);
    }
    QCOMPARE(readFile(registry()), "R {\n    Name Value\n    OtherVersion1 \"6.0 " +
                                       QFile::encodeName(mBase) + "/v6\" # 6.0 (r)\n}\n");
    QVERIFY(QFile::exists(registry() + ".bak"));
    QVERIFY(!QFile::exists(registry() + ".bak2"));
}

void TestPnResource::backupNamesCountUp()
{
    QVERIFY(writeFile(registry() + ".bak", "first"));
    QVERIFY(writeFile(registry() + ".bak2", "second"));
    startWith("    OtherVersion1 \"4.0 " + QFile::encodeName(mBase) + "/gone\"\n");
    const QByteArray before = readFile(registry());
    std::map<RkVersion, std::string> found;
    PnResource::getOtherVersions(found, RkVersion("8.0"));

    QCOMPARE(readFile(registry()), registryHead(mRoot) + "}\n");
    QCOMPARE(readFile(registry() + ".bak"), QByteArray("first"));
    QCOMPARE(readFile(registry() + ".bak2"), QByteArray("second"));
    QCOMPARE(readFile(registry() + ".bak3"), before);
}

void TestPnResource::unexpectedFormatIsLeftAlone_data()
{
    QTest::addColumn<QByteArray>("content"); // the registry at the time of the update

    QTest::newRow("comment after the block") << QByteArray("R {\n OtherVersion1 /gone\n}\n# end\n");
    QTest::newRow("truncated since reading") << QByteArray("R {\n OtherVersion1 /gone\n");
    QTest::newRow("only the brace") << QByteArray("OtherVersion1 /gone\n}\n\n");
    QTest::newRow("block named like an entry")
        << QByteArray("OtherVersionBlock {\n A 1\n OtherVersion1 /gone\n}\n");
}

void TestPnResource::unexpectedFormatIsLeftAlone()
{
    QFETCH(QByteArray, content);
    startWith("    OtherVersion1 \"/gone\"\n");
    QVERIFY(writeFile(registry(), content));
    RkLogCapture capture;
    std::map<RkVersion, std::string> found;
    PnResource::getOtherVersions(found, RkVersion("8.0"));
    QCOMPARE(logLines(capture, nullptr, RkLogWarning),
             QStringList({"Other version folder /gone not found.",
                          "PernelRegistry has unexpected format, can't update."}));
    QCOMPARE(readFile(registry()), content);
    QCOMPARE(QDir(mRoot + "/share/dicom").entryList(QDir::Files), QStringList{"PernelRegistry"});
}

void TestPnResource::fullDiskKeepsRegistry()
{
    // Three entries each grow by their comment, one short stale entry goes: the new file is
    // larger than the old one, which is the size limit of the child.
    install("a", "0", "");
    install("b", "0", "");
    install("c", "0", "");
    const QByteArray t = QFile::encodeName(mBase);
    const QByteArray content = registryHead(mRoot) + "OtherVersion1 \"4.1 " + t +
                               "/a\"\nOtherVersion2 \"4.2 " + t + "/b\"\nOtherVersion3 \"4.3 " + t +
                               "/c\"\nOtherVersion4 /x\n}\n";
    QVERIFY(writeFile(registry(), content));

    QProcess child;
    child.start(TestSupport::helper("zu_registry_rewrite"),
                {mRoot, QString::number(content.size()), "8.0"});
    QVERIFY(child.waitForFinished(60000));
    QCOMPARE(child.exitCode(), 0);
    const QString log = QString::fromLocal8Bit(child.readAllStandardError());
    QVERIFY2(log.contains("Failed to write PernelRegistry, can't update."), qPrintable(log));
    QCOMPARE(child.readAllStandardOutput(), "4.1 " + t + "/a\n4.2 " + t + "/b\n4.3 " + t + "/c\n");
    QCOMPARE(readFile(registry()), content);
    QCOMPARE(QDir(mRoot + "/share/dicom").entryList(QDir::Files), QStringList{"PernelRegistry"});
}

void TestPnResource::unstorableFolderIsSkipped()
{
    // Not from a file (the reader refuses a double quote inside a quoted value), but a bundle
    // handed over by a host may hold one.
    install("quo\"te", "0", "");
    install("fine", "0", "");
    startWith("");
    DvParamBundle bundle;
    for (const char* name : {"quo\"te", "fine"})
        bundle.add(std::make_unique<DvParameter>(
            "OtherVersion", RkString(QFile::encodeName("4." + QString::number(bundle.size()) + " " +
                                                       mBase + "/" + name)
                                         .toStdString())));
    PnResource::readFromBundle(bundle);
    RkLogCapture capture;
    std::map<RkVersion, std::string> found;
    PnResource::getOtherVersions(found, RkVersion("8.0"));
    QCOMPARE(logLines(capture, nullptr, RkLogWarning),
             QStringList("Other version folder " + mBase +
                         "/quo\"te cannot be stored in PernelRegistry, ignoring."));
    QCOMPARE(found.size(), std::size_t(1));
    QCOMPARE(readFile(registry()), registryHead(mRoot) + "    OtherVersion1 \"4.1 " +
                                       QFile::encodeName(mBase) + "/fine\" # \n}\n");
}

void TestPnResource::userFolders()
{
    // Both are fixed on first use in the process, so this is the only test that asks.
    const QString data = mBase + "/data home/nested";
    qputenv("XDG_DATA_HOME", QFile::encodeName(data));
    QCOMPARE(QString::fromLocal8Bit(PnResource::getAppDataAbsPath("/fallback")),
             data + "/Pernel/Tessel");
    struct stat info = {};
    QCOMPARE(::stat(QFile::encodeName(data).constData(), &info), 0);
    QCOMPARE(info.st_mode & 0777, 0700u);
    qputenv("XDG_DATA_HOME", "/elsewhere");
    QCOMPARE(QString::fromLocal8Bit(PnResource::getAppDataAbsPath("/fallback")),
             data + "/Pernel/Tessel");

    QCOMPARE(QString::fromLocal8Bit(PnResource::getProcessStartupDirectory().c_str()),
             QCoreApplication::applicationDirPath());
    QCOMPARE(PnResource::processStartupDirectory().c_str(),
             PnResource::getProcessStartupDirectory().c_str());

    qputenv("XDG_CONFIG_HOME", QFile::encodeName(mBase + "/config"));
    QCOMPARE(PnResource::applicationSettings().fileName(), mBase + "/config/Pernel/Tessel.conf");
    QCOMPARE(&PnResource::applicationSettings(), &PnResource::applicationSettings());
}

QTEST_GUILESS_MAIN(TestPnResource)
#include "tst_pnresource.moc"
