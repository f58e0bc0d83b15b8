#pragma once

#include "zubase/zubase_export.h"

#include <QDomDocument>
#include <QDomElement>
#include <QString>

// Builds a DOM document by chained calls:
//
//     ZuXmlBuilder builder;
//     builder.createRootElement("Config").addChild("Item", "text").parent().addComment("end");
//
// Copies of a builder work on the same document (QDomDocument is a shared handle).
class ZUBASE_EXPORT ZuXmlBuilder
{
public:
    // An element of a builder's document. addChild() moves down, the other add... calls stay on
    // the same element, parent() moves up. A default-constructed element has no builder: it
    // ignores every add... call and hands out null elements. The parent of a root is null but
    // keeps the builder, so children added to it are made but belong to no parent.
    class ZUBASE_EXPORT Element
    {
    public:
        Element() = default;

        Element addChild(const QString& inName);
        // addChild(inName), then the text inside the new child.
        Element addChild(const QString& inName, const QString& inText);
        Element addText(const QString& inText);
        Element addComment(const QString& inText);
        Element addCDATA(const QString& inText);
        Element& setAttribute(const QString& inName, const QString& inValue);
        // The parent element; null for a root element, whose parent is the document.
        Element parent();
        bool isNull() const;
        QDomElement toQDomElement() const { return mElement; }
        operator QDomElement() const { return mElement; }

    protected:
        friend class ZuXmlBuilder;
        Element(ZuXmlBuilder* inBuilder, const QDomElement& inElement);

    private:
        ZuXmlBuilder* mBuilder = nullptr; // not owned
        QDomElement mElement;
    };

    ZuXmlBuilder() = default;

    // Creates the element inName and appends it to the document.
    Element createRootElement(const QString& inName);
    QDomDocument document() const { return mDocument; }
    // Turns the document into a null document.
    void clear();

protected:
    QDomElement createDomElement(const QString& inName);
    QDomNode createText(const QString& inText);
    QDomNode createComment(const QString& inText);
    QDomNode createCDATA(const QString& inText);

private:
    QDomDocument mDocument;
};
