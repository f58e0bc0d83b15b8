#include "zubase/ZuXmlBuilder.h"

ZuXmlBuilder::Element::Element(ZuXmlBuilder* inBuilder, const QDomElement& inElement)
    : mBuilder(inBuilder), mElement(inElement)
{}

ZuXmlBuilder::Element ZuXmlBuilder::Element::addChild(const QString& inName)
{
    if (!mBuilder)
        return Element();
    QDomElement child = mBuilder->createDomElement(inName);
    mElement.appendChild(child);
    return Element(mBuilder, child);
}

ZuXmlBuilder::Element ZuXmlBuilder::Element::addChild(const QString& inName, const QString& inText)
{
    return addChild(inName).addText(inText);
}

ZuXmlBuilder::Element ZuXmlBuilder::Element::addText(const QString& inText)
{
    if (!mBuilder)
        return Element();
    mElement.appendChild(mBuilder->createText(inText));
    return *this;
}

ZuXmlBuilder::Element ZuXmlBuilder::Element::addComment(const QString& inText)
{
    if (!mBuilder)
        return Element();
    mElement.appendChild(mBuilder->createComment(inText));
    return *this;
}

ZuXmlBuilder::Element ZuXmlBuilder::Element::addCDATA(const QString& inText)
{
    if (!mBuilder)
        return Element();
    mElement.appendChild(mBuilder->createCDATA(inText));
    return *this;
}

ZuXmlBuilder::Element& ZuXmlBuilder::Element::setAttribute(const QString& inName,
                                                           const QString& inValue)
{
    mElement.setAttribute(inName, inValue);
    return *this;
}

ZuXmlBuilder::Element ZuXmlBuilder::Element::parent()
{
    return Element(mBuilder, mElement.parentNode().toElement());
}

bool ZuXmlBuilder::Element::isNull() const
{
    return !mBuilder || mElement.isNull();
}

ZuXmlBuilder::Element ZuXmlBuilder::createRootElement(const QString& inName)
{
    QDomElement root = createDomElement(inName);
    mDocument.appendChild(root);
    return Element(this, root);
}

void ZuXmlBuilder::clear()
{
    mDocument.clear();
}

QDomElement ZuXmlBuilder::createDomElement(const QString& inName)
{
    return mDocument.createElement(inName);
}

QDomNode ZuXmlBuilder::createText(const QString& inText)
{
    return mDocument.createTextNode(inText);
}

QDomNode ZuXmlBuilder::createComment(const QString& inText)
{
    return mDocument.createComment(inText);
}

QDomNode ZuXmlBuilder::createCDATA(const QString& inText)
{
    return mDocument.createCDATASection(inText);
}
