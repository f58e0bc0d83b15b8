#include "zubase/platform/SysDrives.h"

#include <cerrno>
#include <sys/statvfs.h>

namespace ZuPlatform {

int drivesFreeSpace(const std::string& inPath, std::uint64_t& outFreeToCaller,
                    std::uint64_t& outTotal)
{
    outFreeToCaller = 0;
    outTotal = 0;
    struct statvfs info;
    if (inPath.empty())
        return ENOENT;
    if (::statvfs(inPath.c_str(), &info) != 0)
        return errno;
    const std::uint64_t unit = info.f_frsize ? info.f_frsize : info.f_bsize;
    outFreeToCaller = static_cast<std::uint64_t>(info.f_bavail) * unit;
    outTotal = static_cast<std::uint64_t>(info.f_blocks) * unit;
    return 0;
}

} // namespace ZuPlatform
