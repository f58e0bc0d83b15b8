#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkString.h"
#include "rklib/RkVersion.h"

#include <map>
#include <string>

class QSettings;

// Start-up of an installation and its registry file, the other installed versions of the
// product, and per-user folders and settings. The rest of the namespace (root, registry path
// and bundle, directories) is in <pnresources/PnResourceLayer.h>. Paths are in the local 8-bit
// encoding. Nothing here returns an error: problems are written to the log.
namespace PnResource {

// Start-up, once, on the main thread, before any other PnResource call: the application folder
// (see updateFolders), the registry path (PERNEL_REGISTRY, else inRegistryFile, else
// "share/dicom/PernelRegistry"; relative paths below the root), the defaults, the registry
// (an unreadable or malformed one leaves the defaults, with a warning) and the directory check.
ZUBASE_EXPORT void initialize(const char* const inApplicationFolder,
                              const char* const inRegistryFile);
// The application folder is inFolder when it holds "share", else the folder two levels up
// (a program folder such as <root>/bin/arch-Win).
ZUBASE_EXPORT void updateFolders(const char* inFolder);

// Adds the usable other installations of the registry's OtherVersion entries to outVersions
// (protocol version -> folder), asking the executables of unconfirmed ones for their version
// ("tzserver --version", at most 2 s to start and 2 s to finish). Brings the registry's
// OtherVersion lines up to date when they are stale: the old file is kept as a numbered backup
// (".bak", ".bak2", ...) and replaced in one step, so a failed update leaves it as it was.
ZUBASE_EXPORT void getOtherVersions(std::map<RkVersion, std::string>& outVersions,
                                    const RkVersion& inOwnProtocolVersion);
// The installation's executable inName + ".exe" in <folder>/bin/arch-Win, then
// <folder>/bin/arch-Win64VC9-Optimize, then <folder>; empty when none exists (then
// inNotFoundMessage, if given, is logged as a warning with %1 replaced by the last candidate).
ZUBASE_EXPORT std::string probePathToExecutable(const std::string& inFolder,
                                                const std::string& inName,
                                                const char* inNotFoundMessage);

// The product's per-user data folder: <data>/<organisation>/<local name>, where <data> is the
// user's application-data folder ($XDG_DATA_HOME, else ~/.local/share on Linux; created with
// mode 0700 when missing) or inFallback when there is none. Fixed on the first call.
ZUBASE_EXPORT const char* getAppDataAbsPath(const char* inFallback);
// The directory of the running executable; empty when it cannot be told. Cached once known.
ZUBASE_EXPORT RkString getProcessStartupDirectory();
// The application's settings (organisation and application registry names, native format,
// user scope), made on first use and kept for the life of the process.
ZUBASE_EXPORT QSettings& applicationSettings();

} // namespace PnResource
