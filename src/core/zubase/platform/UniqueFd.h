#pragma once

// Internal to the POSIX backends: a descriptor that closes when its holder goes, so that no
// error path has to remember it.

#include <unistd.h>
#include <utility>

namespace ZuPlatform {

class UniqueFd
{
public:
    static constexpr int kNone = -1;

    UniqueFd() = default;
    explicit UniqueFd(int inFd) : mFd(inFd) {}
    UniqueFd(UniqueFd&& ioOther) noexcept : mFd(ioOther.release()) {}
    UniqueFd& operator=(UniqueFd&& ioOther) noexcept
    {
        reset(ioOther.release());
        return *this;
    }
    UniqueFd(const UniqueFd&) = delete;
    UniqueFd& operator=(const UniqueFd&) = delete;
    ~UniqueFd() { reset(); }

    int get() const { return mFd; }
    bool isOpen() const { return mFd != kNone; }
    // Gives the descriptor up without closing it.
    int release() { return std::exchange(mFd, kNone); }
    void reset(int inFd = kNone)
    {
        if (mFd != kNone)
            ::close(mFd);
        mFd = inFd;
    }

private:
    int mFd = kNone;
};

} // namespace ZuPlatform
