#include "zubase/ZuTextStream.h"

namespace {

QString wholeString(const QTextStream& inStream)
{
    const QString* text = inStream.string();
    return text ? *text : QString();
}

} // namespace

QTextStream& operator<<(QTextStream& ioStream, const bool& inValue)
{
    ioStream << (inValue ? QLatin1String("true") : QLatin1String("false"));
    return ioStream;
}

QTextStream& operator>>(QTextStream& ioStream, bool& outValue)
{
    outValue = wholeString(ioStream).toLower() == QLatin1String("true");
    return ioStream;
}

QTextStream& operator<<(QTextStream& ioStream, const QUuid& inValue)
{
    ioStream << inValue.toString();
    return ioStream;
}

QTextStream& operator>>(QTextStream& ioStream, QUuid& outValue)
{
    outValue = QUuid(wholeString(ioStream));
    return ioStream;
}
