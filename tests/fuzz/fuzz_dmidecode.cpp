// The reading of the DMI tool's output. Besides not crashing: a product name or serial number
// that was found is a piece of the output.
#include "zubase/system/Hardware_p.h"

#include <cstddef>
#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const QByteArray output =
        QByteArray::fromRawData(reinterpret_cast<const char*>(inData), int(inSize));
    const QString none = QStringLiteral("N/A");
    QString product = none;
    QString serial = none;
    QString bios = none;
    ZuBase::parseDmiDecodeOutput(output, product, serial, bios);
    for (const QString& found : {product, serial}) {
        if (found != none && !output.contains(found.toLatin1()))
            __builtin_trap();
    }
    return 0;
}
