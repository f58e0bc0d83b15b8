#pragma once

// Internal: the reading of the DMI tool's output, apart from starting the tool.
#include "zubase/zubase_export.h"

#include <QByteArray>
#include <QString>

namespace ZuBase {

// Reads the "BIOS Information" and "System Information" sections of "dmidecode -q" output.
// Texts not found stay as they are given (the caller starts them as "N/A").
ZUBASE_EXPORT void parseDmiDecodeOutput(const QByteArray& inOutput, QString& ioProductName,
                                        QString& ioSerialNumber, QString& ioBios);

} // namespace ZuBase
