#pragma once

// Internal, Qt-free: the file-system calls behind ZuBase::File's junctions. Every function
// returns 0 or an errno-style code; the family source turns codes into failure records.
// Paths are absolute, in the local 8-bit encoding (a Win32 backend puts the "\\?\" prefix in
// front itself).

#include "zubase/platform/SysTypes.h"

#include <cstdint>
#include <string>
#include <vector>

namespace ZuPlatform {

// Folders opened for removing what is in them: every entry is reached relative to its opened
// folder and no link is followed, so a folder swapped for a link meanwhile cannot lead the
// removal elsewhere. On POSIX the handle is the descriptor itself.
using FolderHandle = Handle;

enum class EntryKind
{
    File,         // also a link to a file, a dangling link and special files
    Folder,       // a real folder
    LinkToFolder, // counts as a folder when listing; removing it removes the link
};

struct FolderEntry
{
    std::string name;
    EntryKind kind;
};

// Opens inName in inParent (kInvalidHandle: inName is a path); a link there is not followed.
int filesOpenFolder(FolderHandle inParent, const std::string& inName, FolderHandle& outFolder);
void filesCloseFolder(FolderHandle inFolder);
// The entries in the order the system lists them, without "." and "..".
int filesListFolder(FolderHandle inFolder, std::vector<FolderEntry>& outEntries);
// Removes an empty folder (inFolderEntry), or anything else including a link, never its target.
int filesRemoveEntry(FolderHandle inFolder, const std::string& inName, bool inFolderEntry);
// Whether anything, a dangling link included, is there under that name.
bool filesEntryExists(FolderHandle inFolder, const std::string& inName);

// Returned by filesGetReparsePoint() for a directory that is no junction.
constexpr int kFilesNotAReparsePoint = -4390;

// Creates a directory; EEXIST when something is already at the path.
int filesCreateDirectory(const std::string& inPath);
// Removes an empty directory.
int filesRemoveDirectory(const std::string& inPath);

// A directory opened to read or set its reparse point.
struct ReparseHandle
{
    std::string path;
    bool open = false;
};

// Opens a directory (or an existing junction, without following it) for its reparse point.
int filesOpenReparsePoint(const std::string& inPath, ReparseHandle& outHandle);
// Makes the opened directory a junction described by a mount-point reparse buffer. On Linux a
// junction is a directory symbolic link: an empty directory is replaced by the link, a
// non-empty one is refused (ENOTEMPTY) and left alone.
int filesSetReparsePoint(ReparseHandle& ioHandle, const std::vector<std::uint8_t>& inBuffer);
// Reads the reparse buffer of the opened directory (at most kReparseBufferMaxSize bytes);
// kFilesNotAReparsePoint for a plain directory.
int filesGetReparsePoint(ReparseHandle& ioHandle, std::vector<std::uint8_t>& outBuffer);
void filesCloseReparsePoint(ReparseHandle& ioHandle);

} // namespace ZuPlatform
