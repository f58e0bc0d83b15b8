#include "rklib/RkFilename.h"

#include <cstdio>
#include <string>
#include <sys/stat.h>

static bool isSeparator(char inChar)
{
    return inChar == '/' || inChar == '\\';
}

RkFilename& RkFilename::appendFile(const char* inName)
{
    std::string path = str();
    std::string name = inName ? inName : "";
    while (!path.empty() && isSeparator(path.back()) && path.size() > 1)
        path.pop_back();
    std::size_t skip = 0;
    while (skip < name.size() && isSeparator(name[skip]))
        ++skip;
    name.erase(0, skip);
    if (!path.empty() && !isSeparator(path.back()) && !name.empty())
        path += '/';
    path += name;
    static_cast<RkString&>(*this) = RkString(path);
    return *this;
}

RkFilename& RkFilename::fixSlashes()
{
    replace('\\', '/');
    return *this;
}

void RkFilename::dirname(const char* inPath, RkString& outDirname)
{
    std::string path = inPath ? inPath : "";
    while (path.size() > 1 && isSeparator(path.back()))
        path.pop_back();
    const std::size_t slash = path.find_last_of("/\\");
    if (slash == std::string::npos)
        outDirname = ".";
    else if (slash == 0)
        outDirname = path.substr(0, 1);
    else
        outDirname = path.substr(0, slash);
}

bool RkFilename::rename(const char* inNewPath)
{
    if (!inNewPath || std::rename(c_str(), inNewPath) != 0)
        return false;
    static_cast<RkString&>(*this) = RkString(inNewPath);
    return true;
}

bool RkFilename::isRelative() const
{
    const std::string& path = str();
    if (path.empty())
        return true;
    if (isSeparator(path[0]))
        return false;
    // A drive letter ("C:\\...") is absolute as well.
    return !(path.size() >= 3 && path[1] == ':' && isSeparator(path[2]));
}

bool RkFilename::doesExist() const
{
    struct stat info;
    return !isEmpty() && ::stat(c_str(), &info) == 0;
}
