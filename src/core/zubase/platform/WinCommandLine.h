#pragma once

// Internal, Qt-free and portable: the Windows rules for command lines and environment blocks.
// A Win32 backend hands both to CreateProcess as they are; the POSIX backend reads them with
// these rules, so that a child sees what it would see on Windows.

#include <string>
#include <vector>

namespace ZuPlatform {

// Splits a command line into arguments with the rules of the Windows C runtime: blanks and tabs
// separate, double quotes group, backslashes escape only in front of a double quote, and the
// program name takes quotes without escapes.
std::vector<std::string> splitCommandLine(const std::string& inCommandLine);

// The entries of a block of "NAME=value\0" entries ended by an empty entry; none for null.
std::vector<std::string> environmentEntries(const char* inBlock);

} // namespace ZuPlatform
