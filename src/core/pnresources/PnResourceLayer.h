#pragma once

#include "pnresources/pnresources_export.h"

#include "rklib/DvParameter.h"
#include "rklib/RkFilename.h"
#include "rklib/RkResult.h"
#include "rklib/RkString.h"

// The installation-resource layer: where the installation is, the registry file and the
// settings read from it, and the names the product uses for its settings and data folders.
// Paths are C strings in the local 8-bit encoding. Process-wide state without locks: it is set
// up on the main thread at start-up, before other threads run.
namespace PnResource {

// The installation root (the folder holding share/, bin/ ...); empty until set.
PNRESOURCES_EXPORT const char* getRoot();
PNRESOURCES_EXPORT void setApplicationFolder(const char* inFolder);

PNRESOURCES_EXPORT const RkFilename& registryFilePath();
PNRESOURCES_EXPORT void registryFilePathSet(const char* inPath);

// The parameters of the last registry taken over with readFromBundle().
PNRESOURCES_EXPORT DvParamBundle& registryBundle();
// Takes over a freshly read registry: copies its text parameters into registryBundle() and
// applies the settings it names (case-sensitive): LocalDirectory, VolumeDirectory,
// WebServiceEnabled ("1" or "true" switch it on, anything else off), WebServiceHost,
// WebServiceLoginName.
PNRESOURCES_EXPORT void readFromBundle(const DvParamBundle& inBundle);
// Empties registryBundle(); the settings stay as they are.
PNRESOURCES_EXPORT void clearRegistryBundle();

PNRESOURCES_EXPORT void setWebServiceEnabled(bool inEnabled);
PNRESOURCES_EXPORT bool isWebServiceEnabled();
PNRESOURCES_EXPORT void setWebServiceHost(const char* inHost);
PNRESOURCES_EXPORT const char* getWebServiceHost();
PNRESOURCES_EXPORT void setWebServiceLoginName(const char* inName);
PNRESOURCES_EXPORT const char* getWebServiceLoginName();
// The name of the account the process runs under (empty when it cannot be told).
PNRESOURCES_EXPORT const char* getUserName();

// Folder name of the local directory below the root when the registry names none.
PNRESOURCES_EXPORT extern const char* const defaultLocalDirName;
// Sets the local directory as a default; a LocalDirectory of the registry replaces it.
PNRESOURCES_EXPORT void setLocalDirectoryNonExplicit(const char* inPath);
PNRESOURCES_EXPORT const char* getLocalDirectory();
PNRESOURCES_EXPORT void setVolumeDirectory(const char* inPath);
PNRESOURCES_EXPORT const char* getVolumeDirectory();
// Bad, with one record per folder, when the local or the volume directory is no directory.
PNRESOURCES_EXPORT RkResult checkDirectories();

// Reports a start-up problem: the text as a warning in the log.
PNRESOURCES_EXPORT void handleError(const char* inText);
// Reports the records of a bad result through Tz::fail; a good result reports nothing.
PNRESOURCES_EXPORT void handleError(const RkResult& inResult);

// Cache of the directory of the running executable; empty until set.
PNRESOURCES_EXPORT const RkString& processStartupDirectory();
PNRESOURCES_EXPORT void processStartupDirectorySet(const char* inPath);

// Name parts of the settings ("Pernel"/"Tessel") and of the per-user data folder ("Tessel").
PNRESOURCES_EXPORT const char* getOrganizationName();
PNRESOURCES_EXPORT const char* getApplicationRegistryName();
PNRESOURCES_EXPORT const char* getApplicationTesselLocalName();

} // namespace PnResource

namespace PnClientConfig {

// True when the process was started by the client executable; set by the host before
// PnResource::initialize.
PNRESOURCES_EXPORT extern bool sStartedViaTzClient;

} // namespace PnClientConfig
