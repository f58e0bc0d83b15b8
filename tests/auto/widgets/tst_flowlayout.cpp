// ZuFlowLayout: rows and wrapping, heights, minimum size, spacing fallbacks and the height cache.
#include "zubase/ZuFlowLayout.h"

#include <QApplication>
#include <QHBoxLayout>
#include <QPointer>
#include <QProxyStyle>
#include <QSpacerItem>
#include <QVBoxLayout>
#include <QtTest>

Q_DECLARE_METATYPE(QMargins)

namespace {

using Rects = QVector<QRect>;
using Sizes = QVector<QSize>;

// Fixed-size item that counts how often the layout asks for its size hint.
class Item : public QLayoutItem
{
public:
    explicit Item(const QSize& inSize, bool* outDeleted = nullptr)
        : size(inSize), deleted(outDeleted)
    {
    }
    ~Item() override
    {
        if (deleted)
            *deleted = true;
    }
    QSize sizeHint() const override
    {
        ++hintCalls;
        return size;
    }
    QSize minimumSize() const override { return size; }
    QSize maximumSize() const override { return size; }
    Qt::Orientations expandingDirections() const override { return {}; }
    void setGeometry(const QRect& inRect) override { rect = inRect; }
    QRect geometry() const override { return rect; }
    bool isEmpty() const override { return false; }

    QSize size;
    QRect rect;
    bool* deleted;
    mutable int hintCalls = 0;
};

// Known spacings: the metrics and the per-control layout spacing, each per orientation.
class SpacingStyle : public QProxyStyle
{
public:
    SpacingStyle(int inMetricH, int inMetricV, int inLayoutH, int inLayoutV)
        : QProxyStyle(QStringLiteral("Fusion")), metricH(inMetricH), metricV(inMetricV),
          layoutH(inLayoutH), layoutV(inLayoutV)
    {
    }
    int pixelMetric(PixelMetric inMetric, const QStyleOption* inOption,
                    const QWidget* inWidget) const override
    {
        if (inMetric == PM_LayoutHorizontalSpacing)
            return metricH;
        if (inMetric == PM_LayoutVerticalSpacing)
            return metricV;
        return QProxyStyle::pixelMetric(inMetric, inOption, inWidget);
    }
    int layoutSpacing(QSizePolicy::ControlType, QSizePolicy::ControlType,
                      Qt::Orientation inOrientation, const QStyleOption*,
                      const QWidget*) const override
    {
        return inOrientation == Qt::Horizontal ? layoutH : layoutV;
    }
    int metricH, metricV, layoutH, layoutV;
};

// A widget of a fixed size hint, in its own style.
class Box : public QWidget
{
public:
    Box(QWidget* inParent, QStyle* inStyle) : QWidget(inParent) { setStyle(inStyle); }
    QSize sizeHint() const override { return QSize(50, 20); }
};

Rects itemRects(const ZuFlowLayout& inLayout)
{
    Rects rects;
    for (int i = 0; i < inLayout.count(); ++i)
        rects << inLayout.itemAt(i)->geometry();
    return rects;
}

Rects layOut(ZuFlowLayout& ioLayout, int inWidth)
{
    ioLayout.setGeometry(QRect(0, 0, inWidth, 500));
    return itemRects(ioLayout);
}

} // namespace

class tst_FlowLayout : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void initTestCase();
    void rows_data();
    void rows();
    void minimumSize_data();
    void minimumSize();
    void spacingFallbacks_data();
    void spacingFallbacks();
    void heightCache();
    void items();

private:
    SpacingStyle* mAppStyle = nullptr;
};

void tst_FlowLayout::initTestCase()
{
    // Without a parent, spacers ask the application style; make its answer known.
    mAppStyle = new SpacingStyle(-1, -1, 8, 11);
    QApplication::setStyle(mAppStyle);
}

void tst_FlowLayout::rows_data()
{
    QTest::addColumn<int>("width");
    QTest::addColumn<int>("margin");
    QTest::addColumn<int>("spacingH");
    QTest::addColumn<int>("spacingV");
    QTest::addColumn<Sizes>("sizes");
    QTest::addColumn<Rects>("expected");
    QTest::addColumn<int>("height");

    const Sizes three(3, QSize(50, 20));
    QTest::newRow("two share a row") << 120 << 0 << 10 << 10 << three
                                     << Rects{{0, 0, 50, 20}, {60, 0, 50, 20}, {0, 30, 50, 20}}
                                     << 50;
    QTest::newRow("last column on right() wraps")
        << 110 << 0 << 10 << 10 << three
        << Rects{{0, 0, 50, 20}, {0, 30, 50, 20}, {0, 60, 50, 20}} << 80;
    QTest::newRow("one pixel more fits") << 111 << 0 << 10 << 10 << three
                                         << Rects{{0, 0, 50, 20}, {60, 0, 50, 20}, {0, 30, 50, 20}}
                                         << 50;
    QTest::newRow("too wide goes alone")
        << 120 << 0 << 10 << 10 << Sizes{{200, 10}, {50, 20}, {50, 20}}
        << Rects{{0, 0, 200, 10}, {0, 20, 50, 20}, {60, 20, 50, 20}} << 40;
    QTest::newRow("tallest sets the row")
        << 70 << 0 << 5 << 7 << Sizes{{30, 10}, {30, 40}, {30, 20}}
        << Rects{{0, 0, 30, 10}, {35, 0, 30, 40}, {0, 47, 30, 20}} << 67;
    QTest::newRow("margins") << 130 << 5 << 10 << 10 << three
                             << Rects{{5, 5, 50, 20}, {65, 5, 50, 20}, {5, 35, 50, 20}} << 60;
    QTest::newRow("zero spacing touches") << 101 << 0 << 0 << 0 << three
                                          << Rects{{0, 0, 50, 20}, {50, 0, 50, 20}, {0, 20, 50, 20}}
                                          << 40;
    QTest::newRow("empty: the margins") << 100 << 6 << 10 << 10 << Sizes() << Rects() << 12;
}

void tst_FlowLayout::rows()
{
    QFETCH(int, width);
    QFETCH(int, margin);
    QFETCH(int, spacingH);
    QFETCH(int, spacingV);
    QFETCH(Sizes, sizes);
    QFETCH(Rects, expected);
    QFETCH(int, height);

    ZuFlowLayout layout(margin, spacingH, spacingV);
    for (const QSize& size : sizes)
        layout.addItem(new Item(size));
    QCOMPARE(layOut(layout, width), expected);
    QCOMPARE(layout.geometry(), QRect(0, 0, width, 500));
    QCOMPARE(layout.heightForWidth(width), height);
    layout.heightForWidth(40); // measuring moves nothing
    QCOMPARE(itemRects(layout), expected);
    QVERIFY(layout.hasHeightForWidth());
    QCOMPARE(layout.expandingDirections(), Qt::Orientations());
}

void tst_FlowLayout::minimumSize_data()
{
    QTest::addColumn<QMargins>("margins");
    QTest::addColumn<Sizes>("sizes");
    QTest::addColumn<QSize>("expected");

    QTest::newRow("empty, margin 5") << QMargins(5, 5, 5, 5) << Sizes() << QSize(9, 9);
    QTest::newRow("unequal margins add up")
        << QMargins(1, 2, 3, 4) << Sizes{{10, 10}} << QSize(14, 16);
    QTest::newRow("largest item, not a row")
        << QMargins(0, 0, 0, 0) << Sizes{{10, 30}, {40, 5}} << QSize(40, 30);
}

void tst_FlowLayout::minimumSize()
{
    QFETCH(QMargins, margins);
    QFETCH(Sizes, sizes);
    QFETCH(QSize, expected);

    ZuFlowLayout layout(0, 10, 10);
    layout.setContentsMargins(margins);
    for (const QSize& size : sizes)
        layout.addItem(new Item(size));
    QCOMPARE(layout.minimumSize(), expected);
    QCOMPARE(layout.sizeHint(), expected);
}

void tst_FlowLayout::spacingFallbacks_data()
{
    QTest::addColumn<QString>("setup");
    QTest::addColumn<int>("spacing"); // given to the constructor, both orientations
    QTest::addColumn<int>("horizontal");
    QTest::addColumn<int>("vertical");
    QTest::addColumn<int>("secondX"); // where the second of three 50 x 20 items starts
    QTest::addColumn<int>("thirdY");  // where the third starts, on the second row

    // The parent's style says 7/9 (metric) or -1 and 3/4 (layout spacing); the item widgets'
    // own style says 5/6; the application style 8/11; a parent box layout 4.
    QTest::newRow("parent widget metric") << "parent" << -1 << 7 << 9 << 57 << 29;
    QTest::newRow("item widgets ask their style") << "parent-nometric-widgets" << -1 << -1 << -1
                                                  << 55 << 26;
    QTest::newRow("spacers ask the parent's style") << "parent-nometric" << -1 << -1 << -1 << 53
                                                    << 24;
    QTest::newRow("nested layouts ask the parent's style")
        << "parent-nometric-nested" << -1 << -1 << -1 << 53 << 24;
    QTest::newRow("in a box layout") << "boxlayout" << -1 << 4 << 4 << 54 << 24;
    QTest::newRow("no parent: application style") << "none" << -1 << -1 << -1 << 58 << 31;
    QTest::newRow("explicit zero") << "parent" << 0 << 0 << 0 << 50 << 20;
}

void tst_FlowLayout::spacingFallbacks()
{
    QFETCH(QString, setup);
    QFETCH(int, spacing);
    QFETCH(int, horizontal);
    QFETCH(int, vertical);
    QFETCH(int, secondX);
    QFETCH(int, thirdY);

    SpacingStyle parentStyle(7, 9, 3, 4);
    SpacingStyle parentNoMetric(-1, -1, 3, 4);
    SpacingStyle itemStyle(1, 1, 5, 6);
    QWidget parent;
    parent.setStyle(setup.startsWith(QLatin1String("parent-nometric")) ? &parentNoMetric
                                                                        : &parentStyle);
    QVBoxLayout* box = nullptr;
    if (setup == QLatin1String("boxlayout")) {
        box = new QVBoxLayout(&parent);
        box->setSpacing(4);
    }
    auto* layout = setup == QLatin1String("none") || box ? new ZuFlowLayout(0, spacing, spacing)
                                                         : new ZuFlowLayout(&parent, 0, spacing,
                                                                            spacing);
    std::unique_ptr<ZuFlowLayout> owned(setup == QLatin1String("none") ? layout : nullptr);
    if (box)
        box->addLayout(layout);
    for (int i = 0; i < 3; ++i) {
        if (setup.endsWith(QLatin1String("widgets"))) {
            layout->addWidget(new Box(&parent, &itemStyle));
        } else if (setup.endsWith(QLatin1String("nested"))) {
            auto* nested = new QHBoxLayout;
            nested->addItem(new QSpacerItem(50, 20, QSizePolicy::Fixed, QSizePolicy::Fixed));
            layout->addItem(nested);
        } else {
            layout->addItem(new Item(QSize(50, 20)));
        }
    }

    QCOMPARE(layout->horizontalSpacing(), horizontal);
    QCOMPARE(layout->verticalSpacing(), vertical);
    const Rects rects = layOut(*layout, 120);
    QCOMPARE(rects.at(1).topLeft(), QPoint(secondX, 0));
    QCOMPARE(rects.at(2).topLeft(), QPoint(0, thirdY));
    QCOMPARE(layout->heightForWidth(120), thirdY + 20);
}

void tst_FlowLayout::heightCache()
{
    ZuFlowLayout layout(0, 10, 10);
    auto* first = new Item(QSize(50, 20));
    layout.addItem(first);
    layout.addItem(new Item(QSize(50, 20)));
    QCOMPARE(layout.heightForWidth(100), 50);

    // The same width and items: answered without asking the items again.
    first->hintCalls = 0;
    QCOMPARE(layout.heightForWidth(100), 50);
    QCOMPARE(first->hintCalls, 0);

    // An item that grew is only seen once the layout is invalidated, as Qt does on a change.
    first->size = QSize(50, 40);
    QCOMPARE(layout.heightForWidth(100), 50);
    layout.invalidate();
    QCOMPARE(layout.heightForWidth(100), 70);
    QVERIFY(first->hintCalls > 0);

    // Another width, or another item set, is measured again.
    QCOMPARE(layout.heightForWidth(200), 40);
    layout.addItem(new Item(QSize(150, 30)));
    QCOMPARE(layout.heightForWidth(200), 80);
    delete layout.takeAt(2);
    QCOMPARE(layout.heightForWidth(200), 40);
}

void tst_FlowLayout::items()
{
    bool deleted = false;
    QWidget parent;
    auto* widget = new QWidget(&parent);
    QPointer<QWidget> guard(widget);
    {
        ZuFlowLayout layout(0, 1, 1);
        layout.addItem(new Item(QSize(1, 1), &deleted));
        layout.addWidget(widget);
        QCOMPARE(layout.count(), 2);
        QCOMPARE(layout.itemAt(1)->widget(), widget);
        QVERIFY(!layout.itemAt(2));
        QVERIFY(!layout.itemAt(-1));
        QVERIFY(!layout.takeAt(2));
        QVERIFY(!layout.takeAt(-1));
        QCOMPARE(layout.count(), 2);
    }
    QVERIFY(deleted);     // the layout owns its items ...
    QVERIFY(!guard.isNull()); // ... but not the widgets
}

QTEST_MAIN(tst_FlowLayout)
#include "tst_flowlayout.moc"
