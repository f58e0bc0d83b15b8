#include "TestSupport.h"
#include "zubase/ZuRemovableDeviceWatcher.h"
#include "zubase/system/ZuRemovableDeviceWatcher_p.h"

#include <QDir>
#include <QElapsedTimer>
#include <QProcess>
#include <QSignalSpy>
#include <QSocketNotifier>
#include <QTemporaryDir>

#include <cstring>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <thread>
#include <unistd.h>

namespace {

const char kSource[] = "ZuRemovableDeviceWatcher";

void writeFile(const QString& inPath, const QByteArray& inText)
{
    QDir().mkpath(QFileInfo(inPath).path());
    QFile file(inPath);
    QVERIFY(file.open(QIODevice::WriteOnly | QIODevice::Truncate));
    QCOMPARE(file.write(inText), inText.size());
}

// Every drive signal of a watcher in order: "+" added, "-" removed, "=" found.
QStringList* recordDrives(ZuRemovableDeviceWatcher* inWatcher)
{
    auto* events = new QStringList;
    QObject::connect(inWatcher, &QObject::destroyed, [events] { delete events; });
    QObject::connect(inWatcher, &ZuRemovableDeviceWatcher::driveAdded,
                     [events](const QString& drive) { *events << "+" + drive; });
    QObject::connect(inWatcher, &ZuRemovableDeviceWatcher::driveRemoved,
                     [events](const QString& drive) { *events << "-" + drive; });
    QObject::connect(inWatcher, &ZuRemovableDeviceWatcher::driveFound,
                     [events](const QString& drive) { *events << "=" + drive; });
    return events;
}

// What the kernel's POLLPRI on the mount table brings about, for a fake table.
void announceChange(ZuRemovableDeviceWatcher* inWatcher)
{
    auto* notifier = inWatcher->findChild<QSocketNotifier*>();
    QVERIFY(notifier);
    QEvent activation(QEvent::SockAct);
    QCoreApplication::sendEvent(notifier, &activation);
}

const char kRootLine[] = "22 1 8:1 / / rw,relatime shared:1 - ext4 /dev/sda1 rw\n";

QByteArray stick(int inId, const char* inMountPoint)
{
    return QByteArray::number(inId) + " 22 8:17 / " + inMountPoint +
           " rw,nosuid shared:7 - vfat /dev/sdb1 rw\n";
}

} // namespace

class tst_RemovableDeviceWatcher : public QObject
{
    Q_OBJECT

    QTemporaryDir mDir;
    QString mTable;

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void lettersFromMask_data();
    void lettersFromMask();
    void changeLogLine_data();
    void changeLogLine();
    void listing_data();
    void listing();
    void changes_data();
    void changes();
    void deleteWhileEmitting_data();
    void deleteWhileEmitting();
    void dispatcher();
    void realMount();
};

void tst_RemovableDeviceWatcher::initTestCase()
{
    QVERIFY(mDir.isValid());
    mTable = mDir.filePath("mountinfo");
    // Laid out as the kernel does: /sys/dev/block/M:m links into the device tree, where a
    // partition sits inside its disk's folder.
    const QString sys = mDir.filePath("sys");
    struct Device
    {
        const char* number;
        const char* path;
        const char* removable;
        const char* scsiType;
    } devices[] = {
        {"8:0", "sda", "0", "0"},      {"8:1", "sda/sda1", nullptr, nullptr},
        {"8:16", "sdb", "1", "0"},     {"8:17", "sdb/sdb1", nullptr, nullptr},
        {"8:48", "sdd", "1", nullptr}, {"11:0", "sr0", "0", "5"}, // optical by its type alone
    };
    for (const Device& device : devices) {
        const QString folder = sys + "/devices/" + device.path;
        QVERIFY(QDir().mkpath(folder));
        if (device.removable)
            writeFile(folder + "/removable", QByteArray(device.removable) + "\n");
        else
            writeFile(folder + "/partition", "1\n");
        if (device.scsiType)
            writeFile(folder + "/device/type", QByteArray(device.scsiType) + "\n");
        QVERIFY(QDir().mkpath(sys + "/dev/block"));
        QVERIFY(QFile::link(QString("../../devices/") + device.path,
                            sys + "/dev/block/" + device.number));
    }
}

void tst_RemovableDeviceWatcher::cleanup()
{
    ZuDriveWatch::setSources(QString(), QString());
}

void tst_RemovableDeviceWatcher::lettersFromMask_data()
{
    QTest::addColumn<quint32>("mask");
    QTest::addColumn<QStringList>("letters");
    QTest::newRow("none") << 0u << QStringList();
    QTest::newRow("D and F, D first") << ((1u << 3) | (1u << 5)) << QStringList{"D", "F"};
    QTest::newRow("A and Z") << ((1u << 25) | 1u) << QStringList{"A", "Z"};
    QTest::newRow("bits 26 to 31 ignored") << (0xfc000000u | (1u << 4)) << QStringList{"E"};
}

void tst_RemovableDeviceWatcher::lettersFromMask()
{
    QFETCH(quint32, mask);
    QFETCH(QStringList, letters);
    QCOMPARE(ZuDriveWatch::lettersFromMask(mask), letters);
}

void tst_RemovableDeviceWatcher::changeLogLine_data()
{
    QTest::addColumn<bool>("arrival");
    QTest::addColumn<QStringList>("names");
    QTest::addColumn<QString>("line");
    QTest::newRow("two new") << true << QStringList{"E", "F"}
                             << "device change detected: new drive(s): E F";
    QTest::newRow("one removed") << false << QStringList{"/media/a b/"}
                                 << "device change detected: removed drive(s): /media/a b/";
    QTest::newRow("none new") << true << QStringList() << "device change detected: new drive(s):";
    QTest::newRow("none removed") << false << QStringList()
                                  << "device change detected: removed drive(s):";
}

void tst_RemovableDeviceWatcher::changeLogLine()
{
    QFETCH(bool, arrival);
    QFETCH(QStringList, names);
    QFETCH(QString, line);
    QCOMPARE(ZuDriveWatch::changeLogLine(arrival, names), line);
}

void tst_RemovableDeviceWatcher::listing_data()
{
    QTest::addColumn<QByteArray>("table");
    QTest::addColumn<QStringList>("found");
    QTest::newRow("partition of a removable disk")
        << stick(40, "/media/stick") << QStringList{"/media/stick/"};
    QTest::newRow("fixed disk") << QByteArray(kRootLine) << QStringList();
    QTest::newRow("optical") << QByteArray("41 22 11:0 / /media/cdrom ro - iso9660 /dev/sr0 ro\n")
                             << QStringList{"/media/cdrom/"};
    QTest::newRow("removable disk without partitions")
        << QByteArray("42 22 8:48 / /media/card rw - vfat /dev/sdd rw\n")
        << QStringList{"/media/card/"};
    QTest::newRow("no block device")
        << QByteArray("30 22 0:25 / /media/ram rw shared:5 - tmpfs tmpfs rw\n") << QStringList();
    QTest::newRow("device unknown to sysfs")
        << QByteArray("43 22 8:33 / /media/x rw - ext4 /dev/sdc1 rw\n") << QStringList();
    QTest::newRow("escapes decoded") << stick(40, "/media/USB\\040STICK\\011\\134x\\012")
                                     << QStringList{"/media/USB STICK\t\\x\n/"};
    QTest::newRow("several optional fields")
        << QByteArray("40 22 8:17 / /media/s rw shared:7 master:2 unbindable - vfat /dev/sdb1 rw")
        << QStringList{"/media/s/"};
    QTest::newRow("broken lines left out")
        << QByteArray("garbage\n40 22 8:17 / /media/s rw,nosuid vfat /dev/sdb1 rw\n\n"
                      "x 22 8:17 / /media/u rw - vfat /dev/sdb1 rw\n"
                      "41 22 8-17 / /media/v rw - vfat /dev/sdb1 rw\n") +
               stick(44, "/media/t")
        << QStringList{"/media/t/"};
    QTest::newRow("sorted, each once")
        << kRootLine + stick(40, "/media/b") + stick(41, "/media/a") + stick(42, "/media/b")
        << QStringList{"/media/a/", "/media/b/"};
    QTest::newRow("root of a removable disk") << stick(40, "/") << QStringList{"/"};
}

void tst_RemovableDeviceWatcher::listing()
{
    QFETCH(QByteArray, table);
    QFETCH(QStringList, found);
    writeFile(mTable, table);
    ZuDriveWatch::setSources(mTable, mDir.filePath("sys"));
    ZuRemovableDeviceWatcher watcher;
    QStringList* events = recordDrives(&watcher);
    watcher.findAndSignalAllRemovableDrives();
    QStringList expected;
    for (const QString& drive : found)
        expected << "=" + drive;
    QCOMPARE(*events, expected);
}

void tst_RemovableDeviceWatcher::changes_data()
{
    QTest::addColumn<QByteArray>("before");
    QTest::addColumn<QByteArray>("after");
    QTest::addColumn<QStringList>("events");
    QTest::addColumn<QStringList>("lines");
    const QByteArray root(kRootLine);
    const QString added("device change detected: new drive(s):");
    const QString removed("device change detected: removed drive(s):");
    QTest::newRow("stick in") << root << root + stick(40, "/media/s") << QStringList{"+/media/s/"}
                              << QStringList{added + " /media/s/"};
    QTest::newRow("stick out") << root + stick(40, "/media/s") << root << QStringList{"-/media/s/"}
                               << QStringList{removed + " /media/s/"};
    QTest::newRow("two in, sorted")
        << root << root + stick(40, "/media/b") + stick(41, "/media/a")
        << QStringList{"+/media/a/", "+/media/b/"} << QStringList{added + " /media/a/ /media/b/"};
    QTest::newRow("swapped, removal first")
        << root + stick(40, "/media/a") << root + stick(41, "/media/b")
        << QStringList{"-/media/a/", "+/media/b/"}
        << QStringList{removed + " /media/a/", added + " /media/b/"};
    QTest::newRow("id reused elsewhere")
        << root + stick(40, "/media/a") << root + stick(40, "/media/b")
        << QStringList{"-/media/a/", "+/media/b/"}
        << QStringList{removed + " /media/a/", added + " /media/b/"};
    QTest::newRow("tmpfs mounted") << root << root + "30 22 0:25 / /run/x rw - tmpfs tmpfs rw\n"
                                   << QStringList() << QStringList{added};
    QTest::newRow("fixed disk unmounted") << root + "23 22 8:1 / /data rw - ext4 /dev/sda1 rw\n"
                                          << root << QStringList() << QStringList{removed};
    QTest::newRow("options changed")
        << root + stick(40, "/media/s") << root + "40 22 8:17 / /media/s ro - vfat /dev/sdb1 ro\n"
        << QStringList() << QStringList();
}

void tst_RemovableDeviceWatcher::changes()
{
    QFETCH(QByteArray, before);
    QFETCH(QByteArray, after);
    QFETCH(QStringList, events);
    QFETCH(QStringList, lines);
    writeFile(mTable, before);
    ZuDriveWatch::setSources(mTable, mDir.filePath("sys"));
    ZuRemovableDeviceWatcher watcher;
    QStringList* seen = recordDrives(&watcher);
    RkLogCapture capture;
    writeFile(mTable, after);
    announceChange(&watcher);
    QCOMPARE(*seen, events);
    QCOMPARE(TestSupport::logLines(capture, kSource), lines);
    // A table that could not be read leaves the last view: nothing is reported for it, and
    // the next reading compares against the one before.
    QVERIFY(QFile::remove(mTable));
    announceChange(&watcher);
    writeFile(mTable, after);
    announceChange(&watcher);
    QCOMPARE(*seen, events);
}

void tst_RemovableDeviceWatcher::deleteWhileEmitting_data()
{
    QTest::addColumn<char>("kind");
    QTest::newRow("found") << '=';
    QTest::newRow("added") << '+';
    QTest::newRow("removed") << '-';
}

void tst_RemovableDeviceWatcher::deleteWhileEmitting()
{
    QFETCH(char, kind);
    const QByteArray two = stick(40, "/media/a") + stick(41, "/media/b");
    writeFile(mTable, kind == '+' ? QByteArray(kRootLine) : kRootLine + two);
    ZuDriveWatch::setSources(mTable, mDir.filePath("sys"));
    QPointer<ZuRemovableDeviceWatcher> watcher(new ZuRemovableDeviceWatcher);
    int emitted = 0;
    auto receiver = [&emitted, &watcher] {
        ++emitted;
        delete watcher.data();
    };
    connect(watcher, &ZuRemovableDeviceWatcher::driveAdded, receiver);
    connect(watcher, &ZuRemovableDeviceWatcher::driveRemoved, receiver);
    connect(watcher, &ZuRemovableDeviceWatcher::driveFound, receiver);
    if (kind == '=') {
        watcher->findAndSignalAllRemovableDrives();
    } else {
        // A removal with an arrival behind it: neither goes on once the watcher is gone.
        writeFile(mTable, kind == '+' ? kRootLine + two : kRootLine + stick(42, "/media/c"));
        announceChange(watcher);
    }
    QCOMPARE(emitted, 1);
    QVERIFY(watcher.isNull());
}

void tst_RemovableDeviceWatcher::dispatcher()
{
    writeFile(mTable, kRootLine + stick(40, "/media/s"));
    ZuDriveWatch::setSources(mTable, mDir.filePath("sys"));
    RkLogCapture capture;
    {
        ZuRemovableDeviceWatcher listening;
    }
    // A thread of its own without an event loop has no dispatcher: deaf, but it can list.
    QStringList found;
    bool deaf = false;
    std::thread([&found, &deaf] {
        ZuRemovableDeviceWatcher watcher;
        QObject::connect(&watcher, &ZuRemovableDeviceWatcher::driveFound,
                         [&found](const QString& drive) { found << drive; });
        watcher.findAndSignalAllRemovableDrives();
        deaf = !watcher.findChild<QSocketNotifier*>();
    }).join();
    QVERIFY(deaf);
    QCOMPARE(TestSupport::logLines(capture, kSource),
             (QStringList{"Installed message filter.", "Failed to install message filter."}));
    QCOMPARE(found, QStringList{"/media/s/"});
}

void tst_RemovableDeviceWatcher::realMount()
{
    if (::geteuid() != 0)
        QSKIP("mounting a loop device needs root");
    const QString image = mDir.filePath("stick.img");
    {
        QFile file(image);
        QVERIFY(file.open(QIODevice::WriteOnly) && file.resize(4 << 20));
    }
    if (QProcess::execute("mkfs.ext2", {"-q", "-F", image}) != 0)
        QSKIP("mkfs.ext2 (e2fsprogs) is missing or failed");
    QProcess losetup;
    losetup.start("losetup", {"--find", "--show", image});
    if (!losetup.waitForFinished(30000) || losetup.exitCode() != 0)
        QSKIP(qPrintable("no loop device can be set up here: " + losetup.readAllStandardError()));
    const QString device = QString::fromLocal8Bit(losetup.readAllStandardOutput()).trimmed();
    const QString mountPoint = mDir.filePath("my stick");
    struct Cleanup
    {
        QString device, mountPoint;
        ~Cleanup()
        {
            ::umount2(QFile::encodeName(mountPoint), MNT_DETACH);
            QProcess::execute("losetup", {"-d", device});
        }
    } cleanup{device, mountPoint};

    // The loop device passes for a stick through a sysfs of the test's own.
    struct stat info;
    QCOMPARE(::stat(QFile::encodeName(device), &info), 0);
    const QString sys = mDir.filePath("loopsys");
    writeFile(
        sys +
            QString("/dev/block/%1:%2/removable").arg(major(info.st_rdev)).arg(minor(info.st_rdev)),
        "1\n");
    ZuDriveWatch::setSources(QString(), sys);

    ZuRemovableDeviceWatcher watcher;
    QStringList* events = recordDrives(&watcher);
    RkLogCapture capture;
    QVERIFY(QDir().mkpath(mountPoint));
    QElapsedTimer clock;
    clock.start();
    if (::mount(QFile::encodeName(device), QFile::encodeName(mountPoint), "ext2", 0, nullptr) != 0)
        QSKIP(qPrintable(QString("mounting is not allowed here: ") + std::strerror(errno)));
    const QString drive = mountPoint + "/";
    // Other programs may mount and unmount meanwhile; only this drive is removable here.
    QTRY_COMPARE_WITH_TIMEOUT(*events, QStringList{"+" + drive}, 10000);
    qInfo("mount seen after %lld ms", static_cast<long long>(clock.elapsed()));
    QVERIFY(TestSupport::logLines(capture, kSource)
                .contains("device change detected: new drive(s): " + drive));
    watcher.findAndSignalAllRemovableDrives();
    QCOMPARE(events->last(), "=" + drive);

    clock.restart();
    QCOMPARE(::umount2(QFile::encodeName(mountPoint), 0), 0);
    QTRY_COMPARE_WITH_TIMEOUT(*events, (QStringList{"+" + drive, "=" + drive, "-" + drive}), 10000);
    qInfo("unmount seen after %lld ms", static_cast<long long>(clock.elapsed()));
    QVERIFY(TestSupport::logLines(capture, kSource)
                .contains("device change detected: removed drive(s): " + drive));
}

QTEST_GUILESS_MAIN(tst_RemovableDeviceWatcher)
#include "tst_removabledevicewatcher.moc"
