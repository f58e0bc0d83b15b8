// Machine information: the DMI tool's output and its start, and disk space of real paths.
#include "TestSupport.h"
#include "zubase/Hardware.h"
#include "zubase/system/Hardware_p.h"

#include <sys/statvfs.h>

using TestSupport::logLines;

namespace {

// A stand-in DMI tool: prints a file for exactly "-q", something else otherwise; one that
// hangs prints the file and does not end.
void writeTool(const QString& inPath, const QString& inOutputFile, bool inHang = false)
{
    QFile tool(inPath);
    QVERIFY(tool.open(QIODevice::WriteOnly));
    tool.write("#!/bin/sh\n[ \"$*\" = \"-q\" ] && cat '" + inOutputFile.toLocal8Bit() +
               "' || echo 'BIOS Information\nVendor: wrong arguments'\n" +
               (inHang ? "exec sleep 60\n" : ""));
    QVERIFY(tool.setPermissions(tool.permissions() | QFile::ExeOwner));
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
    void diskSpace();
};

void TestHardware::parseDmiDecodeOutput_data()
{
    QTest::addColumn<QByteArray>("output");
    QTest::addColumn<QStringList>("expected"); // product, serial number, BIOS

    const QByteArray bios = "BIOS Information\n\tVendor: ACME\n\tVersion: 1.2\n"
                            "\tRelease Date: 01/02/2015\n\n";
    const QByteArray system =
        "System Information\n\tProduct Name: Box 9\n\tSerial Number: SN-1\n\n";
    const QStringList both{"Box 9", "SN-1", "ACME, 1.2, 01/02/2015"};
    QTest::newRow("other section skipped to its empty line")
        << bios + "Base Board Information\n\tProduct Name: Board\n\n" + system << both;
    QTest::newRow("windows line ends") << QByteArray(bios + system).replace("\n", "\r\n") << both;
    QTest::newRow("vendor missing") << QByteArray("BIOS Information\n\tVersion: 1.2\n\n")
                                    << QStringList{"N/A", "N/A", "N/A, 1.2"};
    QTest::newRow("Latin-1 text") << QByteArray("System Information\n\tProduct Name: Caf\xe9\n\n")
                                  << QStringList{QString::fromUtf8("Café"), "N/A", "N/A"};
}

void TestHardware::parseDmiDecodeOutput()
{
    QFETCH(QByteArray, output);
    QFETCH(QStringList, expected);
    QString product = "N/A", serial = "N/A", bios = "N/A";
    ZuBase::parseDmiDecodeOutput(output, product, serial, bios);
    QCOMPARE(QStringList({product, serial, bios}), expected);
}

void TestHardware::hardwareTypeFromTool_data()
{
    QTest::addColumn<QString>("tool"); // what the application folder holds
    QTest::addColumn<bool>("found");
    QTest::newRow("dmidecode.exe before dmidecode") << "both" << true;
    QTest::newRow("only an executable counts") << "not executable" << true;
    QTest::newRow("a tool that does not end") << "hanging" << true;
    QTest::newRow("no tool") << "none" << false;
}

void TestHardware::hardwareTypeFromTool()
{
    QFETCH(QString, tool);
    QFETCH(bool, found);
    const QString sample = TestSupport::dataPath("files/dmidecode/desktop-ami-2007.txt");
    // An installation folder with blanks in its path, as under "Program Files".
    QTemporaryDir root;
    const QString appDir = root.filePath("Tessel App/bin dir");
    QVERIFY(QDir().mkpath(appDir));
    QVERIFY(QFile::copy(TestSupport::helper("zubase_hwprobe"), appDir + "/probe"));
    if (tool == "hanging") {
        writeTool(appDir + "/dmidecode", sample, true);
    } else if (tool != "none") {
        const bool exe = tool == "both";
        writeTool(appDir + "/dmidecode.exe", exe ? sample : "/dev/null");
        writeTool(appDir + "/dmidecode", exe ? "/dev/null" : sample);
        if (!exe)
            QFile(appDir + "/dmidecode.exe").setPermissions(QFile::ReadOwner);
    }
    QProcess probe;
    probe.start(appDir + "/probe", QStringList());
    QVERIFY(probe.waitForFinished(30000));
    const QStringList expected = found ? QStringList{"P4M900T-M2", "00000000",
                                                     "American Megatrends Inc., 080014, 12/17/2007"}
                                       : QStringList{"N/A", "N/A", "N/A"};
    QCOMPARE(QString::fromLocal8Bit(probe.readAllStandardOutput()).split('\n', Qt::SkipEmptyParts),
             expected);
    QCOMPARE(probe.readAllStandardError(), QByteArray()); // not even a warning
}

void TestHardware::diskSpace()
{
    // The arithmetic: whole MiB rounded down; (total - free) * 100 / (total + 1).
    const auto space = [](quint64 inFree, quint64 inTotal) {
        unsigned int freeMB = 1;
        float used = -1;
        ZuBase::diskSpaceFromBytes(inFree, inTotal, freeMB, used);
        return QString("%1 %2").arg(freeMB).arg(double(used), 0, 'f', 3);
    };
    QCOMPARE(space((quint64(1) << 20) - 1, quint64(1) << 30), "0 99.902");
    QCOMPARE(space(0, 1), "0 50.000");
    QCOMPARE(space(quint64(1) << 43, quint64(1) << 43), "8388608 0.000");

    // A real path, against the system's own figures; other programs write to the same disk
    // meanwhile, so allow them some room.
    QTemporaryDir dir;
    struct statvfs info;
    QCOMPARE(::statvfs(QFile::encodeName(dir.path()).constData(), &info), 0);
    const double unit = info.f_frsize, total = info.f_blocks * unit, free = info.f_bavail * unit;
    RkLogCapture capture;
    unsigned int freeMB = 0;
    float usedPercent = 0;
    QVERIFY_OK(ZuBase::getDiskFreeSpaceMB(dir.path(), freeMB, usedPercent));
    QVERIFY(qAbs(freeMB - free / (1 << 20)) < 256);
    QVERIFY(qAbs(usedPercent - (total - free) * 100.0 / (total + 1)) < 1.0);

    // A path that is not there: both 0, and the failure reported.
    QVERIFY(ZuBase::getDiskFreeSpaceMB("/no/such/path", freeMB, usedPercent).isBad());
    QVERIFY(freeMB == 0 && usedPercent == 0);
    QCOMPARE(logLines(capture, nullptr, RkLogError),
             QStringList({"src/core/zubase/Hardware:ZuBase::getDiskFreeSpaceMB: "
                          "::GetDiskFreeSpaceEx() [/no/such/path]  cond[ret]",
                          "last error 2: No such file or directory"}));
}

QTEST_GUILESS_MAIN(TestHardware)
#include "tst_hardware.moc"
