#pragma once

// Internal, Qt-free: the address of a connected socket's peer.

#include <cstdint>

namespace ZuPlatform {

// A peer address as the socket layer gives it.
struct PeerAddress
{
    int family = 0;              // 4 or 6
    std::uint8_t bytes[16] = {}; // 4 bytes for IPv4, 16 for IPv6, network order
    std::uint16_t port = 0;      // host order
    std::uint32_t scopeId = 0;   // IPv6 only
};

// Fills outAddress for the peer of inSocket. Returns 0, or an errno-style code (also left in
// errno so that the socket layer's error text describes it); EAFNOSUPPORT for a peer that is
// neither IPv4 nor IPv6.
int peersPeerAddress(int inSocket, PeerAddress& outAddress);

} // namespace ZuPlatform
