#pragma once

#include "rklib/RkString.h"
#include "rklib/rklib_export.h"

// A file path of the core runtime layer. Separators are '/' once fixSlashes() ran;
// both '/' and '\\' are accepted on input.
class RKLIB_EXPORT RkFilename : public RkString
{
public:
    RkFilename() = default;
    RkFilename(const char* inPath) : RkString(inPath) {}
    RkFilename(const RkString& inPath) : RkString(inPath) {}

    // Appends a file or folder name with exactly one separator between.
    RkFilename& appendFile(const char* inName);
    // Turns every backslash into a slash.
    RkFilename& fixSlashes();
    // The folder part of inPath (without the last separator); "." when there is none.
    static void dirname(const char* inPath, RkString& outDirname);
    // Renames the file on disk to inNewPath; on success this object names the new path.
    bool rename(const char* inNewPath);
    bool isRelative() const;
    bool doesExist() const;
};
