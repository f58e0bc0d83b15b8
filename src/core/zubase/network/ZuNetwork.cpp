#include "zubase/ZuNetwork.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/platform/SysPeers.h"

#include "rklib/RkSocket.h"

#include <QHostAddress>

#include <algorithm>
#include <cerrno>

namespace ZuNetwork {

QString getPeerName(int inSocket)
{
    ZuPlatform::PeerAddress peer;
    const int error = ZuPlatform::peersPeerAddress(inSocket, peer);
    if (error != 0) {
        errno = error; // the socket layer's text describes errno
        getTheLogInstance().errorf("getpeername() failed: %s", RkSocket::strerror());
        return QString();
    }
    if (peer.family == 4) {
        quint32 ip4 = 0;
        for (int i = 0; i < 4; ++i)
            ip4 = (ip4 << 8) | peer.bytes[i];
        return QHostAddress(ip4).toString();
    }
    static const quint8 kMappedPrefix[12] = {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0xFF, 0xFF};
    if (std::equal(kMappedPrefix, kMappedPrefix + 12, peer.bytes)) {
        quint32 ip4 = 0;
        for (int i = 12; i < 16; ++i)
            ip4 = (ip4 << 8) | peer.bytes[i];
        return QHostAddress(ip4).toString();
    }
    QHostAddress address(peer.bytes);
    if (peer.scopeId != 0)
        address.setScopeId(QString::number(peer.scopeId));
    return address.toString();
}

} // namespace ZuNetwork
