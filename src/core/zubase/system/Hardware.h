#pragma once

#include "zubase/zubase_export.h"

#include "rklib/RkResult.h"

#include <QString>

namespace ZuBase {

// Product name, serial number and BIOS text ("vendor, version, release date") of the machine,
// read from the DMI decoding tool "dmidecode.exe" (on Linux also "dmidecode") in the
// application directory, started with "-q". Each text is "N/A" unless found.
ZUBASE_EXPORT void getHardwareType(QString& outProductName, QString& outSerialNumber,
                                   QString& outBios);

// Megabytes free to the caller on the file system holding inPath and the percentage of it in
// use. On failure both are 0 and the failure is reported to the log.
ZUBASE_EXPORT RkResult getDiskFreeSpaceMB(const QString& inPath, unsigned int& outFreeMB,
                                          float& outUsedPercent);

} // namespace ZuBase
