#pragma once

#include "zubase/zubase_export.h"

#include <QStringList>

// Tells whether the shell extensions of the Dell Backup and Recovery product are installed and
// whether its version is release 1.8, which hosts treat as harmful (it crashes processes that
// open native file dialogs). Without Windows program-files folders and registry, as on Linux,
// nothing is installed: an empty list and false.
namespace DellBackupAndRecoveryHelper {

// Full paths of the product's shell-extension libraries that exist, program files first.
ZUBASE_EXPORT QStringList getShellExtensionDllList();
// True when the installed version is 1.8 (any later parts).
ZUBASE_EXPORT bool isMaliciousVersion();

} // namespace DellBackupAndRecoveryHelper
