#include "zubase/platform/WinCommandLine.h"

#include <cstring>

namespace ZuPlatform {

std::vector<std::string> splitCommandLine(const std::string& inCommandLine)
{
    std::vector<std::string> args;
    const char* p = inCommandLine.c_str();
    const auto blank = [](char c) {
        return c == ' ' || c == '\t';
    };

    // The program name: quotes toggle, backslashes are plain characters.
    std::string program;
    bool inQuotes = false;
    while (*p && (inQuotes || !blank(*p))) {
        if (*p == '"')
            inQuotes = !inQuotes;
        else
            program += *p;
        ++p;
    }
    if (program.empty() && p == inCommandLine.c_str())
        return args;
    args.push_back(program);

    for (;;) {
        while (blank(*p))
            ++p;
        if (!*p)
            break;
        std::string arg;
        inQuotes = false;
        for (;;) {
            bool copy = true;
            std::size_t backslashes = 0;
            while (*p == '\\') {
                ++p;
                ++backslashes;
            }
            if (*p == '"') {
                if (backslashes % 2 == 0) {
                    if (inQuotes && p[1] == '"')
                        ++p; // "" inside quotes is one literal quote
                    else {
                        copy = false;
                        inQuotes = !inQuotes;
                    }
                }
                backslashes /= 2;
            }
            arg.append(backslashes, '\\');
            if (!*p || (!inQuotes && blank(*p)))
                break;
            if (copy)
                arg += *p;
            ++p;
        }
        args.push_back(arg);
    }
    return args;
}

std::vector<std::string> environmentEntries(const char* inBlock)
{
    std::vector<std::string> entries;
    if (!inBlock)
        return entries;
    for (const char* p = inBlock; *p; p += std::strlen(p) + 1)
        entries.emplace_back(p);
    return entries;
}

} // namespace ZuPlatform
