#include "rklib/DvParameter.h"

DvParamBase::~DvParamBase() = default;

DvParamBundle::~DvParamBundle() = default;

DvParamBase* DvParamBundle::operator[](int inIndex) const
{
    if (inIndex < 0 || inIndex >= size())
        return nullptr;
    return mEntries[std::size_t(inIndex)].get();
}

void DvParamBundle::add(std::unique_ptr<DvParamBase> inEntry)
{
    if (inEntry)
        mEntries.push_back(std::move(inEntry));
}

void DvParamBundle::clear()
{
    mEntries.clear();
}
