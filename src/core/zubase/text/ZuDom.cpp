#include "zubase/ZuDom.h"

namespace ZuDom {

namespace {

QString attributeText(const QDomElement& inElement, const char* inName)
{
    // A null element has no attributes, so it reads as an empty text like a missing attribute.
    return inElement.attribute(QString::fromLatin1(inName));
}

} // namespace

bool getAttribute(QDomElement inElement, const char* inName, int& outValue)
{
    bool ok = false;
    const int value = attributeText(inElement, inName).toInt(&ok, 10);
    if (ok)
        outValue = value;
    return ok;
}

bool getAttribute(QDomElement inElement, const char* inName, float& outValue)
{
    bool ok = false;
    const float value = attributeText(inElement, inName).toFloat(&ok);
    if (ok)
        outValue = value;
    return ok;
}

bool getAttribute(QDomElement inElement, const char* inName, bool& outValue)
{
    const int value = qStringToBool(attributeText(inElement, inName));
    if (value < 0)
        return false;
    outValue = value == 1;
    return true;
}

void setAttribute(QDomElement inElement, const char* inName, const QString& inValue)
{
    if (inElement.isNull())
        return;
    inElement.setAttribute(QString::fromLatin1(inName), inValue);
}

int qStringToBool(const QString& inText)
{
    const QString text = inText.toLower();
    if (text.isEmpty())
        return -1;
    if (text == QLatin1String("yes") || text == QLatin1String("on") ||
        text == QLatin1String("true") || text == QLatin1String("1"))
        return 1;
    if (text == QLatin1String("no") || text == QLatin1String("off") ||
        text == QLatin1String("false") || text == QLatin1String("0"))
        return 0;
    return -1;
}

bool readIntegerListParams(const QString& inText, QList<int>& outList)
{
    outList.clear();
    const QStringList parts = inText.split(QLatin1Char(' '), Qt::KeepEmptyParts);
    for (const QString& part : parts) {
        bool ok = false;
        const int value = part.toInt(&ok, 10);
        if (!ok)
            return false;
        outList.append(value);
    }
    return true;
}

} // namespace ZuDom
