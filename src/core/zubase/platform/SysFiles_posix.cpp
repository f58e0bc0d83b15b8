#include "zubase/platform/SysFiles.h"

#include "zubase/platform/ReparseBuffer.h"

#include <cerrno>
#include <climits>
#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace ZuPlatform {

namespace {

// Junction targets travel as UTF-16 in the buffer and as the local 8-bit text on disk; the
// library works in UTF-8 locales on Linux.
std::u16string toUtf16(const std::string& inText)
{
    std::u16string out;
    for (std::size_t i = 0; i < inText.size();) {
        const unsigned char c = static_cast<unsigned char>(inText[i]);
        char32_t code = c;
        int extra = 0;
        if (c >= 0xF0 && c < 0xF8) {
            code = c & 0x07;
            extra = 3;
        } else if (c >= 0xE0) {
            code = c & 0x0F;
            extra = 2;
        } else if (c >= 0xC0) {
            code = c & 0x1F;
            extra = 1;
        }
        ++i;
        for (int k = 0; k < extra && i < inText.size(); ++k, ++i)
            code = (code << 6) | (static_cast<unsigned char>(inText[i]) & 0x3F);
        if (code >= 0x10000) {
            code -= 0x10000;
            out += static_cast<char16_t>(0xD800 + (code >> 10));
            out += static_cast<char16_t>(0xDC00 + (code & 0x3FF));
        } else {
            out += static_cast<char16_t>(code);
        }
    }
    return out;
}

std::string fromUtf16(const std::u16string& inText)
{
    std::string out;
    for (std::size_t i = 0; i < inText.size(); ++i) {
        char32_t code = inText[i];
        if (code >= 0xD800 && code < 0xDC00 && i + 1 < inText.size()) {
            code = 0x10000 + ((code - 0xD800) << 10) + (inText[++i] - 0xDC00);
        }
        if (code < 0x80) {
            out += static_cast<char>(code);
        } else if (code < 0x800) {
            out += static_cast<char>(0xC0 | (code >> 6));
            out += static_cast<char>(0x80 | (code & 0x3F));
        } else if (code < 0x10000) {
            out += static_cast<char>(0xE0 | (code >> 12));
            out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
            out += static_cast<char>(0x80 | (code & 0x3F));
        } else {
            out += static_cast<char>(0xF0 | (code >> 18));
            out += static_cast<char>(0x80 | ((code >> 12) & 0x3F));
            out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
            out += static_cast<char>(0x80 | (code & 0x3F));
        }
    }
    return out;
}

} // namespace

int filesOpenFolder(FolderHandle inParent, const std::string& inName, FolderHandle& outFolder)
{
    outFolder = kInvalidHandle;
    const int parent = inParent == kInvalidHandle ? AT_FDCWD : static_cast<int>(inParent);
    const int fd =
        ::openat(parent, inName.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
    if (fd < 0)
        return errno;
    outFolder = fd;
    return 0;
}

void filesCloseFolder(FolderHandle inFolder)
{
    if (inFolder != kInvalidHandle)
        ::close(static_cast<int>(inFolder));
}

int filesListFolder(FolderHandle inFolder, std::vector<FolderEntry>& outEntries)
{
    outEntries.clear();
    // The listing reads through a descriptor of its own: closedir() closes it.
    const int listing = ::fcntl(static_cast<int>(inFolder), F_DUPFD_CLOEXEC, 3);
    if (listing < 0)
        return errno;
    DIR* dir = ::fdopendir(listing);
    if (!dir) {
        const int error = errno;
        ::close(listing);
        return error;
    }
    ::rewinddir(dir);
    while (const dirent* item = ::readdir(dir)) {
        const std::string name = item->d_name;
        if (name == "." || name == "..")
            continue;
        struct stat info;
        EntryKind kind = EntryKind::File;
        if (::fstatat(static_cast<int>(inFolder), name.c_str(), &info, AT_SYMLINK_NOFOLLOW) == 0) {
            if (S_ISDIR(info.st_mode))
                kind = EntryKind::Folder;
            else if (S_ISLNK(info.st_mode) &&
                     ::fstatat(static_cast<int>(inFolder), name.c_str(), &info, 0) == 0 &&
                     S_ISDIR(info.st_mode))
                kind = EntryKind::LinkToFolder;
        }
        outEntries.push_back({name, kind});
    }
    ::closedir(dir);
    return 0;
}

int filesRemoveEntry(FolderHandle inFolder, const std::string& inName, bool inFolderEntry)
{
    return ::unlinkat(static_cast<int>(inFolder), inName.c_str(),
                      inFolderEntry ? AT_REMOVEDIR : 0) == 0
               ? 0
               : errno;
}

bool filesEntryExists(FolderHandle inFolder, const std::string& inName)
{
    struct stat info;
    return ::fstatat(static_cast<int>(inFolder), inName.c_str(), &info, AT_SYMLINK_NOFOLLOW) == 0;
}

int filesCreateDirectory(const std::string& inPath)
{
    return ::mkdir(inPath.c_str(), 0777) == 0 ? 0 : errno;
}

int filesRemoveDirectory(const std::string& inPath)
{
    return ::rmdir(inPath.c_str()) == 0 ? 0 : errno;
}

int filesOpenReparsePoint(const std::string& inPath, ReparseHandle& outHandle)
{
    outHandle = ReparseHandle();
    struct stat info;
    if (::lstat(inPath.c_str(), &info) != 0)
        return errno;
    // A link is opened itself, not followed, as a junction whose target may be gone.
    if (!S_ISLNK(info.st_mode) && !S_ISDIR(info.st_mode))
        return ENOTDIR;
    outHandle.path = inPath;
    outHandle.open = true;
    return 0;
}

int filesSetReparsePoint(ReparseHandle& ioHandle, const std::vector<std::uint8_t>& inBuffer)
{
    if (!ioHandle.open)
        return EBADF;
    std::uint32_t tag = 0;
    std::u16string substituteName;
    if (inBuffer.size() > kReparseBufferMaxSize ||
        !reparseBufferParse(inBuffer.data(), inBuffer.size(), tag, substituteName) ||
        tag != kReparseTagMountPoint)
        return EINVAL;
    const std::string target = fromUtf16(mountPointTarget(substituteName));
    if (target.empty())
        return EINVAL;

    struct stat info;
    if (::lstat(ioHandle.path.c_str(), &info) != 0)
        return errno;
    const bool wasLink = S_ISLNK(info.st_mode);
    if (wasLink) {
        // A link to a file is no junction and is not replaced by one.
        struct stat linked;
        if (::stat(ioHandle.path.c_str(), &linked) == 0 && !S_ISDIR(linked.st_mode))
            return ENOTDIR;
    }
    // A junction replaces only an empty directory; rmdir refuses a non-empty one.
    if (::unlinkat(AT_FDCWD, ioHandle.path.c_str(), wasLink ? 0 : AT_REMOVEDIR) != 0)
        return errno;
    if (::symlink(target.c_str(), ioHandle.path.c_str()) != 0) {
        const int error = errno;
        // Put the empty directory back so that the caller finds what it had.
        if (!wasLink)
            ::mkdir(ioHandle.path.c_str(), info.st_mode & 07777);
        return error;
    }
    return 0;
}

int filesGetReparsePoint(ReparseHandle& ioHandle, std::vector<std::uint8_t>& outBuffer)
{
    outBuffer.clear();
    if (!ioHandle.open)
        return EBADF;
    char target[PATH_MAX + 1];
    const ssize_t length = ::readlink(ioHandle.path.c_str(), target, PATH_MAX);
    if (length < 0)
        return errno == EINVAL ? kFilesNotAReparsePoint : errno;
    std::string text(target, static_cast<std::size_t>(length));
    // Junction targets are absolute; a relative link counts from the link's own folder.
    if (text.empty() || text[0] != '/') {
        const std::size_t slash = ioHandle.path.rfind('/');
        text = (slash == std::string::npos ? std::string(".") : ioHandle.path.substr(0, slash)) +
               "/" + text;
    }
    const std::u16string name = mountPointSubstituteName(toUtf16(text));
    outBuffer = mountPointBuild(name);
    if (outBuffer.size() > kReparseBufferMaxSize) {
        outBuffer.clear();
        return ENAMETOOLONG;
    }
    return 0;
}

void filesCloseReparsePoint(ReparseHandle& ioHandle)
{
    ioHandle = ReparseHandle();
}

} // namespace ZuPlatform
