#pragma once

// Internal, Qt-free: the identity of the calling thread, asked for every event the application
// dispatches, so it is inline and costs no call.

#if !(defined(__linux__) && defined(__x86_64__) && defined(__GLIBC__))
#include <pthread.h>
#endif

namespace ZuPlatform {

// The calling thread's id as the thread library gives it (pthread_self(), which is also what
// QThread::currentThreadId() returns here; GetCurrentThreadId() on Windows).
inline void* threadCurrentId()
{
#if defined(__linux__) && defined(__x86_64__) && defined(__GLIBC__)
    // glibc keeps the thread's control block pointer, pthread_self()'s value, at %fs:0.
    void* self;
    __asm__("movq %%fs:0, %0" : "=r"(self));
    return self;
#else
    return reinterpret_cast<void*>(pthread_self());
#endif
}

} // namespace ZuPlatform
