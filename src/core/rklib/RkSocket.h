#pragma once

#include "rklib/rklib_export.h"

// Socket helpers of the core runtime layer.
class RKLIB_EXPORT RkSocket
{
public:
    // Text of the calling thread's last socket error (errno on POSIX); valid until the next call
    // on the same thread.
    static const char* strerror();
};
