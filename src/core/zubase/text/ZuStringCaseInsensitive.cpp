#include "zubase/ZuStringCaseInsensitive.h"

ZuStringCaseInsensitive::ZuStringCaseInsensitive(const QString& inText) : QString(inText) {}

ZuStringCaseInsensitive::ZuStringCaseInsensitive(const char* inText)
    : QString(QString::fromLatin1(inText))
{}

QString& ZuStringCaseInsensitive::operator=(const QString& inText)
{
    return QString::operator=(inText);
}

QString& ZuStringCaseInsensitive::operator=(const char* inText)
{
    return QString::operator=(QString::fromLatin1(inText));
}

bool ZuStringCaseInsensitive::operator==(const QString& inOther) const
{
    return toLower() == inOther.toLower();
}
