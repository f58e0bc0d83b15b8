#include "TestSupport.h"
#include "zubase/ZuRemovableDeviceWatcher.h"
#include "zubase/system/ZuRemovableDeviceWatcher_p.h"

#include <QDir>
#include <QElapsedTimer>
#include <QProcess>
#include <QSocketNotifier>
#include <QTemporaryDir>

#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <thread>

namespace {

const char kSource[] = "ZuRemovableDeviceWatcher";
const char kRoot[] = "22 1 8:1 / / rw,relatime shared:1 - ext4 /dev/sda1 rw\n";
const QString kAdded("device change detected: new drive(s):");
const QString kRemoved("device change detected: removed drive(s):");

// A partition of the removable disk of the fake sysfs in tests/data/watcher.
QByteArray stick(int inId, const char* inMountPoint)
{
    return QByteArray::number(inId) + " 22 8:17 / " + inMountPoint + " rw - vfat /dev/sdb1 rw\n";
}

void writeFile(const QString& inPath, const QByteArray& inText)
{
    QDir().mkpath(QFileInfo(inPath).path());
    QFile file(inPath);
    QVERIFY(file.open(QIODevice::WriteOnly | QIODevice::Truncate));
    QCOMPARE(file.write(inText), inText.size());
}

// What the kernel's POLLPRI on the mount table brings about, for a fake table.
void announceChange(ZuRemovableDeviceWatcher* inWatcher)
{
    QEvent activation(QEvent::SockAct);
    QCoreApplication::sendEvent(inWatcher->findChild<QSocketNotifier*>(), &activation);
}

} // namespace

class tst_RemovableDeviceWatcher : public QObject
{
    Q_OBJECT

    QTemporaryDir mDir;
    QString mTable = mDir.filePath("mountinfo");
    QStringList mEvents; // "+" added, "-" removed, "=" found

    void record(ZuRemovableDeviceWatcher* inWatcher)
    {
        mEvents.clear();
        connect(inWatcher, &ZuRemovableDeviceWatcher::driveAdded,
                [this](const QString& drive) { mEvents << "+" + drive; });
        connect(inWatcher, &ZuRemovableDeviceWatcher::driveRemoved,
                [this](const QString& drive) { mEvents << "-" + drive; });
        connect(inWatcher, &ZuRemovableDeviceWatcher::driveFound,
                [this](const QString& drive) { mEvents << "=" + drive; });
    }

    void useTable(const QByteArray& inTable)
    {
        writeFile(mTable, inTable);
        ZuDriveWatch::setSources(mTable, TestSupport::dataPath("watcher/sys"));
    }

private Q_SLOTS:
    void cleanup() { ZuDriveWatch::setSources(QString(), QString()); }

    void texts()
    {
        QCOMPARE(ZuDriveWatch::lettersFromMask(0), QStringList());
        QCOMPARE(ZuDriveWatch::lettersFromMask(0xfc000000u | (1u << 5) | (1u << 3)),
                 (QStringList{"D", "F"}));
        QCOMPARE(ZuDriveWatch::lettersFromMask((1u << 25) | 1u), (QStringList{"A", "Z"}));
        QCOMPARE(ZuDriveWatch::changeLogLine(true, {"E", "F"}), kAdded + " E F");
        QCOMPARE(ZuDriveWatch::changeLogLine(false, {}), kRemoved);
    }

    // Partitions count by their disk, optical media by their type; tmpfs, network, unknown
    // devices and unreadable lines not at all. A plain thread has no event dispatcher: the
    // watcher there is deaf, but lists.
    void listing()
    {
        ZuDriveWatch::setSources(TestSupport::dataPath("watcher/mountinfo"),
                                 TestSupport::dataPath("watcher/sys"));
        RkLogCapture capture;
        std::thread([this] {
            ZuRemovableDeviceWatcher watcher;
            record(&watcher);
            watcher.findAndSignalAllRemovableDrives();
        }).join();
        QCOMPARE(mEvents, (QStringList{"=/media/USB STICK\t\\x/", "=/media/bound/", "=/media/card/",
                                       "=/media/cdrom/"}));
        QCOMPARE(TestSupport::logLines(capture, kSource),
                 QStringList{"Failed to install message filter."});
    }

    void changes_data();
    void changes();
    void deleteWhileEmitting();
    void realMount();
};

void tst_RemovableDeviceWatcher::changes_data()
{
    QTest::addColumn<QByteArray>("before");
    QTest::addColumn<QByteArray>("after");
    QTest::addColumn<QStringList>("events");
    QTest::addColumn<QStringList>("lines");
    const QByteArray root(kRoot);
    QTest::newRow("two in, sorted")
        << root << root + stick(40, "/media/b") + stick(41, "/media/a")
        << QStringList{"+/media/a/", "+/media/b/"} << QStringList{kAdded + " /media/a/ /media/b/"};
    QTest::newRow("swapped, removal first")
        << root + stick(40, "/media/a") << root + stick(41, "/media/b")
        << QStringList{"-/media/a/", "+/media/b/"}
        << QStringList{kRemoved + " /media/a/", kAdded + " /media/b/"};
    QTest::newRow("id reused elsewhere") << root + stick(40, "/media/a") << root + stick(40, "/b")
                                         << QStringList{"-/media/a/", "+/b/"}
                                         << QStringList{kRemoved + " /media/a/", kAdded + " /b/"};
    QTest::newRow("tmpfs mounted") << root << root + "30 22 0:25 / /run/x rw - tmpfs tmpfs rw\n"
                                   << QStringList() << QStringList{kAdded};
}

void tst_RemovableDeviceWatcher::changes()
{
    QFETCH(QByteArray, before);
    QFETCH(QByteArray, after);
    QFETCH(QStringList, events);
    QFETCH(QStringList, lines);
    useTable(before);
    RkLogCapture capture;
    ZuRemovableDeviceWatcher watcher;
    record(&watcher);
    writeFile(mTable, after);
    announceChange(&watcher);
    QCOMPARE(mEvents, events);
    QCOMPARE(TestSupport::logLines(capture, kSource),
             QStringList{"Installed message filter."} + lines);
    // An unreadable table is skipped, not taken for an empty one.
    QVERIFY(QFile::remove(mTable));
    announceChange(&watcher);
    writeFile(mTable, after);
    announceChange(&watcher);
    QCOMPARE(mEvents, events);
}

// A receiver that deletes the watcher ends the reporting: no signal from freed memory.
void tst_RemovableDeviceWatcher::deleteWhileEmitting()
{
    for (const char kind : {'=', '-'}) {
        useTable(kRoot + stick(40, "/media/a") + stick(41, "/media/b"));
        QPointer<ZuRemovableDeviceWatcher> watcher(new ZuRemovableDeviceWatcher);
        record(watcher);
        connect(watcher, &ZuRemovableDeviceWatcher::driveFound, [&watcher] { delete watcher; });
        connect(watcher, &ZuRemovableDeviceWatcher::driveRemoved, [&watcher] { delete watcher; });
        if (kind == '=') {
            watcher->findAndSignalAllRemovableDrives();
        } else { // with an arrival behind the removals
            writeFile(mTable, kRoot + stick(42, "/media/c"));
            announceChange(watcher);
        }
        QCOMPARE(mEvents, QStringList{kind + QString("/media/a/")});
        QVERIFY(watcher.isNull());
    }
}

void tst_RemovableDeviceWatcher::realMount()
{
    const QString image = mDir.filePath("stick.img");
    QProcess setup;
    setup.start("sh", {"-c",
                       "truncate -s 4M \"$0\" && mkfs.ext2 -q -F \"$0\" && "
                       "losetup --find --show \"$0\"",
                       image});
    if (!setup.waitForFinished(60000) || setup.exitCode() != 0)
        QSKIP(qPrintable("no loop device with a file system here (root, e2fsprogs and mount "
                         "are needed): " +
                         setup.readAllStandardError()));
    const QByteArray device = setup.readAllStandardOutput().trimmed();
    const QByteArray mountPoint = QFile::encodeName(mDir.filePath("my stick"));
    struct Cleanup
    {
        QByteArray device, mountPoint;
        ~Cleanup()
        {
            ::umount2(mountPoint, MNT_DETACH);
            QProcess::execute("losetup", {"-d", device});
        }
    } cleanup{device, mountPoint};

    // The loop device passes for a stick through a sysfs of the test's own.
    struct stat info;
    QCOMPARE(::stat(device, &info), 0);
    const QString sys = mDir.filePath("loopsys");
    writeFile(
        sys +
            QString("/dev/block/%1:%2/removable").arg(major(info.st_rdev)).arg(minor(info.st_rdev)),
        "1\n");
    ZuDriveWatch::setSources(QString(), sys);
    ZuRemovableDeviceWatcher watcher;
    record(&watcher);
    RkLogCapture capture;
    QVERIFY(QDir().mkpath(mountPoint));
    QElapsedTimer clock;
    clock.start();
    if (::mount(device, mountPoint, "ext2", 0, nullptr) != 0)
        QSKIP(qPrintable(QString("mounting is not allowed here: ") + strerror(errno)));
    // Others may mount meanwhile; only this drive is removable here.
    const QString drive = QFile::decodeName(mountPoint) + "/";
    QTRY_COMPARE_WITH_TIMEOUT(mEvents, QStringList{"+" + drive}, 10000);
    qInfo("mount seen after %lld ms", static_cast<long long>(clock.elapsed()));
    watcher.findAndSignalAllRemovableDrives();
    QCOMPARE(::umount2(mountPoint, 0), 0);
    QTRY_COMPARE_WITH_TIMEOUT(mEvents, (QStringList{"+" + drive, "=" + drive, "-" + drive}), 10000);
    const QStringList lines = TestSupport::logLines(capture, kSource);
    QVERIFY(lines.contains(kAdded + " " + drive) && lines.contains(kRemoved + " " + drive));
}

QTEST_GUILESS_MAIN(tst_RemovableDeviceWatcher)
#include "tst_removabledevicewatcher.moc"
