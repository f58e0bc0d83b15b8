#pragma once

#include "zubase/zubase_export.h"

#include <QColor>
#include <QMap>
#include <QString>
#include <QStringList>
#include <QVector>

// Collects a table (optional header row, rows of text cells, attributes for the table, the
// columns, the header cells and single cells) and writes it as one HTML "table" text for rich-text
// views and reports. A plain value class; it validates nothing.
//
// Attribute precedence of a data cell: the column defaults, then the column width (on the first
// data row, and only when there is no header row), then the cell's own attributes. A header cell
// takes the header attributes of its column and the column width.
class ZUBASE_EXPORT ZuHtmlTable
{
public:
    enum Alignment
    {
        AlignLeft = 0,
        AlignRight = 1,
        AlignCenter = 2,
        AlignJustify = 3
    };
    enum CellAttribute
    {
        CellBgColor = 0,
        CellWidth = 1,
        CellAlign = 2,
        CellColSpan = 3,
        CellStyle = 4
    };
    enum TableAttribute
    {
        TableBgColor = 0,
        TableWidth = 1,
        TableBorder = 2,
        TableCellSpacing = 3,
        TableCellPadding = 4
    };

    using Attributes = QMap<QString, QString>;

    // A text cell; the text is kept as given and escaped only when written.
    class ZUBASE_EXPORT Cell
    {
    public:
        Cell() = default;
        Cell(const QString& inText) : mText(inText) {}

        QString text() const { return mText; }
        void setText(const QString& inText) { mText = inText; }
        const Attributes& attributes() const { return mAttributes; }

        // An attribute value that is not one of the enumerators gets an empty name.
        void setAttribute(CellAttribute inAttribute, const QString& inValue);
        void setAttribute(CellAttribute inAttribute, int inValue);
        void setAlignment(Alignment inAlignment);
        // As #rrggbb.
        void setBgColor(const QColor& inColor);
        void setTextStyle(const QString& inStyle);

    private:
        QString mText;
        Attributes mAttributes;
    };

    // One data row, addressed by column.
    class ZUBASE_EXPORT Row : public QVector<Cell>
    {
    public:
        Row() = default;
        Row(const QStringList& inTexts);
    };

    ZuHtmlTable() = default;

    void setHeader(const QStringList& inTexts);
    void addRow(const QStringList& inTexts);
    // Data rows only; the header does not count.
    int rowCount() const { return mRows.size(); }
    // The index must be valid.
    Row& operator[](int inRow) { return mRows[inRow]; }
    const Row& operator[](int inRow) const { return mRows[inRow]; }
    // Column first; null for any index outside the table, negative ones included.
    Cell* cellAt(int inColumn, int inRow);
    const Cell* cellAt(int inColumn, int inRow) const;
    void clear();

    void setAttribute(TableAttribute inAttribute, const QString& inValue);
    void setAttribute(TableAttribute inAttribute, int inValue);
    void setTableBgColor(const QColor& inColor);
    void setColumnWidth(int inColumn, const QString& inWidth);
    void setDefaultColumnAlignment(int inColumn, Alignment inAlignment);
    void setDefaultColumnBgColor(int inColumn, const QColor& inColor);
    void setDefaultColumnTextStyle(int inColumn, const QString& inStyle);
    void setHeaderAlignment(int inColumn, Alignment inAlignment);
    void setHeaderBgColor(int inColumn, const QColor& inColor);

    // The table as one line: the XML declaration, the "table" element, a line feed. Cell texts
    // with line feeds become one "div" per line; attributes come in ascending order of name.
    QString createHtml() const;

    static QString alignmentText(Alignment inAlignment);
    static QString attributeName(CellAttribute inAttribute);
    static QString attributeName(TableAttribute inAttribute);

private:
    QVector<Cell> mHeader;
    QVector<Row> mRows;
    Attributes mTableAttributes;
    QMap<int, QString> mColumnWidths;
    QMap<int, Attributes> mHeaderAttributes;
    QMap<int, Attributes> mColumnAttributes;
};
