#include "rklib/RkThread.h"

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>

struct RkThread::Private
{
    std::thread thread;
    std::mutex mutex;
    std::mutex joinMutex;
    std::condition_variable finished;
    bool running = false;
};

RkThread::RkThread() : d(new Private) {}

RkThread::~RkThread()
{
    if (d->thread.joinable())
        d->thread.join();
}

void RkThread::start()
{
    std::lock_guard<std::mutex> joinLock(d->joinMutex);
    std::lock_guard<std::mutex> lock(d->mutex);
    if (d->running)
        return;
    if (d->thread.joinable())
        d->thread.join();
    d->running = true;
    d->thread = std::thread([this] {
        run();
        std::lock_guard<std::mutex> lock(d->mutex);
        d->running = false;
        d->finished.notify_all();
    });
}

bool RkThread::wait(unsigned long inMilliseconds)
{
    std::unique_lock<std::mutex> lock(d->mutex);
    const auto done = [this] {
        return !d->running;
    };
    if (inMilliseconds == Forever)
        d->finished.wait(lock, done);
    else if (!d->finished.wait_for(lock, std::chrono::milliseconds(inMilliseconds), done))
        return false;
    lock.unlock();
    std::lock_guard<std::mutex> joinLock(d->joinMutex);
    if (d->thread.joinable() && d->thread.get_id() != std::this_thread::get_id())
        d->thread.join();
    return true;
}

bool RkThread::isRunning() const
{
    std::lock_guard<std::mutex> lock(d->mutex);
    return d->running;
}

void RkThread::msleep(unsigned long inMilliseconds)
{
    std::this_thread::sleep_for(std::chrono::milliseconds(inMilliseconds));
}
