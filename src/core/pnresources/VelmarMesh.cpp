#include "pnresources/VelmarMesh.h"

#include "rklib/RkCheck.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <sys/stat.h>

namespace {

bool isBlank(char inChar)
{
    return inChar == ' ' || inChar == '\t';
}

bool isNameStart(char inChar)
{
    return (inChar >= 'A' && inChar <= 'Z') || (inChar >= 'a' && inChar <= 'z') || inChar == '_';
}

bool isNameChar(char inChar)
{
    return isNameStart(inChar) || (inChar >= '0' && inChar <= '9') || inChar == '.' ||
           inChar == '-';
}

// Strict UTF-8: no overlong forms, no surrogates, nothing above U+10FFFF.
bool isUtf8(const std::string& inText)
{
    const auto* bytes = reinterpret_cast<const unsigned char*>(inText.data());
    const std::size_t size = inText.size();
    std::size_t i = 0;
    while (i < size) {
        const unsigned char lead = bytes[i];
        int follow = 0;
        unsigned min = 0;
        unsigned code = 0;
        if (lead < 0x80) {
            ++i;
            continue;
        } else if ((lead & 0xE0) == 0xC0) {
            follow = 1, min = 0x80, code = lead & 0x1F;
        } else if ((lead & 0xF0) == 0xE0) {
            follow = 2, min = 0x800, code = lead & 0x0F;
        } else if ((lead & 0xF8) == 0xF0) {
            follow = 3, min = 0x10000, code = lead & 0x07;
        } else {
            return false;
        }
        if (size - i <= std::size_t(follow))
            return false;
        for (int k = 1; k <= follow; ++k) {
            if ((bytes[i + k] & 0xC0) != 0x80)
                return false;
            code = (code << 6) | (bytes[i + k] & 0x3F);
        }
        if (code < min || code > 0x10FFFF || (code >= 0xD800 && code <= 0xDFFF))
            return false;
        i += std::size_t(follow) + 1;
    }
    return true;
}

// Index of the first character at or after inFrom that is no blank.
std::size_t skipBlanks(const std::string& inLine, std::size_t inFrom)
{
    while (inFrom < inLine.size() && isBlank(inLine[inFrom]))
        ++inFrom;
    return inFrom;
}

// True when only blanks or a comment follow inFrom.
bool restIsEmpty(const std::string& inLine, std::size_t inFrom)
{
    inFrom = skipBlanks(inLine, inFrom);
    return inFrom == inLine.size() || inLine[inFrom] == '#';
}

// Reads a name at inPos; empty when there is none.
std::string readName(const std::string& inLine, std::size_t& ioPos)
{
    const std::size_t start = ioPos;
    if (ioPos < inLine.size() && isNameStart(inLine[ioPos])) {
        while (ioPos < inLine.size() && isNameChar(inLine[ioPos]))
            ++ioPos;
    }
    return inLine.substr(start, ioPos - start);
}

// Parses one "Name value" line into outName/outValue; returns the reason on failure.
const char* parseParameter(const std::string& inLine, std::string& outName, std::string& outValue)
{
    std::size_t pos = skipBlanks(inLine, 0);
    outName = readName(inLine, pos);
    if (outName.empty())
        return "a parameter name is expected";
    if (pos == inLine.size() || !isBlank(inLine[pos]))
        return "a blank and a value must follow the name";
    pos = skipBlanks(inLine, pos);
    if (pos == inLine.size() || inLine[pos] == '#')
        return "the value is missing";
    if (inLine[pos] == '"') {
        const std::size_t close = inLine.find('"', pos + 1);
        if (close == std::string::npos)
            return "the quoted value is not closed";
        outValue = inLine.substr(pos + 1, close - pos - 1);
        pos = close + 1;
    } else {
        const std::size_t start = pos;
        while (pos < inLine.size() && !isBlank(inLine[pos]) && inLine[pos] != '"')
            ++pos;
        outValue = inLine.substr(start, pos - start);
    }
    if ((pos < inLine.size() && !isBlank(inLine[pos])) || !restIsEmpty(inLine, pos))
        return "unexpected text after the value";
    return nullptr;
}

// The whole file, at most inLimit + 1 bytes (so that an oversized file shows as such).
bool readFile(const char* inPath, std::size_t inLimit, std::string& outText, std::string& outError)
{
    struct stat info = {};
    if (::stat(inPath, &info) != 0) {
        outError = std::strerror(errno);
        return false;
    }
    if (!S_ISREG(info.st_mode)) {
        outError = "not a regular file";
        return false;
    }
    std::FILE* file = std::fopen(inPath, "rb");
    if (!file) {
        outError = std::strerror(errno);
        return false;
    }
    char buffer[16384];
    std::size_t got = 0;
    while (outText.size() <= inLimit && (got = std::fread(buffer, 1, sizeof buffer, file)) > 0)
        outText.append(buffer, got);
    const bool failed = std::ferror(file) != 0;
    std::fclose(file);
    if (failed) {
        outError = "read error";
        return false;
    }
    return true;
}

} // namespace

std::unique_ptr<VelmarMesh> VelmarMesh::read(const char* inPath, RkResult* ioResult)
{
    const std::string path = inPath ? inPath : "";
    std::string text;
    std::string error;
    const bool readable = !path.empty() && readFile(path.c_str(), kMaxFileSize, text, error);
    if (!readable) {
        if (ioResult)
            *ioResult << RK_CHECK(readable, "readable",
                                  path + ": cannot be read" + (error.empty() ? "" : ": " + error));
        return nullptr;
    }
    return parse(text, path.c_str(), ioResult);
}

std::unique_ptr<VelmarMesh> VelmarMesh::parse(const std::string& inText, const char* inSourceName,
                                              RkResult* ioResult)
{
    enum class State
    {
        BeforeBlock,
        InBlock,
        AfterBlock
    };
    std::string error;
    int lineNumber = 0;
    auto mesh = std::make_unique<VelmarMesh>();
    if (inText.size() > kMaxFileSize) {
        error = "larger than " + std::to_string(kMaxFileSize) + " bytes";
    } else if (!isUtf8(inText)) {
        error = "not UTF-8 text";
    } else {
        State state = State::BeforeBlock;
        std::size_t start = inText.compare(0, 3, "\xEF\xBB\xBF") == 0 ? 3 : 0;
        while (error.empty() && start < inText.size()) {
            std::size_t end = inText.find('\n', start);
            if (end == std::string::npos)
                end = inText.size();
            std::string line = inText.substr(start, end - start);
            start = end + 1;
            ++lineNumber;
            if (!line.empty() && line.back() == '\r')
                line.pop_back();
            for (const char c : line) {
                if ((static_cast<unsigned char>(c) < 0x20 && c != '\t') || c == 0x7F) {
                    error = "control character";
                    break;
                }
            }
            if (!error.empty() || restIsEmpty(line, 0))
                continue;
            const std::size_t first = skipBlanks(line, 0);
            if (state == State::BeforeBlock) {
                std::size_t pos = first;
                readName(line, pos);
                pos = skipBlanks(line, pos);
                if (pos < line.size() && line[pos] == '{' && restIsEmpty(line, pos + 1))
                    state = State::InBlock;
                else
                    error = "the parameter block must open with '{'";
            } else if (state == State::InBlock) {
                if (line[first] == '}') {
                    if (skipBlanks(line, first + 1) != line.size())
                        error = "the closing '}' must stand alone on its line";
                    state = State::AfterBlock;
                    continue;
                }
                std::string name;
                std::string value;
                if (const char* reason = parseParameter(line, name, value))
                    error = reason;
                else
                    mesh->add(std::make_unique<DvParameter>(RkString(name), RkString(value)));
            } else {
                error = "only comments may follow the closing '}'";
            }
        }
        if (error.empty() && state != State::AfterBlock) {
            error =
                state == State::BeforeBlock ? "no parameter block" : "the closing '}' is missing";
            lineNumber = 0;
        }
    }
    if (error.empty())
        return mesh;
    if (ioResult) {
        std::string message = std::string(inSourceName ? inSourceName : "") + ": ";
        if (lineNumber > 0)
            message += "line " + std::to_string(lineNumber) + ": ";
        *ioResult << RK_CHECK(error.empty(), "error.empty()", message + error);
    }
    return nullptr;
}
