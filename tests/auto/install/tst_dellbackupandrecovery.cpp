// Detection of the Dell Backup and Recovery shell extensions: the version rule, the folder
// rule on real files, and what a machine without the product's folders reports.
#include "zubase/DellBackupAndRecoveryHelper.h"
#include "zubase/install/DellBackupAndRecoveryHelper_p.h"

#include <QFile>
#include <QTemporaryDir>
#include <QtTest>

class TestDellBackupAndRecovery : public QObject
{
    Q_OBJECT

private slots:
    void version_data();
    void version();
    void shellExtensions();
};

void TestDellBackupAndRecovery::version_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("malicious");
    for (const char* text : {"1.8", "1.8.0.12", "1.8.3"})
        QTest::newRow(text) << text << true;
    for (const char* text : {"", "1.7.9", "1.9", "2.8", "18", "0.8"})
        QTest::newRow(text) << text << false;
}

void TestDellBackupAndRecovery::version()
{
    QFETCH(QString, text);
    QFETCH(bool, malicious);
    QCOMPARE(DellBackupAndRecoveryHelper::isMaliciousVersionText(text), malicious);
}

void TestDellBackupAndRecovery::shellExtensions()
{
    QTemporaryDir dir;
    const QString programFiles = dir.path() + "/pf";
    const QString x86 = dir.path() + "/pf86";
    const QString shell = "\\Dell Backup and Recovery\\Components\\Shell\\";
    // The paths are built with backslashes; here they are plain file names in the test folder.
    const QStringList present{programFiles + shell + "DBRShellExtension.dll",
                              x86 + shell + "DBROverlayIconBackuped.dll",
                              x86 + shell + "DBRShellExtension.dll"};
    for (const QString& path : present)
        QVERIFY(QFile(path).open(QIODevice::WriteOnly));

    using DellBackupAndRecoveryHelper::shellExtensionDllList;
    QCOMPARE(shellExtensionDllList(programFiles, x86), present);
    QCOMPARE(shellExtensionDllList(x86, x86), present.mid(1));
    QCOMPARE(shellExtensionDllList(QString(), programFiles), present.mid(0, 1));
    QCOMPARE(shellExtensionDllList(x86, QString()), present.mid(1));

    // No program-files folders and no registry here.
    QCOMPARE(DellBackupAndRecoveryHelper::getShellExtensionDllList(), QStringList());
    QVERIFY(!DellBackupAndRecoveryHelper::isMaliciousVersion());
}

QTEST_GUILESS_MAIN(TestDellBackupAndRecovery)
#include "tst_dellbackupandrecovery.moc"
