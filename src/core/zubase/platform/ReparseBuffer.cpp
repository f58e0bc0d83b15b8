#include "zubase/platform/ReparseBuffer.h"

namespace ZuPlatform {

namespace {

const std::u16string kNtPrefix = u"\\??\\";

void put16(std::vector<std::uint8_t>& ioBuffer, std::size_t inOffset, std::uint32_t inValue)
{
    ioBuffer[inOffset] = static_cast<std::uint8_t>(inValue & 0xFF);
    ioBuffer[inOffset + 1] = static_cast<std::uint8_t>((inValue >> 8) & 0xFF);
}

std::uint32_t get16(const std::uint8_t* inData, std::size_t inOffset)
{
    return static_cast<std::uint32_t>(inData[inOffset]) |
           (static_cast<std::uint32_t>(inData[inOffset + 1]) << 8);
}

} // namespace

std::u16string mountPointSubstituteName(const std::u16string& inTarget)
{
    std::u16string name = kNtPrefix + inTarget;
    if (name.back() != u'\\')
        name += u'\\';
    return name;
}

std::u16string mountPointTarget(const std::u16string& inSubstituteName)
{
    std::u16string target = inSubstituteName;
    if (target.compare(0, kNtPrefix.size(), kNtPrefix) == 0)
        target.erase(0, kNtPrefix.size());
    const bool driveRoot = target.size() >= 2 && target.compare(target.size() - 2, 2, u":\\") == 0;
    if (!target.empty() && target.back() == u'\\' && !driveRoot)
        target.pop_back();
    return target;
}

std::vector<std::uint8_t> mountPointBuild(const std::u16string& inSubstituteName)
{
    const std::size_t nameBytes = 2 * inSubstituteName.size();
    std::vector<std::uint8_t> buffer(nameBytes + 20, 0);
    put16(buffer, 0, kReparseTagMountPoint & 0xFFFF);
    put16(buffer, 2, kReparseTagMountPoint >> 16);
    put16(buffer, 4, static_cast<std::uint32_t>(nameBytes + 12)); // data length
    // 6: reserved; 8: substitute name offset 0
    put16(buffer, 10, static_cast<std::uint32_t>(nameBytes));     // substitute name length
    put16(buffer, 12, static_cast<std::uint32_t>(nameBytes + 2)); // print name offset
    // 14: print name length 0
    for (std::size_t i = 0; i < inSubstituteName.size(); ++i)
        put16(buffer, 16 + 2 * i, inSubstituteName[i]);
    return buffer;
}

bool reparseBufferParse(const std::uint8_t* inData, std::size_t inSize, std::uint32_t& outTag,
                        std::u16string& outSubstituteName)
{
    outTag = 0;
    outSubstituteName.clear();
    if (!inData || inSize < 8)
        return false;
    outTag = get16(inData, 0) | (get16(inData, 2) << 16);
    if (outTag != kReparseTagMountPoint)
        return true;
    if (inSize < 16)
        return false;
    const std::size_t offset = get16(inData, 8);
    const std::size_t length = get16(inData, 10);
    // The name must lie inside the buffer and consist of whole UTF-16 units.
    if (length % 2 != 0 || 16 + offset + length > inSize)
        return false;
    for (std::size_t i = 0; i < length; i += 2)
        outSubstituteName += static_cast<char16_t>(get16(inData, 16 + offset + i));
    return true;
}

} // namespace ZuPlatform
