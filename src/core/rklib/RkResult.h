#pragma once

#include "rklib/rklib_export.h"

#include <string>
#include <vector>

// Result of every fallible operation: success, or bad with a list of failure records.
// Records are appended with operator<< and travel to the caller (accumulate), or are
// written to the log by Tz::fail (report).
class RKLIB_EXPORT RkResult
{
public:
    enum Code
    {
        Ok = 0,
        Warning = 1,
        Error = 2
    };

    // One failure record: where a check failed and what it tested.
    struct Record
    {
        Code code = Ok;
        int line = 0;
        std::string where;
        std::string message;
        std::string detail;
    };

    RkResult() = default;
    // A failure record; code 2 (Error) makes the result bad.
    RkResult(Code inCode, int inLine, const char* inWhere, const char* inMessage,
             const char* inDetail);
    // A record without a source location.
    RkResult(Code inCode, const char* inMessage, const char* inDetail);

    bool isOk() const { return !mBad; }
    bool isBad() const { return mBad; }
    // Turns the result bad; the argument is kept for the callers' habit of passing 1.
    void makeBad(unsigned inReason = 1);

    // Appends the records of another result; the result is bad afterwards if either was.
    RkResult& operator<<(const RkResult& inOther);

    const std::vector<Record>& records() const { return mRecords; }
    // The records as text, one per line: "where(line): message  detail".
    std::string toString() const;

private:
    bool mBad = false;
    std::vector<Record> mRecords;
};
