#pragma once

// Internal: the reading of the DMI tool's output, apart from starting the tool.
#include <QByteArray>
#include <QString>

namespace ZuBase {

// Reads the "BIOS Information" and "System Information" sections of "dmidecode -q" output.
// Texts not found stay as they are given (the caller starts them as "N/A").
void parseDmiDecodeOutput(const QByteArray& inOutput, QString& ioProductName,
                          QString& ioSerialNumber, QString& ioBios);

// Free megabytes (whole MiB, rounded down, in 32 bits) and the used percentage
// (total - free) * 100 / (total + 1) out of the byte counts of a file system.
void diskSpaceFromBytes(quint64 inFreeBytes, quint64 inTotalBytes, unsigned int& outFreeMB,
                        float& outUsedPercent);

} // namespace ZuBase
