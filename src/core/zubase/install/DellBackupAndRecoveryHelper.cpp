#include "zubase/DellBackupAndRecoveryHelper.h"

#include "zubase/install/DellBackupAndRecoveryHelper_p.h"

#include "rklib/RkVersion.h"

#include <QFile>

namespace {

const char* const kShellExtensions[] = {
    "Dell Backup and Recovery\\Components\\Shell\\DBROverlayIconBackuped.dll",
    "Dell Backup and Recovery\\Components\\Shell\\DBROverlayIconNotBackuped.dll",
    "Dell Backup and Recovery\\Components\\Shell\\DBRShellExtension.dll",
};

// Program-files folders and the product's registry key exist on Windows only; a Windows build
// asks SHGetFolderPathA and the registry ("Version" below
// HKEY_LOCAL_MACHINE\SOFTWARE\Wow6432Node\DellBackupandRecovery) here.
QString programFilesFolder()
{
    return QString();
}

QString programFilesX86Folder()
{
    return QString();
}

QString installedVersionText()
{
    return QString();
}

} // namespace

namespace DellBackupAndRecoveryHelper {

QStringList shellExtensionDllList(const QString& inProgramFiles, const QString& inProgramFilesX86)
{
    QStringList folders;
    // On a 32-bit system both folders are one.
    if (inProgramFiles != inProgramFilesX86)
        folders << inProgramFiles;
    folders << inProgramFilesX86;
    folders.removeAll(QString());
    QStringList found;
    for (const QString& folder : folders) {
        for (const char* relative : kShellExtensions) {
            const QString path = folder + QLatin1Char('\\') + QLatin1String(relative);
            if (QFile::exists(path))
                found << path;
        }
    }
    return found;
}

bool isMaliciousVersionText(const QString& inVersion)
{
    const RkVersion version(inVersion.toStdString());
    return version.majorVersion() == 1 && version.minorVersion() == 8;
}

QStringList getShellExtensionDllList()
{
    return shellExtensionDllList(programFilesFolder(), programFilesX86Folder());
}

bool isMaliciousVersion()
{
    return isMaliciousVersionText(installedVersionText());
}

} // namespace DellBackupAndRecoveryHelper
