#pragma once

// Internal, Qt-free: the values the whole seam shares. The calls mirror Win32, so a handle is
// a pointer-sized number; the POSIX backend hands out small numbers of its own (HandleTable.h).

#include <cstdint>

namespace ZuPlatform {

using Handle = std::intptr_t;

// A handle slot that holds nothing: zeroed process information, or a process that could not
// be opened (OpenProcess gives NULL).
constexpr Handle kNullHandle = 0;
// INVALID_HANDLE_VALUE: what a failed CreateFile or CreateNamedPipe gives, and what a pipe
// holds while it is not open.
constexpr Handle kInvalidHandle = -1;

// Stands for the current process's own access token wherever a function takes a token; the
// same value as INVALID_HANDLE_VALUE, as GetCurrentProcess() gives on Windows.
inline void* const kCurrentProcessToken = reinterpret_cast<void*>(kInvalidHandle);

} // namespace ZuPlatform
