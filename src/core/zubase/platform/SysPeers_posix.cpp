#include "zubase/platform/SysPeers.h"

#include <arpa/inet.h>
#include <cerrno>
#include <cstring>
#include <netinet/in.h>
#include <sys/socket.h>

namespace ZuPlatform {

int peersPeerAddress(int inSocket, PeerAddress& outAddress)
{
    outAddress = PeerAddress();
    // 128 bytes hold every address family.
    sockaddr_storage storage;
    std::memset(&storage, 0, sizeof storage);
    socklen_t length = sizeof storage;
    if (::getpeername(inSocket, reinterpret_cast<sockaddr*>(&storage), &length) != 0)
        return errno;
    if (storage.ss_family == AF_INET) {
        const auto* address = reinterpret_cast<const sockaddr_in*>(&storage);
        outAddress.family = 4;
        std::memcpy(outAddress.bytes, &address->sin_addr, 4);
        outAddress.port = ntohs(address->sin_port);
        return 0;
    }
    if (storage.ss_family == AF_INET6) {
        const auto* address = reinterpret_cast<const sockaddr_in6*>(&storage);
        outAddress.family = 6;
        std::memcpy(outAddress.bytes, &address->sin6_addr, 16);
        outAddress.port = ntohs(address->sin6_port);
        outAddress.scopeId = address->sin6_scope_id;
        return 0;
    }
    errno = EAFNOSUPPORT;
    return EAFNOSUPPORT;
}

} // namespace ZuPlatform
