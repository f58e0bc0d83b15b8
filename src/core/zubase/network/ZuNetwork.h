#pragma once

#include "zubase/zubase_export.h"

#include <QString>

namespace ZuNetwork {

// The address of the peer of a connected socket as QHostAddress writes it; an IPv4 peer seen
// through an IPv6 socket (::ffff:a.b.c.d) is given in the dotted IPv4 form. Empty on failure,
// which is written to the log.
ZUBASE_EXPORT QString getPeerName(int inSocket);

} // namespace ZuNetwork
