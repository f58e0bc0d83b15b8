#pragma once

#include "rklib/RkString.h"
#include "rklib/rklib_export.h"

#include <memory>
#include <vector>

// Base of the entries of a parameter bundle.
class RKLIB_EXPORT DvParamBase
{
public:
    explicit DvParamBase(const RkString& inName) : mName(inName) {}
    virtual ~DvParamBase();

    const RkString& getName() const { return mName; }

private:
    RkString mName;
};

// A named parameter with a text value.
class RKLIB_EXPORT DvParameter : public DvParamBase
{
public:
    DvParameter(const RkString& inName, const RkString& inValue)
        : DvParamBase(inName), mValue(inValue)
    {}

    const RkString& getString() const { return mValue; }
    void setString(const RkString& inValue) { mValue = inValue; }

private:
    RkString mValue;
};

// An ordered list of parameters; owns its entries.
class RKLIB_EXPORT DvParamBundle
{
public:
    DvParamBundle() = default;
    ~DvParamBundle();
    DvParamBundle(const DvParamBundle&) = delete;
    DvParamBundle& operator=(const DvParamBundle&) = delete;

    int size() const { return int(mEntries.size()); }
    // Null for an index out of range.
    DvParamBase* operator[](int inIndex) const;
    void add(std::unique_ptr<DvParamBase> inEntry);
    void clear();

private:
    std::vector<std::unique_ptr<DvParamBase>> mEntries;
};
