// Machine information: the DMI tool's output and its start, and disk space of real paths.
#include "TestSupport.h"
#include "zubase/Hardware.h"
#include "zubase/system/Hardware_p.h"

#include <sys/statvfs.h>

using TestSupport::logLines;

namespace {

const QString kSample = TestSupport::dataPath("files/dmidecode/desktop-ami-2007.txt");

// A fake DMI tool: prints the given file for exactly "-q", complains otherwise. A file name
// behind "hang:" is printed and the tool then does not end.
void writeTool(const QString& inPath, QString inOutputFile)
{
    const bool hang = inOutputFile.startsWith("hang:");
    if (hang)
        inOutputFile.remove(0, 5);
    QFile tool(inPath);
    QVERIFY(tool.open(QIODevice::WriteOnly));
    tool.write("#!/bin/sh\n"
               "if [ \"$#\" -eq 1 ] && [ \"$1\" = \"-q\" ]; then cat '" +
               inOutputFile.toLocal8Bit() +
               "'; else echo 'BIOS Information'; echo 'Vendor: wrong arguments'; fi\n" +
               (hang ? "exec sleep 60\n" : ""));
    tool.close();
    QVERIFY(tool.setPermissions(tool.permissions() | QFile::ExeOwner | QFile::ExeGroup |
                                QFile::ExeOther));
}

} // namespace

class TestHardware : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void parseDmiDecodeOutput_data();
    void parseDmiDecodeOutput();
    void hardwareTypeFromTool_data();
    void hardwareTypeFromTool();
    void diskSpaceArithmetic_data();
    void diskSpaceArithmetic();
    void diskFreeSpaceOfRealPath();
    void diskFreeSpaceOfMissingPath();
};

void TestHardware::parseDmiDecodeOutput_data()
{
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QStringList>("expected"); // product, serial number, BIOS

    const auto row = [](const char* inName, const QByteArray& inOutput, const QString& inProduct,
                        const QString& inSerial, const QString& inBios) {
        QTest::newRow(inName) << inOutput << QStringList{inProduct, inSerial, inBios};
    };
    QFile sample(kSample);
    QVERIFY(sample.open(QIODevice::ReadOnly));
    row("real desktop output", sample.readAll(), "P4M900T-M2", "00000000",
        "American Megatrends Inc., 080014, 12/17/2007");

    const QByteArray bios = "BIOS Information\n\tVendor: ACME\n\tVersion: 1.2\n"
                            "\tRelease Date: 01/02/2015\n\tROM Size: 64 kB\n\n";
    const QByteArray system = "System Information\n\tManufacturer: Maker\n"
                              "\tProduct Name: Box 9\n\tVersion: 3\n\tSerial Number: SN-1\n\n";
    const QString acme = "ACME, 1.2, 01/02/2015";
    row("other section skipped to its empty line",
        bios + "Base Board Information\n\tProduct Name: Board\n\tVersion: 7\n\n" + system, "Box 9",
        "SN-1", acme);
    row("vendor missing", "BIOS Information\n\tVersion: 1.2\n\tRelease Date: 01/02/2015\n\n", "N/A",
        "N/A", "N/A, 1.2, 01/02/2015");
    row("windows line ends", QByteArray(bios + system).replace("\n", "\r\n"), "Box 9", "SN-1",
        acme);
    row("no blank after colon", "System Information\nProduct Name:XBox\nSerial Number:\n\n", "Box",
        "", "N/A");
    row("header with more text", "System Information (SMBIOS 2.7)\n\tProduct Name: Tower\n\n",
        "Tower", "N/A", "N/A");
    row("values outside sections ignored",
        "Chassis Information\n\tVendor: Case\n\tSerial Number: C1\n\n", "N/A", "N/A", "N/A");
    row("Latin-1 text", "System Information\n\tProduct Name: Caf\xe9\n\n",
        QString::fromUtf8("Café"), "N/A", "N/A");
    row("empty", QByteArray(), "N/A", "N/A", "N/A");
    row("garbage", "\x01\x02:::\n\n\xff\xfe:\nVendor\n:x\n", "N/A", "N/A", "N/A");
}

void TestHardware::parseDmiDecodeOutput()
{
    QFETCH(QByteArray, output);
    QFETCH(QStringList, expected);
    QString product = "N/A";
    QString serial = "N/A";
    QString bios = "N/A";
    ZuBase::parseDmiDecodeOutput(output, product, serial, bios);
    QCOMPARE(QStringList({product, serial, bios}), expected);
}

void TestHardware::hardwareTypeFromTool_data()
{
    QTest::addColumn<QStringList>("tools"); // tool name, then the file it prints
    QTest::addColumn<QStringList>("expected");

    const QStringList real{"P4M900T-M2", "00000000",
                           "American Megatrends Inc., 080014, 12/17/2007"};
    QTest::newRow("dmidecode") << QStringList{"dmidecode", kSample} << real;
    QTest::newRow("dmidecode.exe first")
        << QStringList{"dmidecode.exe", kSample, "dmidecode", "/dev/null"} << real;
    QTest::newRow("tool that does not end") << QStringList{"dmidecode", "hang:" + kSample} << real;
    QTest::newRow("no tool") << QStringList() << QStringList{"N/A", "N/A", "N/A"};
    QTest::newRow("tool prints binary garbage")
        << QStringList{"dmidecode", "/bin/sh"} << QStringList{"N/A", "N/A", "N/A"};
}

void TestHardware::hardwareTypeFromTool()
{
    QFETCH(QStringList, tools);
    QFETCH(QStringList, expected);

    // An installation folder with blanks in its path, as under "Program Files".
    QTemporaryDir root;
    const QString appDir = root.filePath("Tessel App/bin dir");
    QVERIFY(QDir().mkpath(appDir));
    QVERIFY(QFile::copy(TestSupport::helper("zubase_hwprobe"), appDir + "/probe"));
    QFile(appDir + "/probe").setPermissions(QFile::ReadOwner | QFile::ExeOwner);
    for (int i = 0; i + 1 < tools.size(); i += 2)
        writeTool(appDir + '/' + tools.at(i), tools.at(i + 1));

    QProcess probe;
    probe.start(appDir + "/probe", QStringList());
    QVERIFY(probe.waitForFinished(30000));
    QCOMPARE(probe.exitCode(), 0);
    const QStringList lines =
        QString::fromLocal8Bit(probe.readAllStandardOutput()).split('\n', Qt::SkipEmptyParts);
    QCOMPARE(lines, expected);
}

void TestHardware::diskSpaceArithmetic_data()
{
    QTest::addColumn<quint64>("freeBytes");
    QTest::addColumn<quint64>("totalBytes");
    QTest::addColumn<uint>("freeMB");
    QTest::addColumn<double>("usedPercent");
    const quint64 GiB = quint64(1) << 30;
    QTest::newRow("empty volume") << quint64(0) << quint64(0) << 0u << 0.0;
    QTest::newRow("1.5 GiB free of 3") << 3 * GiB / 2 << 3 * GiB << 1536u << 50.0;
    QTest::newRow("rounded down") << (quint64(1) << 20) - 1 << GiB << 0u << 99.90234;
    QTest::newRow("one byte, in use") << quint64(0) << quint64(1) << 0u << 50.0;
    QTest::newRow("8 TiB free") << 8192 * GiB << 8192 * GiB << 8388608u << 0.0;
}

void TestHardware::diskSpaceArithmetic()
{
    QFETCH(quint64, freeBytes);
    QFETCH(quint64, totalBytes);
    QFETCH(uint, freeMB);
    QFETCH(double, usedPercent);
    unsigned int outFreeMB = 1;
    float outUsedPercent = -1;
    ZuBase::diskSpaceFromBytes(freeBytes, totalBytes, outFreeMB, outUsedPercent);
    QCOMPARE(outFreeMB, freeMB);
    QVERIFY2(qAbs(outUsedPercent - usedPercent) < 0.001,
             qPrintable(QString::number(outUsedPercent)));
}

void TestHardware::diskFreeSpaceOfRealPath()
{
    QTemporaryDir dir;
    struct statvfs info;
    QCOMPARE(::statvfs(QFile::encodeName(dir.path()).constData(), &info), 0);
    const double unit = info.f_frsize;
    const double expectedFreeMB = info.f_bavail * unit / (1 << 20);
    const double expectedUsed =
        (info.f_blocks * unit - info.f_bavail * unit) * 100.0 / (info.f_blocks * unit + 1);

    RkLogCapture capture;
    unsigned int freeMB = 0;
    float usedPercent = 0;
    QVERIFY_OK(ZuBase::getDiskFreeSpaceMB(dir.path(), freeMB, usedPercent));
    QCOMPARE(logLines(capture, "Tz"), QStringList());
    // Other programs write to the same disk meanwhile; allow them some room.
    QVERIFY2(qAbs(freeMB - expectedFreeMB) < 256, qPrintable(QString::number(freeMB)));
    QVERIFY2(qAbs(usedPercent - expectedUsed) < 1.0, qPrintable(QString::number(usedPercent)));
    QVERIFY(usedPercent >= 0 && usedPercent <= 100);
}

void TestHardware::diskFreeSpaceOfMissingPath()
{
    RkLogCapture capture;
    unsigned int freeMB = 77;
    float usedPercent = 77;
    const RkResult res = ZuBase::getDiskFreeSpaceMB("/no/such/path", freeMB, usedPercent);
    QVERIFY(res.isBad());
    QCOMPARE(freeMB, 0u);
    QCOMPARE(usedPercent, 0.0f);
    QCOMPARE(logLines(capture, nullptr, RkLogError),
             QStringList({"src/core/zubase/Hardware:ZuBase::getDiskFreeSpaceMB: "
                          "::GetDiskFreeSpaceEx() [/no/such/path]  cond[ret]",
                          "last error 2: No such file or directory"}));
    QVERIFY(ZuBase::getDiskFreeSpaceMB(QString(), freeMB, usedPercent).isBad());
}

QTEST_GUILESS_MAIN(TestHardware)
#include "tst_hardware.moc"
