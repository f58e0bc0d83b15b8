#pragma once

// Internal, Qt-free: address space reserved up front (VirtualAlloc with MEM_RESERVE on Windows).

#include <cstddef>

namespace ZuPlatform {

// Reserves inBytes of address space followed by an inaccessible guard page. The pages are
// backed by memory only once touched, and the reservation is never released. Null when the
// system cannot reserve that way; the caller then keeps an ordinary growing array.
void* memoryReserveWithGuard(std::size_t inBytes);

} // namespace ZuPlatform
