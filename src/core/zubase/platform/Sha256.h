#pragma once

// Internal, Qt-free and portable: SHA-256, for names that must be short and must not collide.

#include <array>
#include <cstdint>
#include <string>

namespace ZuPlatform {

std::array<std::uint8_t, 32> sha256(const std::string& inData);

} // namespace ZuPlatform
