// DOM attribute readers on arbitrary documents (or, when the input is no document, on an
// attribute holding the input): no crash, a failed read leaves the variable alone, a successful
// one agrees with the text.
#include "zubase/ZuDom.h"

#include <QDomDocument>
#include <QDomNamedNodeMap>

#include <cstdint>
#include <cstdlib>

namespace {

void check(bool inCondition)
{
    if (!inCondition)
        std::abort();
}

void readAll(const QDomElement& inElement, const QByteArray& inName)
{
    const QString text = inElement.attribute(QString::fromLatin1(inName));
    int number = -77;
    const bool numberOk = ZuDom::getAttribute(inElement, inName.constData(), number);
    check(numberOk ? number == text.toInt() : number == -77);
    float real = -7.5f;
    check(ZuDom::getAttribute(inElement, inName.constData(), real) || real == -7.5f);
    bool flag = true;
    const int word = ZuDom::qStringToBool(text);
    check(word >= -1 && word <= 1);
    check(ZuDom::getAttribute(inElement, inName.constData(), flag) == (word >= 0));
    check(flag == (word != 0));
    QList<int> numbers{1, 2};
    if (ZuDom::readIntegerListParams(text, numbers))
        check(numbers.size() == text.count(QLatin1Char(' ')) + 1);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const QByteArray bytes(reinterpret_cast<const char*>(inData), int(inSize));
    QDomDocument document;
    if (!document.setContent(bytes)) {
        QDomElement element = document.createElement(QStringLiteral("e"));
        ZuDom::setAttribute(element, "v", QString::fromUtf8(bytes));
        readAll(element, "v");
        readAll(QDomElement(), "v");
        return 0;
    }
    const QDomNodeList elements = document.elementsByTagName(QStringLiteral("*"));
    for (int i = 0; i < elements.size() && i < 64; ++i) {
        const QDomElement element = elements.at(i).toElement();
        const QDomNamedNodeMap attributes = element.attributes();
        for (int a = 0; a < attributes.size() && a < 16; ++a)
            readAll(element, attributes.item(a).nodeName().toLatin1());
    }
    return 0;
}
