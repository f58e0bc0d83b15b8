// ZuDirectionalLabel and ZuPixmapWidget rendered into images, at pixel ratios 1 and 2.
#include "zubase/ZuDirectionalLabel.h"
#include "zubase/ZuPixmapWidget.h"

#include <QAccessible>
#include <QtTest>

#include <private/qhighdpiscaling_p.h>

#include <functional>
#include <memory>

namespace {

using Label = ZuDirectionalLabel;
const QPalette kPalette(Qt::black, Qt::white, Qt::white, Qt::black, Qt::gray, Qt::black, Qt::white);

QImage grabbed(QWidget& inWidget)
{
    return inWidget.grab().toImage().convertToFormat(QImage::Format_RGB32);
}

// Bounding box of the pixels for which inTest holds; by default the ink.
QRect boxOf(
    const QImage& inImage,
    const std::function<bool(QRgb)>& inTest = [](QRgb inPixel) { return qGray(inPixel) < 100; })
{
    QRect box;
    for (int y = 0; y < inImage.height(); ++y)
        for (int x = 0; x < inImage.width(); ++x)
            if (inTest(inImage.pixel(x, y)))
                box |= QRect(x, y, 1, 1);
    return box;
}

Label* label(int inDirection, const QSize& inSize = {30, 120})
{
    auto* label = new Label;
    label->setText("Caption");
    label->setPalette(kPalette);
    label->setAlignment(Qt::AlignRight | Qt::AlignBottom);
    label->setDirection(Label::Direction(inDirection));
    label->resize(inSize);
    return label;
}

// A label turned bottom to top on a screen of the given pixel ratio, grabbed at that ratio.
QImage grabAtRatio(qreal inRatio)
{
    QHighDpiScaling::setGlobalFactor(inRatio);
    std::unique_ptr<Label> turned(label(3));
    turned->show();
    const QImage image = QTest::qWaitForWindowExposed(turned.get()) ? grabbed(*turned) : QImage();
    turned.reset();
    QHighDpiScaling::setGlobalFactor(1);
    return image;
}

} // namespace

class TstLabels : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    // A turned label looks like a plain one turned; hints turn too, the name is the text.
    void directions_data()
    {
        QTest::addColumn<int>("direction");
        for (int direction = 0; direction < 4; ++direction)
            QTest::addRow("%d", direction) << direction;
    }
    void directions()
    {
        QFETCH(int, direction);
        std::unique_ptr<Label> plain(label(0, {120, 30}));
        std::unique_ptr<Label> turned(
            label(direction, direction < 2 ? QSize(120, 30) : QSize(30, 120)));
        const QRect ink = boxOf(grabbed(*plain));
        const int x = ink.x(), y = ink.y(), w = ink.width(), h = ink.height();
        const QRect expected[] = {ink, QRect(120 - x - w, 30 - y - h, w, h),
                                  QRect(30 - y - h, x, h, w), QRect(y, 120 - x - w, h, w)};
        const QRect seen = boxOf(grabbed(*turned));
        QVERIFY((seen.topLeft() - expected[direction].topLeft()).manhattanLength() <= 1);
        QVERIFY((seen.bottomRight() - expected[direction].bottomRight()).manhattanLength() <= 1);
        const auto turn = [direction](QSize inSize) {
            return direction < 2 ? inSize : inSize.transposed();
        };
        QCOMPARE(turned->sizeHint(), turn(plain->sizeHint()));
        QCOMPARE(turned->minimumSizeHint(), turn(plain->minimumSizeHint()));
        QCOMPARE(QAccessible::queryAccessibleInterface(turned.get())->text(QAccessible::Name),
                 "Caption");
    }

    // After a change the label shows what a new label in that state shows; without one the
    // rendering is reused (each rendering makes a child label).
    void cacheFollowsChanges()
    {
        const std::function<void(Label*)> changes[] = {
            [](Label* inLabel) { inLabel->setText("Other"); },
            [](Label* inLabel) { inLabel->setFont(QFont("DejaVu Sans", 20)); },
            [](Label* inLabel) { inLabel->resize(30, 90); },
            [](Label* inLabel) { inLabel->setPalette(QPalette(Qt::red)); },
            [](Label* inLabel) { inLabel->setDirection(Label::BottomToTop); },
            [](Label* inLabel) { inLabel->setAlignment(Qt::AlignCenter); },
            [](Label* inLabel) {
                inLabel->setMargin(6);
            }};
        for (const auto& change : changes) {
            std::unique_ptr<Label> turned(label(2)), fresh(label(2));
            const QImage before = grabbed(*turned);
            change(turned.get());
            change(fresh.get());
            const QImage after = grabbed(*turned);
            QVERIFY(after != before);
            QCOMPARE(after, grabbed(*fresh));
        }
        struct Counter : QObject
        {
            int children = 0;
            bool eventFilter(QObject*, QEvent* inEvent) override
            {
                children += inEvent->type() == QEvent::ChildAdded;
                return false;
            }
        } counter;
        std::unique_ptr<Label> turned(label(2));
        grabbed(*turned);
        turned->installEventFilter(&counter);
        grabbed(*turned);
        QCOMPARE(counter.children, 0);
    }

    // Drawn at the screen's ratio, not enlarged from ratio 1, in the same place.
    void sharpAtRatio2()
    {
        const QImage ratio1 = grabAtRatio(1), ratio2 = grabAtRatio(2);
        QCOMPARE(ratio2.size(), ratio1.size() * 2);
        const QImage fast = ratio1.scaled(ratio2.size());
        const QImage smooth =
            ratio1.scaled(ratio2.size(), Qt::IgnoreAspectRatio, Qt::SmoothTransformation);
        int sharper = 0;
        for (int y = 0; y < ratio2.height(); ++y)
            for (int x = 0; x < ratio2.width(); ++x)
                sharper += ratio2.pixel(x, y) != fast.pixel(x, y) &&
                           ratio2.pixel(x, y) != smooth.pixel(x, y);
        QVERIFY2(sharper > 100, qPrintable(QString::number(sharper)));
        const QRect ink1 = boxOf(ratio1), ink2 = boxOf(ratio2);
        QVERIFY((ink2.topLeft() - 2 * ink1.topLeft()).manhattanLength() <= 4);
        QVERIFY((ink2.bottomRight() - 2 * ink1.bottomRight()).manhattanLength() <= 4);
    }

    // Fitted with its aspect ratio, centred, inside the frame; a null pixmap is not drawn.
    void pixmapFit_data()
    {
        QTest::addColumn<QSize>("pixmap");
        QTest::addColumn<QRect>("drawn");
        QTest::newRow("wide") << QSize(200, 100) << QRect(1, 25, 98, 50);
        QTest::newRow("tall") << QSize(100, 200) << QRect(25, 1, 50, 98);
        QTest::newRow("odd") << QSize(30, 7) << QRect(1, 38, 98, 23);
        QTest::newRow("null") << QSize() << QRect();
    }
    void pixmapFit()
    {
        QFETCH(QSize, pixmap);
        ZuPixmapWidget widget;
        QPixmap red(pixmap);
        red.fill(Qt::red);
        widget.setPixmap(red);
        widget.setBackgroundColor(Qt::blue);
        widget.setFrameColor(Qt::green);
        widget.resize(100, 100);
        QCOMPARE(widget.sizeHint(), red.size());
        const QImage image = grabbed(widget);
        QTEST(boxOf(image, [](QRgb p) { return p == qRgb(255, 0, 0); }), "drawn");
        QCOMPARE(boxOf(image, [](QRgb p) { return p != qRgb(0, 255, 0); }), QRect(1, 1, 98, 98));
        QCOMPARE(boxOf(image, [](QRgb p) { return p == qRgb(0, 0, 255); }), QRect(1, 1, 98, 98));
    }

    // The box, 70 % grey, hugs the text in a 120 % font; frame and text take WindowText.
    void overlay()
    {
        ZuPixmapWidget widget;
        QFont font("DejaVu Sans");
        font.setPointSize(9);
        widget.setFont(font);
        widget.setPalette(kPalette);
        widget.resize(160, 90);
        widget.setOverlayText("Series 3", Qt::AlignBottom | Qt::AlignRight);
        font.setPointSize(10);
        const QRect text =
            QFontMetrics(font, &widget)
                .boundingRect(QRect(0, 0, 159, 89), Qt::AlignBottom | Qt::AlignRight, "Series 3");
        const auto grey = [](QRgb p) {
            return p != qRgb(255, 255, 255) && p != qRgb(0, 0, 0);
        };
        const QImage image = grabbed(widget);
        QCOMPARE(boxOf(image, grey) & QRect(1, 1, 158, 88),
                 text.adjusted(-2, -2, 1, 1) & QRect(1, 1, 158, 88));
        QVERIFY(qAbs(qRed(image.pixel(text.topLeft() - QPoint(1, 1))) - 166) <= 1);
        QCOMPARE(image.pixel(0, 0), qRgb(0, 0, 0));
        QVERIFY(boxOf(image.copy(text)).isValid());
        widget.setOverlayText(QString(), Qt::AlignCenter);
        QCOMPARE(boxOf(grabbed(widget), grey) & QRect(1, 1, 158, 88), QRect());
    }
};

QTEST_MAIN(TstLabels)
#include "tst_labels.moc"
