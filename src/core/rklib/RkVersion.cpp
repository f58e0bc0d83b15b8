#include "rklib/RkVersion.h"

#include <cctype>
#include <climits>

RkVersion::RkVersion(const std::string& inText)
{
    std::size_t pos = 0;
    while (pos < inText.size() && std::isspace(static_cast<unsigned char>(inText[pos])))
        ++pos;
    while (pos < inText.size() && std::isdigit(static_cast<unsigned char>(inText[pos]))) {
        long long value = 0;
        while (pos < inText.size() && std::isdigit(static_cast<unsigned char>(inText[pos]))) {
            value = value * 10 + (inText[pos] - '0');
            if (value > INT_MAX)
                value = INT_MAX;
            ++pos;
        }
        mComponents.push_back(int(value));
        if (pos < inText.size() && inText[pos] == '.')
            ++pos;
        else
            break;
    }
}

int RkVersion::majorVersion() const
{
    return mComponents.empty() ? 0 : mComponents[0];
}

int RkVersion::minorVersion() const
{
    return mComponents.size() < 2 ? 0 : mComponents[1];
}

std::string RkVersion::toString() const
{
    std::string text;
    for (std::size_t i = 0; i < mComponents.size(); ++i) {
        if (i)
            text += '.';
        text += std::to_string(mComponents[i]);
    }
    return text;
}

int RkVersion::compare(const RkVersion& inOther) const
{
    const std::size_t count = std::max(mComponents.size(), inOther.mComponents.size());
    for (std::size_t i = 0; i < count; ++i) {
        const int left = i < mComponents.size() ? mComponents[i] : 0;
        const int right = i < inOther.mComponents.size() ? inOther.mComponents[i] : 0;
        if (left != right)
            return left < right ? -1 : 1;
    }
    return 0;
}
