#include "rklib/RkResult.h"

static std::string textOf(const char* inText)
{
    return inText ? std::string(inText) : std::string();
}

RkResult::RkResult(Code inCode, int inLine, const char* inWhere, const char* inMessage,
                   const char* inDetail)
    : mBad(inCode >= Error)
{
    mRecords.push_back(
        Record{inCode, inLine, textOf(inWhere), textOf(inMessage), textOf(inDetail)});
}

RkResult::RkResult(Code inCode, const char* inMessage, const char* inDetail)
    : RkResult(inCode, 0, "", inMessage, inDetail)
{}

void RkResult::makeBad(unsigned)
{
    mBad = true;
}

RkResult& RkResult::operator<<(const RkResult& inOther)
{
    if (&inOther == this) {
        const std::vector<Record> copy = mRecords;
        mRecords.insert(mRecords.end(), copy.begin(), copy.end());
        return *this;
    }
    mRecords.insert(mRecords.end(), inOther.mRecords.begin(), inOther.mRecords.end());
    mBad = mBad || inOther.mBad;
    return *this;
}

std::string RkResult::toString() const
{
    std::string text;
    for (const Record& record : mRecords) {
        if (!text.empty())
            text += '\n';
        text += record.where + "(" + std::to_string(record.line) + "): " + record.message + "  " +
                record.detail;
    }
    return text;
}
