#pragma once

#include "pnresources/pnresources_export.h"

#include "rklib/DvParameter.h"
#include "rklib/RkResult.h"

#include <memory>
#include <string>

// A parameter file read into a bundle of named text parameters, in file order.
//
// Accepted format (UTF-8, lines ending in LF or CR LF, at most kMaxFileSize bytes, an optional
// UTF-8 byte order mark):
//
//     # comment lines and blank lines may stand anywhere
//     Name {                      the block opens with "{", optionally behind a name
//         Name value              a bare value: no blanks, no '"', not starting with '#'
//         Name "quoted value"     a quoted value: any text without '"' (no escapes)
//         Name "value"  # note    a comment may follow the value, after a blank
//     }                           the block ends with a line that is only "}"
//
// A name starts with a letter or '_' and goes on with letters, digits, '_', '.' and '-'; names
// keep their case and may repeat. Control characters other than tab are refused everywhere, as
// is any text after the closing line other than comments and blank lines. Backslashes are
// ordinary characters, so Windows paths need no escaping.
class PNRESOURCES_EXPORT VelmarMesh : public DvParamBundle
{
public:
    static constexpr std::size_t kMaxFileSize = 1024 * 1024;

    // The parameters of the file at inPath, or null when the file cannot be read or does not
    // follow the format; then a record naming the file, the line and the reason is appended to
    // *ioResult (if given). Nothing is logged here.
    static std::unique_ptr<VelmarMesh> read(const char* inPath, RkResult* ioResult);
    // The same for text already in memory; inSourceName names it in the record.
    static std::unique_ptr<VelmarMesh> parse(const std::string& inText, const char* inSourceName,
                                             RkResult* ioResult);
};
