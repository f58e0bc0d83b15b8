// HTML table builder: exact text of createHtml() and where attributes end up.
#include "zubase/ZuHtmlTable.h"

#include <QtTest>

namespace {

const QString kDecl = QStringLiteral("<?xml version=\"1.0\"?>");

ZuHtmlTable exampleTable()
{
    ZuHtmlTable table;
    table.setHeader({"Name", "Size"});
    table.addRow({"a.dcm", "12"});
    table.addRow({"b & c", "7\n8"});
    table.setAttribute(ZuHtmlTable::TableBorder, 1);
    table.setAttribute(ZuHtmlTable::TableCellPadding, 2);
    table.setColumnWidth(0, QStringLiteral("70%"));
    table.setDefaultColumnAlignment(1, ZuHtmlTable::AlignRight);
    table.setHeaderBgColor(0, QColor(200, 200, 200));
    table[1][0].setTextStyle(QStringLiteral("font-weight:bold"));
    return table;
}

} // namespace

Q_DECLARE_METATYPE(ZuHtmlTable)

class TestHtml : public QObject
{
    Q_OBJECT

private slots:
    void createHtml_data();
    void createHtml();
    void cellAt_data();
    void cellAt();
    void unknownEnumerators();
};

void TestHtml::createHtml_data()
{
    QTest::addColumn<ZuHtmlTable>("table");
    QTest::addColumn<QString>("expected");

    QTest::newRow("worked example")
        << exampleTable()
        << "<?xml version=\"1.0\"?><table border=\"1\" cellpadding=\"2\"><tr><th "
           "bgcolor=\"#c8c8c8\" width=\"70%\">Name</th><th>Size</th></tr>"
           "<tr><td>a.dcm</td><td align=\"right\">12</td></tr><tr><td "
           "style=\"font-weight:bold\">b &amp; c</td><td "
           "align=\"right\"><div>7</div><div>8</div></td></tr></table>\n";

    QTest::newRow("empty") << ZuHtmlTable() << kDecl + "<table/>\n";

    // Header rows take widths but not the column defaults; their texts are never split.
    ZuHtmlTable headerOnly;
    headerOnly.setHeader({"A", "B\nC"});
    headerOnly.setHeaderAlignment(1, ZuHtmlTable::AlignCenter);
    headerOnly.setDefaultColumnAlignment(0, ZuHtmlTable::AlignJustify);
    headerOnly.setColumnWidth(0, QStringLiteral("10"));
    headerOnly.setColumnWidth(1, QString()); // an empty width is not written
    QTest::newRow("header only")
        << headerOnly
        << kDecl +
               "<table><tr><th width=\"10\">A</th><th align=\"center\">B\nC</th></tr></table>\n";

    // Without header the widths go on the first data row only; column defaults everywhere.
    ZuHtmlTable noHeader;
    noHeader.addRow({"1", "2"});
    noHeader.addRow({"3"});
    noHeader.setColumnWidth(1, QStringLiteral("5em"));
    noHeader.setDefaultColumnBgColor(1, QColor(Qt::red));
    noHeader.setDefaultColumnTextStyle(0, QStringLiteral("x"));
    noHeader.setDefaultColumnAlignment(0, ZuHtmlTable::AlignLeft);
    QTest::newRow("widths on first data row")
        << noHeader
        << kDecl +
               "<table><tr><td align=\"left\" style=\"x\">1</td><td bgcolor=\"#ff0000\" "
               "width=\"5em\">2</td></tr><tr><td align=\"left\" style=\"x\">3</td></tr></table>\n";

    ZuHtmlTable emptyParts;
    emptyParts.addRow({});
    emptyParts.addRow({"", "x\n\ny", "<b>"});
    QTest::newRow("empty row, empty cell, empty line")
        << emptyParts
        << kDecl + "<table><tr/><tr><td></td><td><div>x</div><div></div><div>y</div></td>"
                   "<td>&lt;b&gt;</td></tr></table>\n";

    // Own attributes win over column defaults and the width; names come out sorted.
    ZuHtmlTable own;
    own.addRow({"v"});
    own.setDefaultColumnAlignment(0, ZuHtmlTable::AlignRight);
    own.setColumnWidth(0, QStringLiteral("1"));
    own[0][0].setAttribute(ZuHtmlTable::CellWidth, 9);
    own[0][0].setAlignment(ZuHtmlTable::AlignCenter);
    own[0][0].setAttribute(ZuHtmlTable::CellColSpan, 2);
    own[0][0].setBgColor(QColor(1, 2, 3));
    own.setAttribute(ZuHtmlTable::TableWidth, QStringLiteral("100%"));
    own.setAttribute(ZuHtmlTable::TableBgColor, QStringLiteral("red"));
    own.setTableBgColor(QColor(0, 0, 255));
    own.setAttribute(ZuHtmlTable::TableCellSpacing, 0);
    QTest::newRow("own attributes last")
        << own
        << kDecl + "<table bgcolor=\"#0000ff\" cellspacing=\"0\" width=\"100%\"><tr><td "
                   "align=\"center\" bgcolor=\"#010203\" colspan=\"2\" width=\"9\">v</td></tr>"
                   "</table>\n";

    // clear() also forgets the widths and the column defaults.
    ZuHtmlTable cleared = exampleTable();
    cleared.clear();
    cleared.addRow({"x", "y"});
    QTest::newRow("cleared") << cleared << kDecl + "<table><tr><td>x</td><td>y</td></tr></table>\n";
}

void TestHtml::createHtml()
{
    QFETCH(ZuHtmlTable, table);
    QFETCH(QString, expected);
    QCOMPARE(table.createHtml(), expected);
}

void TestHtml::cellAt_data()
{
    QTest::addColumn<int>("column");
    QTest::addColumn<int>("row");
    QTest::addColumn<QString>("text"); // empty: no cell
    QTest::newRow("first") << 0 << 0 << "a";
    QTest::newRow("last of short row") << 0 << 1 << "d";
    QTest::newRow("beyond short row") << 1 << 1 << QString();
    QTest::newRow("beyond first row") << 5 << 0 << QString();
    QTest::newRow("row count") << 0 << 2 << QString();
    QTest::newRow("negative column") << -1 << 0 << QString();
    QTest::newRow("negative row") << 0 << -1 << QString();
    QTest::newRow("very negative") << -2147483647 << -2147483647 << QString();
}

void TestHtml::cellAt()
{
    QFETCH(int, column);
    QFETCH(int, row);
    QFETCH(QString, text);
    ZuHtmlTable table;
    table.setHeader({"h1", "h2", "h3", "h4"});
    table.addRow({"a", "b", "c"});
    table.addRow({"d"});
    QCOMPARE(table.rowCount(), 2);

    ZuHtmlTable::Cell* cell = table.cellAt(column, row);
    QCOMPARE(cell, static_cast<const ZuHtmlTable&>(table).cellAt(column, row));
    QCOMPARE(cell ? cell->text() : QString(), text);
    if (cell)
        QCOMPARE(cell, &table[row][column]); // the cell itself, not a copy
}

void TestHtml::unknownEnumerators()
{
    QVERIFY(ZuHtmlTable::alignmentText(ZuHtmlTable::Alignment(4)).isEmpty());
    QVERIFY(ZuHtmlTable::attributeName(ZuHtmlTable::CellAttribute(-1)).isEmpty());
    QVERIFY(ZuHtmlTable::attributeName(ZuHtmlTable::TableAttribute(5)).isEmpty());
}

QTEST_GUILESS_MAIN(TestHtml)
#include "tst_html.moc"
