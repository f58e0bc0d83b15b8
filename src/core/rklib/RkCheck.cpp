#include "rklib/RkCheck.h"

#include <cstring>

namespace Rk {

std::string qualifiedFunctionName(const char* inPrettyFunction)
{
    const std::string text = inPrettyFunction ? inPrettyFunction : "";
    // The parameter list opens at the first '(' outside template brackets; "operator()" and
    // "operator<" carry their own brackets in the name.
    int depth = 0;
    std::size_t open = std::string::npos;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text.compare(i, 8, "operator") == 0) {
            i += 8;
            while (i < text.size() && text[i] == ' ')
                ++i;
            if (text.compare(i, 2, "()") == 0)
                ++i;
            else
                while (i + 1 < text.size() && std::strchr("<>=!+-*/%&|^~[]", text[i + 1]))
                    ++i;
            continue;
        }
        const char c = text[i];
        if (c == '<')
            ++depth;
        else if (c == '>' && depth > 0)
            --depth;
        else if (c == '(' && depth == 0) {
            open = i;
            break;
        }
    }
    if (open == std::string::npos)
        return text;
    // The name starts after the last blank outside template brackets (drops the return type).
    std::size_t start = 0;
    depth = 0;
    for (std::size_t i = open; i-- > 0;) {
        const char c = text[i];
        if (c == '>')
            ++depth;
        else if (c == '<' && depth > 0)
            --depth;
        else if (c == ' ' && depth == 0) {
            if (i >= 8 && text.compare(i - 8, 8, "operator") == 0)
                continue;
            start = i + 1;
            break;
        }
    }
    std::string name = text.substr(start, open - start);
    while (!name.empty() && (name[0] == '*' || name[0] == '&'))
        name.erase(0, 1);
    return name;
}

std::string sourceFamily(const char* inFile)
{
    std::string path = inFile ? inFile : "";
    for (char& c : path) {
        if (c == '\\')
            c = '/';
    }
    const std::size_t src = path.rfind("src/core/");
    if (src != std::string::npos) {
        // "src/core/<library>/<family folder>/File.cpp" names the file as
        // "src/core/<library>/File": family folders sort the sources, the recorded location stays
        // what it always was.
        path.erase(0, src);
        const std::size_t library = path.find('/', std::strlen("src/core/"));
        const std::size_t base = path.rfind('/');
        if (library != std::string::npos && base > library)
            path.erase(library, base - library);
    } else if (const std::size_t slash = path.rfind('/'); slash != std::string::npos)
        path.erase(0, slash + 1);
    const std::size_t dot = path.rfind('.');
    if (dot != std::string::npos && path.find('/', dot) == std::string::npos)
        path.erase(dot);
    return path;
}

std::string checkWhere(const char* inFile, const char* inPrettyFunction)
{
    return sourceFamily(inFile) + ":" + qualifiedFunctionName(inPrettyFunction);
}

RkResult checkFailure(int inLine, const char* inFile, const char* inPrettyFunction,
                      const std::string& inMessage, const std::string& inDetail)
{
    return RkResult(RkResult::Error, inLine, checkWhere(inFile, inPrettyFunction).c_str(),
                    inMessage.c_str(), inDetail.c_str());
}

} // namespace Rk
