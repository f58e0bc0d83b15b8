// HTML table builder: the exact text of createHtml(), where attributes end up, cell access.
#include "zubase/ZuHtmlTable.h"

#include <QtTest>

Q_DECLARE_METATYPE(ZuHtmlTable)

class TestHtml : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void createHtml_data()
    {
        QTest::addColumn<ZuHtmlTable>("table");
        QTest::addColumn<QString>("expected"); // between the declaration and the line feed

        ZuHtmlTable example;
        example.setHeader({"Name", "Si\nze"});
        example.addRow({"a.dcm", "12"});
        example.addRow({"b & c", "7\n8"});
        example.setAttribute(ZuHtmlTable::TableBorder, 1);
        example.setAttribute(ZuHtmlTable::TableCellPadding, 2);
        example.setColumnWidth(0, "70%");
        example.setDefaultColumnAlignment(1, ZuHtmlTable::AlignRight);
        example.setHeaderBgColor(0, QColor(200, 200, 200));
        example.setHeaderAlignment(0, ZuHtmlTable::AlignCenter);
        example[1][0].setTextStyle("font-weight:bold");
        // Header cells take their own attributes, never the column defaults; texts stay whole.
        QTest::newRow("worked example")
            << example
            << "<table border=\"1\" cellpadding=\"2\"><tr><th align=\"center\" bgcolor=\"#c8c8c8\" "
               "width=\"70%\">Name</th><th>Si\nze</th></tr><tr><td>a.dcm</td><td align=\"right\">"
               "12</td></tr><tr>"
               "<td style=\"font-weight:bold\">b &amp; c</td><td align=\"right\"><div>7</div>"
               "<div>8</div></td></tr></table>";
        QTest::newRow("empty") << ZuHtmlTable() << "<table/>";

        // Without header the widths go on the first data row only, column defaults everywhere;
        // own attributes win, and every element's attributes come out sorted by name.
        ZuHtmlTable rows;
        rows.addRow({"1", "2"});
        rows.addRow({});
        rows.addRow({"", "x\n\ny", "<b>"});
        rows.setColumnWidth(1, "5em");
        rows.setDefaultColumnBgColor(1, QColor(Qt::red));
        rows.setDefaultColumnTextStyle(0, "x");
        rows.setDefaultColumnAlignment(0, ZuHtmlTable::AlignLeft);
        rows[0][1].setAttribute(ZuHtmlTable::CellWidth, 9);
        rows[0][1].setAlignment(ZuHtmlTable::Alignment(4)); // no such alignment: empty
        rows[2][0].setAlignment(ZuHtmlTable::AlignCenter);
        rows[2][0].setAttribute(ZuHtmlTable::CellColSpan, 2);
        rows[2][0].setBgColor(QColor(1, 2, 3));
        rows.setAttribute(ZuHtmlTable::TableWidth, "100%");
        rows.setAttribute(ZuHtmlTable::TableBgColor, "red");
        rows.setTableBgColor(QColor(0, 0, 255));
        rows.setAttribute(ZuHtmlTable::TableCellSpacing, 0);
        QTest::newRow("data rows")
            << rows
            << "<table bgcolor=\"#0000ff\" cellspacing=\"0\" width=\"100%\"><tr><td align=\"left\" "
               "style=\"x\">1</td><td align=\"\" bgcolor=\"#ff0000\" width=\"9\">2</td></tr><tr/>"
               "<tr><td align=\"center\" bgcolor=\"#010203\" colspan=\"2\" style=\"x\"></td><td "
               "bgcolor=\"#ff0000\"><div>x</div><div></div><div>y</div></td><td>&lt;b&gt;</td>"
               "</tr></table>";

        // clear() also forgets the widths and the column defaults.
        example.clear();
        example.addRow({"x", "y"});
        QTest::newRow("cleared") << example << "<table><tr><td>x</td><td>y</td></tr></table>";
    }
    void createHtml()
    {
        QFETCH(ZuHtmlTable, table);
        QFETCH(QString, expected);
        QCOMPARE(table.createHtml(), "<?xml version=\"1.0\"?>" + expected + '\n');
    }

    // The header is no row; the cell handed out is the stored one, not a copy.
    void cellAt()
    {
        ZuHtmlTable table;
        table.setHeader({"h1", "h2", "h3", "h4"});
        table.addRow({"a", "b", "c"});
        table.addRow({"d"});
        QCOMPARE(table.rowCount(), 2);
        const ZuHtmlTable& constTable = table;
        for (const QPoint at : {QPoint(1, 1), QPoint(0, 2), QPoint(-1, 0), QPoint(0, -1)})
            QVERIFY(!table.cellAt(at.x(), at.y()) && !constTable.cellAt(at.x(), at.y()));
        table.cellAt(0, 1)->setText("changed");
        QCOMPARE(constTable.cellAt(0, 1)->text(), QStringLiteral("changed"));
        QCOMPARE(constTable.cellAt(2, 0)->text(), QStringLiteral("c"));
    }

    // Values beyond the enumerators, below or above, have empty texts.
    void unknownEnumerators()
    {
        for (const int value : {-1, 5, -0x10000000, 0x10000000}) { // far ones fault if looked up
            QVERIFY(ZuHtmlTable::attributeName(ZuHtmlTable::CellAttribute(value)).isEmpty());
            QVERIFY(ZuHtmlTable::attributeName(ZuHtmlTable::TableAttribute(value)).isEmpty());
        }
    }
};

QTEST_GUILESS_MAIN(TestHtml)
#include "tst_html.moc"
