// The reading of reparse buffers as the file system hands them out. Besides staying inside the
// buffer: a mount point read back is built again into a buffer that reads as the same name.
#include "zubase/platform/ReparseBuffer.h"

#include <cstddef>
#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    std::uint32_t tag = 0;
    std::u16string name;
    if (!ZuPlatform::reparseBufferParse(inData, inSize, tag, name) ||
        tag != ZuPlatform::kReparseTagMountPoint)
        return 0;
    ZuPlatform::mountPointTarget(name);
    const std::vector<std::uint8_t> built = ZuPlatform::mountPointBuild(name);
    std::uint32_t builtTag = 0;
    std::u16string builtName;
    if (!ZuPlatform::reparseBufferParse(built.data(), built.size(), builtTag, builtName) ||
        builtTag != tag || builtName != name)
        __builtin_trap();
    return 0;
}
