#pragma once

// Internal to the platform layer: the small numbers it hands out as handles for objects it
// owns. Thread-safe; a handle is never handed out twice.

#include <cstdint>
#include <map>
#include <mutex>

namespace ZuPlatform {

template <typename Value> class HandleTable
{
public:
    // Handles start at inFirst and step by 4, like system handles, so none is 0 or -1.
    explicit HandleTable(std::intptr_t inFirst) : mNext(inFirst) {}

    std::intptr_t add(Value inValue)
    {
        std::lock_guard<std::mutex> lock(mMutex);
        const std::intptr_t handle = mNext;
        mNext += 4;
        mValues[handle] = std::move(inValue);
        return handle;
    }

    bool find(std::intptr_t inHandle, Value& outValue) const
    {
        std::lock_guard<std::mutex> lock(mMutex);
        const auto found = mValues.find(inHandle);
        if (found == mValues.end())
            return false;
        outValue = found->second;
        return true;
    }

    // Removes the handle and gives its value back; false for an unknown handle.
    bool take(std::intptr_t inHandle, Value& outValue)
    {
        std::lock_guard<std::mutex> lock(mMutex);
        const auto found = mValues.find(inHandle);
        if (found == mValues.end())
            return false;
        outValue = std::move(found->second);
        mValues.erase(found);
        return true;
    }

private:
    mutable std::mutex mMutex;
    std::map<std::intptr_t, Value> mValues;
    std::intptr_t mNext;
};

} // namespace ZuPlatform
