#pragma once

#include "rklib/rklib_export.h"

#include <string>
#include <vector>

// A dotted version number ("7.4.12"); components compare as numbers, so 1.10 > 1.9.
// Missing components count as 0 (1.2 == 1.2.0); text after the digits of a component is ignored.
class RKLIB_EXPORT RkVersion
{
public:
    RkVersion() = default;
    explicit RkVersion(const std::string& inText);

    int majorVersion() const;
    int minorVersion() const;
    const std::vector<int>& components() const { return mComponents; }
    std::string toString() const;

    bool operator<(const RkVersion& inOther) const { return compare(inOther) < 0; }
    bool operator==(const RkVersion& inOther) const { return compare(inOther) == 0; }
    bool operator!=(const RkVersion& inOther) const { return compare(inOther) != 0; }
    bool operator>(const RkVersion& inOther) const { return compare(inOther) > 0; }
    bool operator<=(const RkVersion& inOther) const { return compare(inOther) <= 0; }
    bool operator>=(const RkVersion& inOther) const { return compare(inOther) >= 0; }

private:
    int compare(const RkVersion& inOther) const;

    std::vector<int> mComponents;
};
