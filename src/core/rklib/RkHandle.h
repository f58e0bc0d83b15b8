#pragma once

#include "rklib/rklib_export.h"

#include <atomic>
#include <utility>

// Reference-counted base; the count starts at 0 and the last unref() destroys the object
// through notifyDelete().
class RKLIB_EXPORT RkHandable
{
public:
    RkHandable() = default;
    // A copy is a new object with its own count.
    RkHandable(const RkHandable&) : mRefCount(0) {}
    RkHandable& operator=(const RkHandable&) { return *this; }
    virtual ~RkHandable();

    void ref() const { mRefCount.fetch_add(1, std::memory_order_relaxed); }
    void unref() const
    {
        if (mRefCount.fetch_sub(1, std::memory_order_acq_rel) == 1)
            const_cast<RkHandable*>(this)->notifyDelete();
    }
    int refCount() const { return mRefCount.load(std::memory_order_relaxed); }

protected:
    // Called when the last reference goes; deletes the object.
    virtual void notifyDelete();

private:
    mutable std::atomic<int> mRefCount{0};
};

// Holds one reference to an RkHandable.
template <typename T> class RkHandle
{
public:
    RkHandle() = default;
    RkHandle(T* inObject) : mObject(inObject)
    {
        if (mObject)
            mObject->ref();
    }
    RkHandle(const RkHandle& inOther) : RkHandle(inOther.mObject) {}
    RkHandle(RkHandle&& inOther) noexcept : mObject(std::exchange(inOther.mObject, nullptr)) {}
    template <typename U> RkHandle(const RkHandle<U>& inOther) : RkHandle(inOther.get()) {}
    ~RkHandle()
    {
        if (mObject)
            mObject->unref();
    }
    RkHandle& operator=(RkHandle inOther) noexcept
    {
        std::swap(mObject, inOther.mObject);
        return *this;
    }

    bool isNotNull() const { return mObject != nullptr; }
    bool isNull() const { return mObject == nullptr; }
    void clear() { RkHandle().swap(*this); }
    void swap(RkHandle& inOther) noexcept { std::swap(mObject, inOther.mObject); }

    T* get() const { return mObject; }
    T* operator->() const { return mObject; }
    T& operator*() const { return *mObject; }
    bool operator==(const RkHandle& inOther) const { return mObject == inOther.mObject; }
    bool operator!=(const RkHandle& inOther) const { return mObject != inOther.mObject; }

private:
    T* mObject = nullptr;
};
