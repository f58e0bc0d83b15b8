#include "zubase/platform/SysDrives.h"

#include "zubase/platform/UniqueFd.h"

#include <cerrno>
#include <cstdlib>
#include <fcntl.h>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

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

namespace {

int readWholeFile(const std::string& inPath, std::string& outText)
{
    outText.clear();
    UniqueFd fd(::open(inPath.c_str(), O_RDONLY | O_CLOEXEC));
    if (!fd.isOpen())
        return errno;
    char buffer[8192];
    for (;;) {
        const ssize_t got = ::read(fd.get(), buffer, sizeof buffer);
        if (got < 0 && errno == EINTR)
            continue;
        if (got < 0)
            return errno;
        if (got == 0)
            return 0;
        outText.append(buffer, static_cast<size_t>(got));
    }
}

// A one-line sysfs attribute without its line end; empty when it cannot be read.
std::string readAttribute(const std::string& inPath)
{
    std::string text;
    if (readWholeFile(inPath, text) != 0)
        return std::string();
    while (!text.empty() && (text.back() == '\n' || text.back() == ' '))
        text.pop_back();
    return text;
}

// The table writes blank, tab, line feed and backslash in paths as \ooo.
std::string decodeOctalEscapes(const std::string& inField)
{
    std::string out;
    out.reserve(inField.size());
    for (size_t i = 0; i < inField.size(); ++i) {
        if (inField[i] == '\\' && i + 3 < inField.size() && inField[i + 1] >= '0' &&
            inField[i + 1] <= '3' && inField[i + 2] >= '0' && inField[i + 2] <= '7' &&
            inField[i + 3] >= '0' && inField[i + 3] <= '7') {
            out += static_cast<char>((inField[i + 1] - '0') * 64 + (inField[i + 2] - '0') * 8 +
                                     (inField[i + 3] - '0'));
            i += 3;
        } else {
            out += inField[i];
        }
    }
    return out;
}

std::vector<std::string> splitFields(const std::string& inLine)
{
    std::vector<std::string> fields;
    size_t start = 0;
    while (start <= inLine.size()) {
        const size_t end = inLine.find(' ', start);
        fields.push_back(inLine.substr(start, end == std::string::npos ? end : end - start));
        if (end == std::string::npos)
            break;
        start = end + 1;
    }
    return fields;
}

bool parseNumber(const std::string& inText, unsigned long& outValue)
{
    if (inText.empty() || inText.find_first_not_of("0123456789") != std::string::npos)
        return false;
    errno = 0;
    outValue = std::strtoul(inText.c_str(), nullptr, 10);
    return errno == 0;
}

DriveType blockDeviceType(const std::string& inSysfsRoot, unsigned long inMajor,
                          unsigned long inMinor)
{
    // Device number 0:n is an anonymous device of a file system without a disk.
    if (inMajor == 0)
        return kDriveUnknown;
    const std::string device =
        inSysfsRoot + "/dev/block/" + std::to_string(inMajor) + ":" + std::to_string(inMinor);
    struct stat info;
    if (::stat(device.c_str(), &info) != 0 || !S_ISDIR(info.st_mode))
        return kDriveUnknown;
    // A partition's entry is a link into its disk's folder; the disk holds the flags.
    const std::string disk =
        ::access((device + "/partition").c_str(), F_OK) == 0 ? device + "/.." : device;
    // SCSI peripheral type 5: CD/DVD.
    if (readAttribute(disk + "/device/type") == "5")
        return kDriveCdrom;
    if (readAttribute(disk + "/removable") == "1")
        return kDriveRemovable;
    return kDriveFixed;
}

// "36 35 98:0 /root /mount/point opts [optional...] - fstype source superopts"
bool parseMountLine(const std::string& inLine, const std::string& inSysfsRoot, DriveMount& outMount)
{
    const std::vector<std::string> fields = splitFields(inLine);
    if (fields.size() < 10)
        return false;
    size_t separator = 6;
    while (separator < fields.size() && fields[separator] != "-")
        ++separator;
    if (separator + 3 >= fields.size())
        return false;
    unsigned long id = 0, major = 0, minor = 0;
    const size_t colon = fields[2].find(':');
    if (!parseNumber(fields[0], id) || id > 0x7fffffff || colon == std::string::npos ||
        !parseNumber(fields[2].substr(0, colon), major) ||
        !parseNumber(fields[2].substr(colon + 1), minor) || fields[4].empty())
        return false;
    outMount.mountId = static_cast<int>(id);
    outMount.deviceMajor = major;
    outMount.deviceMinor = minor;
    outMount.mountPoint = decodeOctalEscapes(fields[4]);
    outMount.type = blockDeviceType(inSysfsRoot, major, minor);
    return true;
}

} // namespace

int drivesListMounts(const DriveSources& inSources, std::vector<DriveMount>& outMounts)
{
    outMounts.clear();
    std::string table;
    if (const int error = readWholeFile(inSources.mountTable, table))
        return error;
    size_t start = 0;
    while (start < table.size()) {
        size_t end = table.find('\n', start);
        if (end == std::string::npos)
            end = table.size();
        DriveMount mount;
        if (parseMountLine(table.substr(start, end - start), inSources.sysfsRoot, mount))
            outMounts.push_back(mount);
        start = end + 1;
    }
    return 0;
}

int drivesOpenMountWatch(const DriveSources& inSources, int& outFd)
{
    outFd = ::open(inSources.mountTable.c_str(), O_RDONLY | O_CLOEXEC);
    return outFd < 0 ? errno : 0;
}

void drivesCloseMountWatch(int inFd)
{
    if (inFd >= 0)
        ::close(inFd);
}

} // namespace ZuPlatform
