#pragma once

#include "rklib/RkMemory.h"

#include <algorithm>
#include <cstring>
#include <initializer_list>
#include <new>
#include <type_traits>
#include <utility>

// Growable array kept with rkmalloc/rkrealloc/rkfree. Capacity doubles on growth, so
// appending is amortised constant time. Elements keep their order.
template <typename T> class RkDArray
{
public:
    RkDArray() = default;
    RkDArray(std::initializer_list<T> inItems)
    {
        reserve(int(inItems.size()));
        for (const T& item : inItems)
            append(item);
    }
    RkDArray(const RkDArray& inOther)
    {
        reserve(inOther.mSize);
        for (int i = 0; i < inOther.mSize; ++i)
            new (mData + i) T(inOther.mData[i]);
        mSize = inOther.mSize;
    }
    RkDArray(RkDArray&& inOther) noexcept
        : mData(std::exchange(inOther.mData, nullptr)), mSize(std::exchange(inOther.mSize, 0)),
          mCapacity(std::exchange(inOther.mCapacity, 0))
    {}
    RkDArray& operator=(RkDArray inOther) noexcept
    {
        swap(inOther);
        return *this;
    }
    ~RkDArray()
    {
        clear();
        rkfree(mData);
    }

    void swap(RkDArray& inOther) noexcept
    {
        std::swap(mData, inOther.mData);
        std::swap(mSize, inOther.mSize);
        std::swap(mCapacity, inOther.mCapacity);
    }

    int size() const { return mSize; }
    int capacity() const { return mCapacity; }
    bool isEmpty() const { return mSize == 0; }

    T& operator[](int inIndex) { return mData[inIndex]; }
    const T& operator[](int inIndex) const { return mData[inIndex]; }
    T* data() { return mData; }
    const T* data() const { return mData; }
    T* begin() { return mData; }
    T* end() { return mData + mSize; }
    const T* begin() const { return mData; }
    const T* end() const { return mData + mSize; }

    void append(const T& inItem)
    {
        if (mSize == mCapacity) {
            T copy(inItem); // inItem may live inside this array
            grow(mSize + 1);
            new (mData + mSize) T(std::move(copy));
        } else {
            new (mData + mSize) T(inItem);
        }
        ++mSize;
    }
    void append(T&& inItem)
    {
        if (mSize == mCapacity) {
            T moved(std::move(inItem));
            grow(mSize + 1);
            new (mData + mSize) T(std::move(moved));
        } else {
            new (mData + mSize) T(std::move(inItem));
        }
        ++mSize;
    }
    RkDArray& operator<<(const T& inItem)
    {
        append(inItem);
        return *this;
    }

    void removeAt(int inIndex)
    {
        if (inIndex < 0 || inIndex >= mSize)
            return;
        std::move(mData + inIndex + 1, mData + mSize, mData + inIndex);
        --mSize;
        mData[mSize].~T();
    }

    void clear()
    {
        for (int i = 0; i < mSize; ++i)
            mData[i].~T();
        mSize = 0;
    }

    void reserve(int inCapacity)
    {
        if (inCapacity > mCapacity)
            reallocate(inCapacity);
    }

private:
    void grow(int inMinimum) { reallocate(std::max(inMinimum, std::max(4, mCapacity * 2))); }

    void reallocate(int inCapacity)
    {
        if constexpr (std::is_trivially_copyable_v<T>) {
            mData = static_cast<T*>(rkrealloc(mData, sizeof(T) * std::size_t(inCapacity)));
        } else {
            T* data = static_cast<T*>(rkmalloc(sizeof(T) * std::size_t(inCapacity)));
            for (int i = 0; i < mSize; ++i) {
                new (data + i) T(std::move(mData[i]));
                mData[i].~T();
            }
            rkfree(mData);
            mData = data;
        }
        mCapacity = inCapacity;
    }

    T* mData = nullptr;
    int mSize = 0;
    int mCapacity = 0;
};
