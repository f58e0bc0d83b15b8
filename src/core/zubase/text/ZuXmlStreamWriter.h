#pragma once

#include "zubase/zubase_export.h"

#include <QXmlStreamWriter>

// A QXmlStreamWriter that can line attributes up under each other and set sections apart with
// comments between empty lines. Every base operation stays available. The extra layout is
// written straight to the device, so it needs a writer on a QByteArray or an open device; on
// anything else the layout calls do nothing.
class ZUBASE_EXPORT ZuXmlStreamWriter : public QXmlStreamWriter
{
public:
    explicit ZuXmlStreamWriter(QByteArray* inArray);
    explicit ZuXmlStreamWriter(QIODevice* inDevice);

    using QXmlStreamWriter::writeAttribute;
    using QXmlStreamWriter::writeStartElement;

    // Counts the depth and clears the alignment of a previous writeStartElementExt().
    void writeStartElement(const QString& inName);
    // Start tag whose second and later attributes each go on a line of their own, indented by
    // one blank less than the bytes the start tag took (the pending '>' of the parent, the line
    // feed and indentation of auto-formatting, '<' and the name), at most 39 blanks.
    void writeStartElementExt(const QString& inName);
    void writeAttribute(const QString& inName, const QString& inValue);
    void writeEndElement();

    // A line feed straight to the device.
    void writeEmptyLine();
    // A line feed and the blanks that fit the last writeStartElementExt() (at most 39).
    void writeEmptyLineExt();
    // "\n\n", the comment, "\n", then the indentation for what follows. Nothing for an empty text.
    void writeSectionComment(const QString& inText);
    // A line feed and inLevel steps of the auto-formatting indent.
    void indent(int inLevel);

    // A flag for the host; this class only keeps it.
    void setWriteDefaultValues(bool inWrite) { mWriteDefaultValues = inWrite; }
    bool writeDefaultValues() const { return mWriteDefaultValues; }

private:
    bool deviceOpen() const;
    void writeRaw(const QByteArray& inBytes);
    void writeLineBreak(int inWidth);

    // > 0: break before every attribute; < 0: the first attribute of an aligned tag is pending.
    int mAttributeIndent = 0;
    int mEmptyLineIndent = 0;
    int mDepth = 0;
    bool mWriteDefaultValues = false;
};
