#pragma once

#include "zubase/zubase_export.h"

#include <QObject>
#include <QString>

#include <memory>

// Tells when a removable or optical drive comes or goes, and lists those present. A drive is
// named by its mount point with a trailing "/" ("/media/stick/"); fixed disks and file systems
// without a block device (tmpfs, network, proc) are never reported.
class ZUBASE_EXPORT ZuRemovableDeviceWatcher : public QObject
{
    Q_OBJECT

public:
    // Listens from here on when the calling thread has an event dispatcher (logged either way);
    // without one the watcher stays deaf, while listing still works.
    explicit ZuRemovableDeviceWatcher(QObject* parent = nullptr);
    ~ZuRemovableDeviceWatcher() override;

    // Emits driveFound once for every removable or optical drive mounted now, in sorted order.
    void findAndSignalAllRemovableDrives();

Q_SIGNALS:
    // Emitted synchronously, in sorted order, once per drive of a change of the mount table.
    void driveAdded(const QString& drive);
    void driveRemoved(const QString& drive);
    void driveFound(const QString& drive);

private:
    class Private;
    std::unique_ptr<Private> const d;
};
