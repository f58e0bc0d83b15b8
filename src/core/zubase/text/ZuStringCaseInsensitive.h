#pragma once

#include "zubase/zubase_export.h"

#include <QString>

// A QString whose == ignores case (compares the QString::toLower() forms). It adds no ordering or
// hashing, so it does not change how containers sort or hash it.
class ZUBASE_EXPORT ZuStringCaseInsensitive : public QString
{
public:
    ZuStringCaseInsensitive() = default;
    ZuStringCaseInsensitive(const QString& inText);
    // Latin-1.
    ZuStringCaseInsensitive(const char* inText);
    ZuStringCaseInsensitive(const ZuStringCaseInsensitive& inOther) = default;

    ZuStringCaseInsensitive& operator=(const ZuStringCaseInsensitive& inOther) = default;
    QString& operator=(const QString& inText);
    // Latin-1.
    QString& operator=(const char* inText);

    bool operator==(const QString& inOther) const;
};
