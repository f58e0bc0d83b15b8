#pragma once

// Internal, Qt-free: size and free space of the file system holding a path; the mounted drives
// and a way to be told when they change.

#include <cstdint>
#include <string>
#include <vector>

namespace ZuPlatform {

// Bytes available to the caller (not those reserved for the administrator) and the total size
// of the file system holding inPath (local 8-bit). Returns 0 or an errno-style code.
int drivesFreeSpace(const std::string& inPath, std::uint64_t& outFreeToCaller,
                    std::uint64_t& outTotal);

// The kinds of drive GetDriveTypeA tells apart, with its numbers; only these occur here.
enum DriveType : int
{
    kDriveUnknown = 0, // not backed by a block device (tmpfs, proc, network, fuse ...)
    kDriveRemovable = 2,
    kDriveFixed = 3,
    kDriveCdrom = 5
};

// One mounted file system.
struct DriveMount
{
    int mountId = 0;               // unique while mounted; mounting again gives a new one
    unsigned long deviceMajor = 0; // the file system's device number
    unsigned long deviceMinor = 0;
    std::string mountPoint; // local 8-bit, the escapes of the mount table decoded
    DriveType type = kDriveUnknown;
};

// Where the mount table and the block devices' attributes are read; tests use fakes.
struct DriveSources
{
    std::string mountTable = "/proc/self/mountinfo";
    std::string sysfsRoot = "/sys";
};

// The mounts of the table in its order, each with the type of the block device behind it (the
// whole disk decides for a partition: its "removable" flag, optical when its SCSI type is 5).
// Lines that cannot be read are left out. Returns 0 or an errno-style code.
int drivesListMounts(const DriveSources& inSources, std::vector<DriveMount>& outMounts);

// Opens the mount table so that a change of it shows as priority data (POLLPRI) on outFd,
// which the caller watches and closes with drivesCloseMountWatch. Returns 0 or an errno-style
// code.
int drivesOpenMountWatch(const DriveSources& inSources, int& outFd);
void drivesCloseMountWatch(int inFd);

} // namespace ZuPlatform
