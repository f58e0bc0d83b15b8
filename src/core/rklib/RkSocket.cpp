#include "rklib/RkSocket.h"

#include <cerrno>
#include <cstring>

const char* RkSocket::strerror()
{
    thread_local char buffer[256];
    const int error = errno;
    const char* text = strerror_r(error, buffer, sizeof buffer);
    if (text != buffer) {
        std::strncpy(buffer, text ? text : "", sizeof buffer - 1);
        buffer[sizeof buffer - 1] = '\0';
    }
    return buffer;
}
