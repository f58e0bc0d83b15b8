#include "zubase/File.h"

#include "zubase/Impersonation.h"
#include "zubase/ZuCheck_p.h"
#include "zubase/platform/ReparseBuffer.h"
#include "zubase/platform/SysFiles.h"
#include "zubase/platform/SysTypes.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QRegularExpression>

namespace {

const char* const kCategory = "ZuBase";

// Absolute, with native separators; empty stays empty.
QString nativeAbsolutePath(const QString& inPath)
{
    if (inPath.isEmpty())
        return QString();
    return QDir::toNativeSeparators(QFileInfo(inPath).absoluteFilePath());
}

std::u16string toU16(const QString& inText)
{
    return std::u16string(reinterpret_cast<const char16_t*>(inText.utf16()),
                          static_cast<std::size_t>(inText.size()));
}

QString fromU16(const std::u16string& inText)
{
    return QString::fromUtf16(inText.data(), static_cast<int>(inText.size()));
}

void traceRemoval(const char* inFormat, const QString& inPath, bool inGone)
{
    getTheLogInstance().tracef(inGone ? RkLogInfo : RkLogWarning, kCategory, inFormat,
                               Q2M(inPath).constData(), inGone ? "ok" : "fail");
}

// An opened folder of the removal walk, closed with the object.
struct Folder
{
    ~Folder() { ZuPlatform::filesCloseFolder(handle); }
    ZuPlatform::FolderHandle handle = ZuPlatform::kInvalidHandle;
};

// Name filters as QDir applies them when listing: wildcards, case-insensitive.
QList<QRegularExpression> wildcards(const QStringList& inFilters)
{
    QList<QRegularExpression> patterns;
    for (const QString& filter : inFilters)
        patterns << QRegularExpression(QRegularExpression::wildcardToRegularExpression(filter),
                                       QRegularExpression::CaseInsensitiveOption);
    return patterns;
}

bool matchesAny(const QList<QRegularExpression>& inPatterns, const QString& inName)
{
    for (const QRegularExpression& pattern : inPatterns) {
        if (pattern.match(inName).hasMatch())
            return true;
    }
    return false;
}

struct RemovalFilters
{
    QList<QRegularExpression> names; // none: every file
    QList<QRegularExpression> kept;
    bool keeping; // a keep list was given: it keeps every folder too
    bool recursive;
};

void removeEntries(ZuPlatform::FolderHandle inFolder, const QString& inPath,
                   const RemovalFilters& inFilters);

// A folder below the one being emptied, reached through its opened parent: the same steps as
// the top one, with links removed themselves and never followed.
void removeSubfolder(ZuPlatform::FolderHandle inParent, const std::string& inName,
                     const QString& inPath, const RemovalFilters& inFilters)
{
    ZuPlatform::filesRemoveEntry(inParent, inName, true);
    ZuPlatform::filesRemoveEntry(inParent, inName, false);
    if (!ZuPlatform::filesEntryExists(inParent, inName))
        return;
    Folder folder;
    if (ZuPlatform::filesOpenFolder(inParent, inName, folder.handle) == 0)
        removeEntries(folder.handle, inPath, inFilters);
    ZuPlatform::filesRemoveEntry(inParent, inName, true);
    traceRemoval("QDir::rmdir() [%s] -> %s", inPath,
                 !ZuPlatform::filesEntryExists(inParent, inName));
}

// Lists the folder as QDir does with files, all folders, hidden and system entries, unsorted,
// and removes the listed entries from the last to the first.
void removeEntries(ZuPlatform::FolderHandle inFolder, const QString& inPath,
                   const RemovalFilters& inFilters)
{
    std::vector<ZuPlatform::FolderEntry> entries;
    if (ZuPlatform::filesListFolder(inFolder, entries) != 0)
        return;
    for (auto entry = entries.rbegin(); entry != entries.rend(); ++entry) {
        const QString name = QFile::decodeName(QByteArray::fromStdString(entry->name));
        const bool folder = entry->kind != ZuPlatform::EntryKind::File;
        if (!folder && !inFilters.names.isEmpty() && !matchesAny(inFilters.names, name))
            continue; // not listed
        if (inFilters.keeping && (folder || matchesAny(inFilters.kept, name)))
            continue;
        const QString path = inPath + QLatin1Char('/') + name;
        if (folder) {
            if (inFilters.recursive)
                removeSubfolder(inFolder, entry->name, path, inFilters);
            continue;
        }
        ZuPlatform::filesRemoveEntry(inFolder, entry->name, false);
        traceRemoval("QFile::remove() [%s] -> %s", path,
                     !ZuPlatform::filesEntryExists(inFolder, entry->name));
    }
}

// Opens a directory's reparse point, with the restore privilege raised first as writing or
// reading one may need it.
int openMountPoint(const std::string& inPath, ZuPlatform::ReparseHandle& outHandle)
{
    ZuBase::win32TokenAdjustPrivilege(ZuPlatform::kCurrentProcessToken,
                                      const_cast<char*>("SeRestorePrivilege"), true);
    return ZuPlatform::filesOpenReparsePoint(inPath, outHandle);
}

} // namespace

namespace ZuBase::File {

RkResult readAll(const QString& inFilePath, QByteArray& outBuffer)
{
    RkResult res;
    outBuffer.clear();
    QFile file(inFilePath);
    res << RK_CHECK(file.exists(), "file.exists()", "Internal Error");
    if (res.isBad())
        return res;
    res << RK_CHECK(file.open(QIODevice::ReadOnly), "file.open( QIODevice::ReadOnly )",
                    Q2M(inFilePath));
    if (res.isBad())
        return res;
    outBuffer = file.readAll();
    res << RK_CHECK(file.size() == outBuffer.size(), "file.size()==outBuffer.size()",
                    "Internal Error");
    if (res.isBad())
        outBuffer.clear();
    return res;
}

RkResult writeAll(const QString& inFilePath, const QByteArray& inData)
{
    RkResult res;
    QFile file(inFilePath);
    // Unbuffered: a buffered QFile only meets a full disk when it flushes on close, where the
    // failure would be lost and the caller told that the data was written.
    res << RK_CHECK(file.open(QIODevice::WriteOnly | QIODevice::Truncate | QIODevice::Unbuffered),
                    "file.open( QIODevice::WriteOnly | QIODevice::Truncate )", Q2M(inFilePath));
    if (res.isBad())
        return res;
    res << writeAll(file, inData);
    return res;
}

RkResult writeAll(QIODevice& inDevice, const QByteArray& inData)
{
    return writeAll(inDevice, const_cast<char*>(inData.constData()), inData.size());
}

RkResult writeAll(QIODevice& inDevice, void* inData, qint64 inSize)
{
    RkResult res;
    const char* data = static_cast<const char*>(inData);
    qint64 remaining = inSize;
    while (remaining > 0) {
        const qint64 numBytesDone = inDevice.write(data, remaining);
        ZU_CHECK_RETURN(res, RK_CHECK(numBytesDone > 0, "numBytesDone > 0", "Internal Error"));
        data += numBytesDone;
        remaining -= numBytesDone;
    }
    return res;
}

RkResult removeFile(const QString& inFilePath)
{
    RkResult res;
    if (!QFile::exists(inFilePath))
        return res;
    QFile::remove(inFilePath);
    const bool gone = !QFile::exists(inFilePath);
    traceRemoval("QFile::remove() [%s] -> %s", inFilePath, gone);
    ZU_CHECK_RETURN(res, RK_CHECK(gone, "!QFile::exists(inFilePath)", "Internal Error"));
    return res;
}

RkResult removeDir(const QString& inDirPath, bool inRecursive, const QStringList& inNameFilters,
                   const QStringList& inKeepFilters)
{
    RkResult res;
    // An empty directory, a file or a link goes at once.
    QDir().rmdir(inDirPath);
    QDir().remove(inDirPath);
    const QFileInfo self(inDirPath);
    if (!self.exists() && !self.isSymLink())
        return res;

    // A link is not listed at all: opening it as a folder fails.
    Folder folder;
    if (ZuPlatform::filesOpenFolder(ZuPlatform::kInvalidHandle, Q2M(inDirPath).toStdString(),
                                    folder.handle) == 0) {
        const RemovalFilters filters{wildcards(inNameFilters), wildcards(inKeepFilters),
                                     !inKeepFilters.isEmpty(), inRecursive};
        removeEntries(folder.handle, QDir(inDirPath).absolutePath(), filters);
    }
    QDir().rmdir(inDirPath);
    traceRemoval("QDir::rmdir() [%s] -> %s", inDirPath, !QFileInfo::exists(inDirPath));
    return res;
}

RkResult junctionCreate(const QString& inJunctionPath, const QString& inTargetPath)
{
    RkResult res;
    const QString junctionPath = nativeAbsolutePath(inJunctionPath);
    const QString targetPath = nativeAbsolutePath(inTargetPath);
    if (junctionPath.isEmpty() || targetPath.isEmpty()) {
        res.makeBad(1);
        return res;
    }
    const std::string path = Q2M(junctionPath).toStdString();
    ZuPlatform::ReparseHandle hDirMountPoint;

    const int createError = ZuPlatform::filesCreateDirectory(path);
    // A folder already there is used as it is; any other failure is recorded as "bret".
    const bool createdHere = createError == 0;
    if (createError != EEXIST)
        ZU_CHECK_WIN_RETURN(res, RK_CHECK(createdHere, "bret", "::CreateDirectoryW"), createError);

    const int openError = openMountPoint(path, hDirMountPoint);
    if (Tz::failWin(
            RK_CHECK(openError == 0, "hDirMountPoint!=((HANDLE)(LONG_PTR)-1)", "::CreateFileW"),
            openError)) {
        res.makeBad(1);
    } else {
        const std::vector<std::uint8_t> buffer =
            ZuPlatform::mountPointBuild(ZuPlatform::mountPointSubstituteName(toU16(targetPath)));
        const int setError = ZuPlatform::filesSetReparsePoint(hDirMountPoint, buffer);
        if (Tz::failWin(RK_CHECK(setError == 0, "bret!=0", "::DeviceIoControl"), setError))
            res.makeBad(1);
    }
    ZuPlatform::filesCloseReparsePoint(hDirMountPoint);

    if (res.isBad() && createdHere)
        ZuPlatform::filesRemoveDirectory(path);
    return res;
}

RkResult junctionInfo(const QString& inPath, bool& outIsJunction, QString& outTarget)
{
    RkResult res;
    outIsJunction = false;
    outTarget.clear();
    // A junction whose target has gone is still a junction to inspect (and to clean up).
    const QFileInfo info(inPath);
    const bool danglingLink = info.isSymLink() && !info.exists();
    if (inPath.isEmpty() || !(info.isDir() || danglingLink)) {
        res.makeBad(1);
        return res;
    }
    const std::string path = Q2M(nativeAbsolutePath(inPath)).toStdString();
    ZuPlatform::ReparseHandle hDirMountPoint;
    const int openError = openMountPoint(path, hDirMountPoint);
    ZU_CHECK_WIN_RETURN(
        res, RK_CHECK(openError == 0, "hDirMountPoint!=((HANDLE)(LONG_PTR)-1)", "::CreateFileW"),
        openError);
    std::vector<std::uint8_t> buffer;
    const int getError = ZuPlatform::filesGetReparsePoint(hDirMountPoint, buffer);
    if (getError != ZuPlatform::kFilesNotAReparsePoint) {
        if (Tz::failWin(RK_CHECK(getError == 0, "bret!=0", "::DeviceIoControl"), getError)) {
            res.makeBad(1);
        } else {
            std::uint32_t tag = 0;
            std::u16string substituteName;
            if (ZuPlatform::reparseBufferParse(buffer.data(), buffer.size(), tag, substituteName) &&
                tag == ZuPlatform::kReparseTagMountPoint) {
                outIsJunction = true;
                outTarget = fromU16(ZuPlatform::mountPointTarget(substituteName));
            }
        }
    }
    ZuPlatform::filesCloseReparsePoint(hDirMountPoint);
    return res;
}

bool pathsPointToTheSameFile(const QString& inPath1, const QString& inPath2)
{
    // The files themselves, not only their folders: two files side by side are not the same.
    const QString canonical1 = QFileInfo(inPath1).canonicalFilePath();
    const QString canonical2 = QFileInfo(inPath2).canonicalFilePath();
    return !canonical1.isEmpty() && canonical1 == canonical2; // a missing file is no file
}

} // namespace ZuBase::File
