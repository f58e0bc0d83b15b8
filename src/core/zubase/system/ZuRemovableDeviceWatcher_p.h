#pragma once

// Internal: the drive watcher's texts, apart from the system, and where it reads the system.
#include <QString>
#include <QStringList>

namespace ZuDriveWatch {

// The letters of a drive or volume unit mask: bit i (0 to 25) stands for 'A' + i; ascending,
// bits 26 to 31 ignored.
QStringList lettersFromMask(quint32 inMask);

// "device change detected: new drive(s):" (arrival) or "device change detected: removed
// drive(s):", then a blank and each name; written even when there is none.
QString changeLogLine(bool inArrival, const QStringList& inNames);

// Where watchers made from now on read the mount table and the block devices' attributes;
// empty texts mean the system's own ("/proc/self/mountinfo", "/sys").
void setSources(const QString& inMountTable, const QString& inSysfsRoot);

} // namespace ZuDriveWatch
