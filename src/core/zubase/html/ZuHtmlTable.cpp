#include "zubase/ZuHtmlTable.h"

#include <QXmlStreamWriter>

namespace {

const QString kWidth = QStringLiteral("width");

void writeAttributes(QXmlStreamWriter& ioWriter, const ZuHtmlTable::Attributes& inAttributes)
{
    for (auto it = inAttributes.cbegin(); it != inAttributes.cend(); ++it)
        ioWriter.writeAttribute(it.key(), it.value());
}

// Column (or header) defaults, then the width, then the cell's own attributes. The common case of
// a cell without own attributes and no width shares the column's map instead of copying it.
ZuHtmlTable::Attributes mergedAttributes(const ZuHtmlTable::Attributes& inDefaults,
                                         const QString& inWidth,
                                         const ZuHtmlTable::Attributes& inOwn)
{
    ZuHtmlTable::Attributes result = inDefaults;
    if (!inWidth.isEmpty())
        result.insert(kWidth, inWidth);
    for (auto it = inOwn.cbegin(); it != inOwn.cend(); ++it)
        result.insert(it.key(), it.value());
    return result;
}

// The text of an enumerator, indexed by its fixed value; any other value has an empty text.
template <int N> QString enumeratorText(const char* const (&inTexts)[N], int inValue)
{
    return inValue >= 0 && inValue < N ? QString::fromLatin1(inTexts[inValue]) : QString();
}

QVector<ZuHtmlTable::Cell> cellsOf(const QStringList& inTexts)
{
    QVector<ZuHtmlTable::Cell> cells;
    cells.reserve(inTexts.size());
    for (const QString& text : inTexts)
        cells.append(ZuHtmlTable::Cell(text));
    return cells;
}

} // namespace

QString ZuHtmlTable::alignmentText(Alignment inAlignment)
{
    static const char* const kTexts[] = {"left", "right", "center", "justify"};
    return enumeratorText(kTexts, inAlignment);
}

QString ZuHtmlTable::attributeName(CellAttribute inAttribute)
{
    static const char* const kNames[] = {"bgcolor", "width", "align", "colspan", "style"};
    return enumeratorText(kNames, inAttribute);
}

QString ZuHtmlTable::attributeName(TableAttribute inAttribute)
{
    static const char* const kNames[] = {"bgcolor", "width", "border", "cellspacing",
                                         "cellpadding"};
    return enumeratorText(kNames, inAttribute);
}

void ZuHtmlTable::Cell::setAttribute(CellAttribute inAttribute, const QString& inValue)
{
    mAttributes.insert(attributeName(inAttribute), inValue);
}

void ZuHtmlTable::Cell::setAttribute(CellAttribute inAttribute, int inValue)
{
    setAttribute(inAttribute, QString::number(inValue));
}

void ZuHtmlTable::Cell::setAlignment(Alignment inAlignment)
{
    setAttribute(CellAlign, alignmentText(inAlignment));
}

void ZuHtmlTable::Cell::setBgColor(const QColor& inColor)
{
    setAttribute(CellBgColor, inColor.name());
}

void ZuHtmlTable::Cell::setTextStyle(const QString& inStyle)
{
    setAttribute(CellStyle, inStyle);
}

ZuHtmlTable::Row::Row(const QStringList& inTexts) : QVector<Cell>(cellsOf(inTexts)) {}

void ZuHtmlTable::setHeader(const QStringList& inTexts)
{
    mHeader = cellsOf(inTexts);
}

void ZuHtmlTable::addRow(const QStringList& inTexts)
{
    mRows.append(Row(inTexts));
}

ZuHtmlTable::Cell* ZuHtmlTable::cellAt(int inColumn, int inRow)
{
    return const_cast<Cell*>(static_cast<const ZuHtmlTable&>(*this).cellAt(inColumn, inRow));
}

const ZuHtmlTable::Cell* ZuHtmlTable::cellAt(int inColumn, int inRow) const
{
    if (inRow < 0 || inRow >= mRows.size() || inColumn < 0 || inColumn >= mRows[inRow].size())
        return nullptr;
    return &mRows[inRow][inColumn];
}

void ZuHtmlTable::clear()
{
    mHeader.clear();
    mRows.clear();
    mTableAttributes.clear();
    mColumnWidths.clear();
    mHeaderAttributes.clear();
    mColumnAttributes.clear();
}

void ZuHtmlTable::setAttribute(TableAttribute inAttribute, const QString& inValue)
{
    mTableAttributes.insert(attributeName(inAttribute), inValue);
}

void ZuHtmlTable::setAttribute(TableAttribute inAttribute, int inValue)
{
    setAttribute(inAttribute, QString::number(inValue));
}

void ZuHtmlTable::setTableBgColor(const QColor& inColor)
{
    setAttribute(TableBgColor, inColor.name());
}

void ZuHtmlTable::setColumnWidth(int inColumn, const QString& inWidth)
{
    mColumnWidths.insert(inColumn, inWidth);
}

void ZuHtmlTable::setDefaultColumnAlignment(int inColumn, Alignment inAlignment)
{
    mColumnAttributes[inColumn].insert(attributeName(CellAlign), alignmentText(inAlignment));
}

void ZuHtmlTable::setDefaultColumnBgColor(int inColumn, const QColor& inColor)
{
    mColumnAttributes[inColumn].insert(attributeName(CellBgColor), inColor.name());
}

void ZuHtmlTable::setDefaultColumnTextStyle(int inColumn, const QString& inStyle)
{
    mColumnAttributes[inColumn].insert(attributeName(CellStyle), inStyle);
}

void ZuHtmlTable::setHeaderAlignment(int inColumn, Alignment inAlignment)
{
    mHeaderAttributes[inColumn].insert(attributeName(CellAlign), alignmentText(inAlignment));
}

void ZuHtmlTable::setHeaderBgColor(int inColumn, const QColor& inColor)
{
    mHeaderAttributes[inColumn].insert(attributeName(CellBgColor), inColor.name());
}

QString ZuHtmlTable::createHtml() const
{
    QString html;
    QXmlStreamWriter writer(&html);
    writer.setAutoFormatting(false);
    writer.writeStartDocument();
    writer.writeStartElement(QStringLiteral("table"));
    writeAttributes(writer, mTableAttributes);

    const QString th = QStringLiteral("th");
    const QString td = QStringLiteral("td");
    const QString tr = QStringLiteral("tr");
    const QString div = QStringLiteral("div");
    const Attributes none;

    if (!mHeader.isEmpty()) {
        writer.writeStartElement(tr);
        for (int column = 0; column < mHeader.size(); ++column) {
            const Cell& cell = mHeader[column];
            writer.writeStartElement(th);
            writeAttributes(writer,
                            mergedAttributes(mHeaderAttributes.value(column, none),
                                             mColumnWidths.value(column), cell.attributes()));
            writer.writeCharacters(cell.text());
            writer.writeEndElement();
        }
        writer.writeEndElement();
    }

    const bool widthsOnFirstRow = mHeader.isEmpty();
    for (int row = 0; row < mRows.size(); ++row) {
        const Row& cells = mRows[row];
        writer.writeStartElement(tr);
        for (int column = 0; column < cells.size(); ++column) {
            const Cell& cell = cells[column];
            writer.writeStartElement(td);
            const QString width =
                row == 0 && widthsOnFirstRow ? mColumnWidths.value(column) : QString();
            writeAttributes(writer, mergedAttributes(mColumnAttributes.value(column, none), width,
                                                     cell.attributes()));
            const QString text = cell.text();
            if (text.contains(QLatin1Char('\n'))) {
                const QStringList lines = text.split(QLatin1Char('\n'));
                for (const QString& line : lines) {
                    writer.writeStartElement(div);
                    writer.writeCharacters(line);
                    writer.writeEndElement();
                }
            } else {
                writer.writeCharacters(text);
            }
            writer.writeEndElement();
        }
        writer.writeEndElement();
    }

    writer.writeEndElement();
    writer.writeEndDocument();
    return html;
}
