#include "rklib/Tz.h"

#include "rklib/RkLogFile.h"

#include <cerrno>
#include <cstring>
#include <string>

namespace {

const char* const kCategory = "Tz";

void logRecords(const RkResult& inResult)
{
    for (const RkResult::Record& record : inResult.records()) {
        getTheLogInstance().tracef(RkLogError, kCategory, "%s(%d): %s  %s", record.where.c_str(),
                                   record.line, record.message.c_str(), record.detail.c_str());
    }
}

std::string errorText(int inError)
{
    char buffer[256];
    // GNU strerror_r may return a static text instead of filling the buffer.
    const char* text = strerror_r(inError, buffer, sizeof buffer);
    return text ? text : "";
}

} // namespace

namespace Tz {

bool fail(const RkResult& inResult)
{
    if (inResult.isOk())
        return false;
    logRecords(inResult);
    return true;
}

bool failWin(const RkResult& inResult)
{
    return failWin(inResult, errno);
}

bool failWin(const RkResult& inResult, int inError)
{
    if (inResult.isOk())
        return false;
    logRecords(inResult);
    getTheLogInstance().tracef(RkLogError, kCategory, "last error %d: %s", inError,
                               errorText(inError).c_str());
    return true;
}

bool logWinFunc(std::int64_t inValue, std::int64_t inExpected, const char* inFunction,
                const char* inContext, bool inChangesIdentity)
{
    return logWinFunc(inValue, inExpected, inFunction, inContext, inChangesIdentity, errno);
}

bool logWinFunc(std::int64_t inValue, std::int64_t inExpected, const char* inFunction,
                const char* inContext, bool inChangesIdentity, int inError)
{
    const std::string context = inContext && *inContext ? std::string(" ") + inContext : "";
    const char* function = inFunction ? inFunction : "";
    if (inValue == inExpected) {
        getTheLogInstance().tracef(inChangesIdentity ? RkLogInfo : RkLogDebug, kCategory,
                                   "%s%s -> ok", function, context.c_str());
        return false;
    }
    getTheLogInstance().tracef(RkLogError, kCategory, "%s%s -> %lld, last error %d: %s", function,
                               context.c_str(), static_cast<long long>(inValue), inError,
                               errorText(inError).c_str());
    return true;
}

} // namespace Tz
