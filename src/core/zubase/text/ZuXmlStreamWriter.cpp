#include "zubase/ZuXmlStreamWriter.h"

#include <QIODevice>

#include <algorithm>
#include <cstdlib>

namespace {

// Deeper alignment would push attributes off any screen; longer tags just break earlier.
constexpr int kMaxIndent = 40;

} // namespace

ZuXmlStreamWriter::ZuXmlStreamWriter(QByteArray* inArray) : QXmlStreamWriter(inArray) {}

ZuXmlStreamWriter::ZuXmlStreamWriter(QIODevice* inDevice) : QXmlStreamWriter(inDevice) {}

bool ZuXmlStreamWriter::deviceOpen() const
{
    const QIODevice* dev = device();
    return dev && dev->isOpen();
}

void ZuXmlStreamWriter::writeRaw(const QByteArray& inBytes)
{
    device()->write(inBytes);
}

void ZuXmlStreamWriter::writeLineBreak(int inWidth)
{
    QByteArray bytes(1, '\n');
    bytes.append(QByteArray(std::max(std::min(inWidth, kMaxIndent) - 1, 0), ' '));
    writeRaw(bytes);
}

void ZuXmlStreamWriter::writeStartElement(const QString& inName)
{
    ++mDepth;
    mAttributeIndent = 0;
    mEmptyLineIndent = 0;
    QXmlStreamWriter::writeStartElement(inName);
}

void ZuXmlStreamWriter::writeStartElementExt(const QString& inName)
{
    mAttributeIndent = 0;
    const bool open = deviceOpen();
    const qint64 before = open ? device()->pos() : 0;
    ++mDepth;
    QXmlStreamWriter::writeStartElement(inName);
    if (open)
        mAttributeIndent = int(before - device()->pos());
    mEmptyLineIndent = 3 - inName.length() - mAttributeIndent;
}

void ZuXmlStreamWriter::writeAttribute(const QString& inName, const QString& inValue)
{
    if (mAttributeIndent > 0 && deviceOpen())
        writeLineBreak(mAttributeIndent);
    if (mAttributeIndent < 0)
        mAttributeIndent = -mAttributeIndent;
    QXmlStreamWriter::writeAttribute(inName, inValue);
}

void ZuXmlStreamWriter::writeEndElement()
{
    QXmlStreamWriter::writeEndElement();
    --mDepth;
}

void ZuXmlStreamWriter::writeEmptyLine()
{
    if (deviceOpen())
        writeRaw(QByteArray(1, '\n'));
}

void ZuXmlStreamWriter::writeEmptyLineExt()
{
    if (mEmptyLineIndent > 0 && deviceOpen())
        writeLineBreak(mEmptyLineIndent);
}

void ZuXmlStreamWriter::writeSectionComment(const QString& inText)
{
    if (inText.isEmpty() || !deviceOpen())
        return;
    // Through the base writer, so that a pending start tag is closed first.
    writeCharacters(QStringLiteral("\n\n"));
    const bool autoFormat = autoFormatting();
    setAutoFormatting(false);
    writeComment(inText);
    writeCharacters(QStringLiteral("\n"));
    setAutoFormatting(autoFormat);
    writeEmptyLineExt();
    if (mEmptyLineIndent <= 0)
        indent(mDepth);
}

void ZuXmlStreamWriter::indent(int inLevel)
{
    if (!deviceOpen())
        return;
    const int step = std::abs(autoFormattingIndent());
    QByteArray bytes(1, '\n');
    bytes.append(QByteArray(std::max(inLevel, 0) * step, ' '));
    writeRaw(bytes);
}
