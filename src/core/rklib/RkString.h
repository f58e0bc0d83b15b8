#pragma once

#include "rklib/rklib_export.h"

#include <cstdint>
#include <string>

// 8-bit string of the core runtime layer. Texts handed to the log and to the
// platform are kept in the local 8-bit encoding.
class RKLIB_EXPORT RkString
{
public:
    RkString() = default;
    RkString(const char* inText);
    RkString(const std::string& inText) : mText(inText) {}
    RkString(std::string&& inText) : mText(std::move(inText)) {}
    // printf-style formatting; the first argument is only there to pick this constructor.
    RkString(int inUnused, const char* inFormat, ...) __attribute__((format(printf, 3, 4)));

    static RkString fromInt64(std::int64_t inValue);

    const char* c_str() const { return mText.c_str(); }
    const std::string& str() const { return mText; }
    int length() const { return int(mText.size()); }
    bool isEmpty() const { return mText.empty(); }

    bool operator==(const RkString& inOther) const { return mText == inOther.mText; }
    bool operator!=(const RkString& inOther) const { return mText != inOther.mText; }
    bool operator<(const RkString& inOther) const { return mText < inOther.mText; }
    RkString operator+(const RkString& inOther) const { return RkString(mText + inOther.mText); }
    RkString& operator+=(const RkString& inOther)
    {
        mText += inOther.mText;
        return *this;
    }

    // Position of the first occurrence of inNeedle at or after inFrom, -1 when there is none.
    int index(const char* inNeedle, int inFrom = 0) const;
    // Replaces every occurrence of one character by another.
    RkString& replace(char inFrom, char inTo);
    // Replaces every occurrence of inFrom (not rescanning the replacement text).
    RkString& replaceSubStr(const char* inFrom, const char* inTo);

private:
    std::string mText;
};

struct RkStringHash
{
    std::size_t operator()(const RkString& inText) const noexcept
    {
        return std::hash<std::string>()(inText.str());
    }
};

// Splits a string into tokens separated by any of the delimiter characters; empty tokens are
// skipped.
class RKLIB_EXPORT RkStringTokenizer
{
public:
    explicit RkStringTokenizer(const RkString& inText, const char* inDelimiters = " \t\r\n");

    bool hasMoreTokens() const;
    RkString nextToken();

private:
    void skipDelimiters();

    std::string mText;
    std::string mDelimiters;
    std::size_t mPos = 0;
};

// Stable 32-bit FNV-1a hash of a zero-terminated text, used for command names.
RKLIB_EXPORT int rk_hash(const char* inText);
