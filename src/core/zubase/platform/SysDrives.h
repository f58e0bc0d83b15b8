#pragma once

// Internal, Qt-free: size and free space of the file system holding a path.

#include <cstdint>
#include <string>

namespace ZuPlatform {

// Bytes available to the caller (not those reserved for the administrator) and the total size
// of the file system holding inPath (local 8-bit). Returns 0 or an errno-style code.
int drivesFreeSpace(const std::string& inPath, std::uint64_t& outFreeToCaller,
                    std::uint64_t& outTotal);

} // namespace ZuPlatform
