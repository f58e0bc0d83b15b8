#pragma once

#include "rklib/RkResult.h"
#include "rklib/rklib_export.h"

#include <cstdint>

// Reporting of failure records and of platform call outcomes through the process-wide log.
namespace Tz {

// Writes every record of a bad result to the log (level 3, category "Tz") and returns true;
// returns false and writes nothing for a good result.
RKLIB_EXPORT bool fail(const RkResult& inResult);
// As fail(), right after a failed platform call: also logs the platform's last error
// (errno and its text on POSIX). The overload takes an error code saved by the caller.
RKLIB_EXPORT bool failWin(const RkResult& inResult);
RKLIB_EXPORT bool failWin(const RkResult& inResult, int inError);

// Logs the outcome of a platform call named inFunction ("::LogonUser"). Returns true when
// inValue differs from inExpected (the call failed); the failure line carries the last error.
// inChangesIdentity marks calls that change the thread's identity: their success is logged at
// level 1; the success of plain queries only at level 0. inContext is extra text or null.
RKLIB_EXPORT bool logWinFunc(std::int64_t inValue, std::int64_t inExpected, const char* inFunction,
                             const char* inContext, bool inChangesIdentity);
RKLIB_EXPORT bool logWinFunc(std::int64_t inValue, std::int64_t inExpected, const char* inFunction,
                             const char* inContext, bool inChangesIdentity, int inError);

} // namespace Tz
