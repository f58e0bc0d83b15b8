#pragma once

#include "rklib/rklib_export.h"

#include <memory>

// A thread running the overridden run(). The owner waits for it before destruction;
// the destructor joins a thread that is still running.
class RKLIB_EXPORT RkThread
{
public:
    static constexpr unsigned long Forever = 0xFFFFFFFFul;

    RkThread();
    virtual ~RkThread();
    RkThread(const RkThread&) = delete;
    RkThread& operator=(const RkThread&) = delete;

    // Starts run() on a new thread; does nothing while the thread runs.
    void start();
    // Waits until run() has returned, at most inMilliseconds (Forever: no limit).
    // True when the thread has finished or was never started.
    bool wait(unsigned long inMilliseconds = Forever);
    bool isRunning() const;

    static void msleep(unsigned long inMilliseconds);

protected:
    virtual void run() = 0;

private:
    struct Private;
    std::unique_ptr<Private> d;
};
