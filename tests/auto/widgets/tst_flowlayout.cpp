// ZuFlowLayout: rows and wrapping, heights and minimum size, spacing fallbacks, the height cache.
#include "zubase/ZuFlowLayout.h"

#include <QApplication>
#include <QPointer>
#include <QProxyStyle>
#include <QSpacerItem>
#include <QVBoxLayout>
#include <QtTest>

using Rects = QVector<QRect>;
Q_DECLARE_METATYPE(QMargins)

namespace {

// Spacing metrics and per-control layout spacing, horizontal and vertical.
struct SpacingStyle : QProxyStyle
{
    SpacingStyle(int inMetricH, int inMetricV, int inLayoutH, int inLayoutV)
        : values{inMetricH, inMetricV, inLayoutH, inLayoutV}
    {}
    int pixelMetric(PixelMetric inMetric, const QStyleOption* inOption,
                    const QWidget* inWidget) const override
    {
        if (inMetric == PM_LayoutHorizontalSpacing || inMetric == PM_LayoutVerticalSpacing)
            return values[inMetric == PM_LayoutVerticalSpacing];
        return QProxyStyle::pixelMetric(inMetric, inOption, inWidget);
    }
    int layoutSpacing(QSizePolicy::ControlType, QSizePolicy::ControlType, Qt::Orientation inO,
                      const QStyleOption*, const QWidget*) const override
    {
        return values[inO == Qt::Horizontal ? 2 : 3];
    }
    int values[4];
};

QSpacerItem* item(int inWidth, int inHeight)
{
    return new QSpacerItem(inWidth, inHeight, QSizePolicy::Fixed, QSizePolicy::Fixed);
}

} // namespace

class tst_FlowLayout : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void rows_data();
    void rows();
    void spacingFallbacks_data();
    void spacingFallbacks();
    void heightCache();
};

void tst_FlowLayout::rows_data()
{
    QTest::addColumn<int>("width");
    QTest::addColumn<QMargins>("margins");
    QTest::addColumn<QSize>("firstSize"); // then two items of 50 x 20
    QTest::addColumn<Rects>("expected");  // spacing 10 across, 7 down
    QTest::addColumn<QSize>("minimum");

    const QSize s(50, 20);
    QTest::newRow("right() wraps")
        << 110 << QMargins() << s << Rects{{0, 0, 50, 20}, {0, 27, 50, 20}, {0, 54, 50, 20}} << s;
    QTest::newRow("one more fits")
        << 111 << QMargins() << s << Rects{{0, 0, 50, 20}, {60, 0, 50, 20}, {0, 27, 50, 20}} << s;
    QTest::newRow("wide item alone")
        << 120 << QMargins() << QSize(200, 30)
        << Rects{{0, 0, 200, 30}, {0, 37, 50, 20}, {60, 37, 50, 20}} << QSize(200, 30);
    QTest::newRow("unequal margins")
        << 134 << QMargins(1, 2, 3, 4) << s
        << Rects{{1, 2, 50, 20}, {61, 2, 50, 20}, {1, 29, 50, 20}} << QSize(54, 26);
}

void tst_FlowLayout::rows()
{
    QFETCH(int, width);
    QFETCH(QMargins, margins);
    QFETCH(QSize, firstSize);
    QFETCH(Rects, expected);
    QFETCH(QSize, minimum);
    ZuFlowLayout layout(0, 10, 7);
    layout.setContentsMargins(margins);
    QCOMPARE(layout.heightForWidth(width), margins.top() + margins.bottom());
    layout.addItem(item(firstSize.width(), firstSize.height()));
    layout.addItem(item(50, 20));
    layout.addItem(item(50, 20));
    layout.setGeometry(QRect(0, 0, width, 500));
    QCOMPARE(layout.heightForWidth(width), expected.last().bottom() + 1 + margins.bottom());
    layout.heightForWidth(40);
    for (int i = 0; i < 3; ++i) // measuring moved nothing
        QCOMPARE(layout.itemAt(i)->geometry(), expected.at(i));
    QCOMPARE(layout.minimumSize(), minimum);
    QCOMPARE(layout.sizeHint(), minimum);
}

void tst_FlowLayout::spacingFallbacks_data()
{
    QTest::addColumn<QString>("setup");
    QTest::addColumn<QPoint>("given"); // to the constructor, across and down
    QTest::addColumn<QPoint>("spacings");
    QTest::addColumn<QPoint>("used"); // before the second item and before the second row

    // The parent's style says 7/9 as metric (or -1 when bare) and 3/4 per control, the item
    // widgets' own style 5/6, the application style 8/11, a parent box layout 4.
    const QPoint derived(-1, -1);
    QTest::newRow("parent's metric") << "parent" << derived << QPoint(7, 9) << QPoint(7, 9);
    QTest::newRow("widgets' style") << "bare, widgets" << derived << derived << QPoint(5, 6);
    QTest::newRow("widgets' style across")
        << "bare, widgets" << QPoint(-1, 2) << QPoint(-1, 2) << QPoint(5, 2);
    QTest::newRow("spacers: parent's style") << "bare" << derived << derived << QPoint(3, 4);
    QTest::newRow("in a box layout") << "box" << derived << QPoint(4, 4) << QPoint(4, 4);
    QTest::newRow("no parent: application") << "none" << derived << derived << QPoint(8, 11);
    QTest::newRow("zero: items touch") << "parent" << QPoint() << QPoint() << QPoint();
}

void tst_FlowLayout::spacingFallbacks()
{
    QFETCH(QString, setup);
    QFETCH(QPoint, given);
    QFETCH(QPoint, spacings);
    QFETCH(QPoint, used);
    SpacingStyle parentStyle(7, 9, 3, 4), bare(-1, -1, 3, 4), itemStyle(1, 1, 5, 6);
    QApplication::setStyle(new SpacingStyle(-1, -1, 8, 11));
    QWidget parent;
    parent.setStyle(setup.startsWith(QLatin1String("bare")) ? &bare : &parentStyle);
    const bool nested = setup == QLatin1String("box") || setup == QLatin1String("none");
    auto* layout = nested ? new ZuFlowLayout(0, given.x(), given.y())
                          : new ZuFlowLayout(&parent, 0, given.x(), given.y());
    std::unique_ptr<ZuFlowLayout> unparented(setup == QLatin1String("none") ? layout : nullptr);
    if (setup == QLatin1String("box")) {
        auto* box = new QVBoxLayout(&parent);
        box->setSpacing(4);
        box->addLayout(layout);
    }
    for (int i = 0; i < 3; ++i) {
        if (setup.endsWith(QLatin1String("widgets"))) {
            auto* widget = new QWidget(&parent);
            widget->setStyle(&itemStyle);
            widget->setFixedSize(50, 20);
            layout->addWidget(widget);
        } else {
            layout->addItem(item(50, 20));
        }
    }
    QCOMPARE(QPoint(layout->horizontalSpacing(), layout->verticalSpacing()), spacings);
    QCOMPARE(layout->heightForWidth(120), 40 + used.y());
    layout->setGeometry(QRect(0, 0, 120, 100));
    QCOMPARE(layout->itemAt(1)->geometry().topLeft(), QPoint(50 + used.x(), 0));
    QCOMPARE(layout->itemAt(2)->geometry().topLeft(), QPoint(0, 20 + used.y()));
}

void tst_FlowLayout::heightCache()
{
    QWidget parent;
    QPointer<QWidget> widget = new QWidget(&parent);
    widget->setFixedSize(100, 30);
    {
        ZuFlowLayout layout(0, 10, 10);
        QSpacerItem* first = item(50, 20);
        layout.addItem(first);
        layout.addItem(item(50, 20));
        QCOMPARE(layout.heightForWidth(100), 50);
        first->changeSize(50, 40); // not seen until the layout is invalidated, as Qt does
        QCOMPARE(layout.heightForWidth(100), 50);
        layout.invalidate();
        QCOMPARE(layout.heightForWidth(100), 70);
        QCOMPARE(layout.heightForWidth(200), 40);
        layout.addWidget(widget); // another item set, measured again
        QCOMPARE(layout.heightForWidth(200), 80);
        QVERIFY(!layout.itemAt(3) && !layout.itemAt(-1) && !layout.takeAt(3) && !layout.takeAt(-1));
        delete layout.takeAt(0);
        QCOMPARE(layout.heightForWidth(200), 30);
    }
    QVERIFY(widget); // the layout deletes its items, not their widgets
}

QTEST_MAIN(tst_FlowLayout)
#include "tst_flowlayout.moc"
