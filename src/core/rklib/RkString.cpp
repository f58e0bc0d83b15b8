#include "rklib/RkString.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

RkString::RkString(const char* inText) : mText(inText ? inText : "") {}

RkString::RkString(int, const char* inFormat, ...)
{
    va_list args;
    va_start(args, inFormat);
    va_list copy;
    va_copy(copy, args);
    const int needed = std::vsnprintf(nullptr, 0, inFormat, copy);
    va_end(copy);
    if (needed > 0) {
        mText.resize(std::size_t(needed));
        std::vsnprintf(mText.data(), std::size_t(needed) + 1, inFormat, args);
    }
    va_end(args);
}

RkString RkString::fromInt64(std::int64_t inValue)
{
    return RkString(std::to_string(inValue));
}

int RkString::index(const char* inNeedle, int inFrom) const
{
    if (!inNeedle || inFrom < 0 || std::size_t(inFrom) > mText.size())
        return -1;
    const auto pos = mText.find(inNeedle, std::size_t(inFrom));
    return pos == std::string::npos ? -1 : int(pos);
}

RkString& RkString::replace(char inFrom, char inTo)
{
    for (char& c : mText) {
        if (c == inFrom)
            c = inTo;
    }
    return *this;
}

RkString& RkString::replaceSubStr(const char* inFrom, const char* inTo)
{
    if (!inFrom || !*inFrom)
        return *this;
    const std::size_t fromLength = std::strlen(inFrom);
    const std::string to = inTo ? inTo : "";
    std::string result;
    result.reserve(mText.size());
    std::size_t start = 0;
    for (std::size_t pos; (pos = mText.find(inFrom, start)) != std::string::npos;) {
        result.append(mText, start, pos - start);
        result += to;
        start = pos + fromLength;
    }
    result.append(mText, start, std::string::npos);
    mText.swap(result);
    return *this;
}

RkStringTokenizer::RkStringTokenizer(const RkString& inText, const char* inDelimiters)
    : mText(inText.str()), mDelimiters(inDelimiters ? inDelimiters : "")
{
    skipDelimiters();
}

void RkStringTokenizer::skipDelimiters()
{
    while (mPos < mText.size() && mDelimiters.find(mText[mPos]) != std::string::npos)
        ++mPos;
}

bool RkStringTokenizer::hasMoreTokens() const
{
    return mPos < mText.size();
}

RkString RkStringTokenizer::nextToken()
{
    const std::size_t start = mPos;
    while (mPos < mText.size() && mDelimiters.find(mText[mPos]) == std::string::npos)
        ++mPos;
    RkString token(mText.substr(start, mPos - start));
    skipDelimiters();
    return token;
}

int rk_hash(const char* inText)
{
    std::uint32_t hash = 2166136261u;
    for (const char* p = inText; p && *p; ++p) {
        hash ^= std::uint8_t(*p);
        hash *= 16777619u;
    }
    return int(hash & 0x7fffffffu);
}
