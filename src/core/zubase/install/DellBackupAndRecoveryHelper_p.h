#pragma once

// Internal: the rules of DellBackupAndRecoveryHelper on given inputs, for tests.
#include <QString>
#include <QStringList>

namespace DellBackupAndRecoveryHelper {

// The existing shell-extension libraries below the program-files folder and the 32-bit one;
// empty folders are left out, and a 32-bit folder equal to the first is looked at once.
QStringList shellExtensionDllList(const QString& inProgramFiles, const QString& inProgramFilesX86);
// True for version texts whose major number is 1 and minor number 8.
bool isMaliciousVersionText(const QString& inVersion);

} // namespace DellBackupAndRecoveryHelper
