#include "zubase/ZuRemovableDeviceWatcher.h"

#include "rklib/RkLogFile.h"
#include "zubase/platform/SysDrives.h"
#include "zubase/system/ZuRemovableDeviceWatcher_p.h"

#include <QAbstractEventDispatcher>
#include <QFile>
#include <QPointer>
#include <QSocketNotifier>

#include <map>
#include <tuple>

namespace {

const char kLogSource[] = "ZuRemovableDeviceWatcher";

ZuPlatform::DriveSources& sSources()
{
    static ZuPlatform::DriveSources sources;
    return sources;
}

void logLine(const QString& inText)
{
    getTheLogInstance().print(kLogSource, inText.toLocal8Bit().constData());
}

// A mount is the same one only while its id, device and place stay: ids are reused at once.
using MountKey = std::tuple<int, unsigned long, unsigned long, std::string>;

// The mounts of one reading of the table, each with its drive text when it is a removable or
// optical drive (empty otherwise).
using MountView = std::map<MountKey, QString>;

bool readMounts(const ZuPlatform::DriveSources& inSources, MountView& outView)
{
    std::vector<ZuPlatform::DriveMount> mounts;
    if (ZuPlatform::drivesListMounts(inSources, mounts) != 0)
        return false;
    outView.clear();
    for (const ZuPlatform::DriveMount& mount : mounts) {
        QString drive;
        if (mount.type == ZuPlatform::kDriveRemovable || mount.type == ZuPlatform::kDriveCdrom) {
            drive = QFile::decodeName(QByteArray::fromStdString(mount.mountPoint));
            if (!drive.endsWith(QLatin1Char('/')))
                drive += QLatin1Char('/');
        }
        outView[MountKey(mount.mountId, mount.deviceMajor, mount.deviceMinor, mount.mountPoint)] =
            drive;
    }
    return true;
}

// The drives of inView whose mounts are not in inOther, sorted, each once. Whether any mount
// at all is missing from inOther goes to outAnyMount.
QStringList drivesMissingFrom(const MountView& inView, const MountView& inOther, bool& outAnyMount)
{
    QStringList drives;
    outAnyMount = false;
    for (const auto& entry : inView) {
        if (inOther.count(entry.first))
            continue;
        outAnyMount = true;
        if (!entry.second.isEmpty())
            drives << entry.second;
    }
    drives.sort();
    drives.removeDuplicates();
    return drives;
}

using DriveSignal = void (ZuRemovableDeviceWatcher::*)(const QString&);

// A receiver may delete the watcher: stop there. False when it is gone.
bool emitEach(ZuRemovableDeviceWatcher* inWatcher, DriveSignal inSignal,
              const QStringList& inDrives)
{
    const QPointer<ZuRemovableDeviceWatcher> alive(inWatcher);
    for (const QString& drive : inDrives) {
        if (!alive)
            return false;
        Q_EMIT(inWatcher->*inSignal)(drive);
    }
    return !alive.isNull();
}

} // namespace

QStringList ZuDriveWatch::lettersFromMask(quint32 inMask)
{
    QStringList letters;
    for (int bit = 0; bit < 26; ++bit) {
        if (inMask & (quint32(1) << bit))
            letters << QString(QLatin1Char(char('A' + bit)));
    }
    return letters;
}

QString ZuDriveWatch::changeLogLine(bool inArrival, const QStringList& inNames)
{
    QString line = inArrival ? QStringLiteral("device change detected: new drive(s):")
                             : QStringLiteral("device change detected: removed drive(s):");
    for (const QString& name : inNames)
        line += QLatin1Char(' ') + name;
    return line;
}

void ZuDriveWatch::setSources(const QString& inMountTable, const QString& inSysfsRoot)
{
    const ZuPlatform::DriveSources system;
    sSources().mountTable =
        inMountTable.isEmpty() ? system.mountTable : QFile::encodeName(inMountTable).toStdString();
    sSources().sysfsRoot =
        inSysfsRoot.isEmpty() ? system.sysfsRoot : QFile::encodeName(inSysfsRoot).toStdString();
}

class ZuRemovableDeviceWatcher::Private
{
public:
    ~Private() { ZuPlatform::drivesCloseMountWatch(watchFd); }

    // Reports what changed since the last reading of the mount table.
    static void mountTableChanged(ZuRemovableDeviceWatcher* inWatcher);

    const ZuPlatform::DriveSources sources = sSources();
    int watchFd = -1;
    QSocketNotifier* notifier = nullptr; // child of the watcher, gone before watchFd closes
    MountView view;
    bool viewRead = false;
};

void ZuRemovableDeviceWatcher::Private::mountTableChanged(ZuRemovableDeviceWatcher* inWatcher)
{
    MountView now;
    // Unreadable for once: keep the last view, the next change compares against it.
    if (!readMounts(inWatcher->d->sources, now))
        return;
    // Without a first view every drive present would pass for new.
    if (!inWatcher->d->viewRead) {
        inWatcher->d->view = std::move(now);
        inWatcher->d->viewRead = true;
        return;
    }
    bool mountsGone = false;
    bool mountsCame = false;
    const QStringList removed = drivesMissingFrom(inWatcher->d->view, now, mountsGone);
    const QStringList added = drivesMissingFrom(now, inWatcher->d->view, mountsCame);
    inWatcher->d->view = std::move(now);

    // Nothing of the watcher is touched below but through emitEach, which notices its end.
    if (mountsGone) {
        logLine(ZuDriveWatch::changeLogLine(false, removed));
        if (!emitEach(inWatcher, &ZuRemovableDeviceWatcher::driveRemoved, removed))
            return;
    }
    if (mountsCame) {
        logLine(ZuDriveWatch::changeLogLine(true, added));
        emitEach(inWatcher, &ZuRemovableDeviceWatcher::driveAdded, added);
    }
}

ZuRemovableDeviceWatcher::ZuRemovableDeviceWatcher(QObject* parent)
    : QObject(parent), d(new Private)
{
    // Opened before the first reading, so that no change between the two goes unnoticed.
    const bool listening = QAbstractEventDispatcher::instance() &&
                           ZuPlatform::drivesOpenMountWatch(d->sources, d->watchFd) == 0;
    d->viewRead = readMounts(d->sources, d->view);
    if (!listening) {
        logLine(QStringLiteral("Failed to install message filter."));
        return;
    }
    // The kernel marks a changed mount table as an exception condition (POLLPRI).
    d->notifier = new QSocketNotifier(d->watchFd, QSocketNotifier::Exception, this);
    connect(d->notifier, &QSocketNotifier::activated, this,
            [this] { Private::mountTableChanged(this); });
    logLine(QStringLiteral("Installed message filter."));
}

ZuRemovableDeviceWatcher::~ZuRemovableDeviceWatcher()
{
    delete d->notifier;
}

void ZuRemovableDeviceWatcher::findAndSignalAllRemovableDrives()
{
    MountView now;
    if (!readMounts(d->sources, now))
        return;
    bool anyMount = false;
    emitEach(this, &ZuRemovableDeviceWatcher::driveFound,
             drivesMissingFrom(now, MountView(), anyMount));
}
