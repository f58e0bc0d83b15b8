#pragma once

// Internal, Qt-free: the mount-point reparse buffer that describes a junction. Its layout is
// fixed by the file system, so it is built and read here in plain code, byte for byte, and
// shared by every backend.

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ZuPlatform {

constexpr std::uint32_t kReparseTagMountPoint = 0xA0000003u;
// Largest reparse buffer the file system hands out.
constexpr std::size_t kReparseBufferMaxSize = 17408;

// "\??\" + target, with a trailing backslash added when missing.
std::u16string mountPointSubstituteName(const std::u16string& inTarget);
// The target named by a substitute name: a leading "\??\" dropped, and one trailing backslash
// unless the name ends with ":\" (a drive root keeps it).
std::u16string mountPointTarget(const std::u16string& inSubstituteName);

// The mount-point buffer (2L + 20 bytes, little-endian) for a substitute name of L UTF-16
// units: tag, data length 2L + 12, substitute name at 0 with 2L bytes, an empty print name at
// 2L + 2, the name, then four zero bytes.
std::vector<std::uint8_t> mountPointBuild(const std::u16string& inSubstituteName);

// Reads the tag of a reparse buffer and, for a mount point, its substitute name. False when the
// buffer is too short or its offsets point outside it.
bool reparseBufferParse(const std::uint8_t* inData, std::size_t inSize, std::uint32_t& outTag,
                        std::u16string& outSubstituteName);

} // namespace ZuPlatform
