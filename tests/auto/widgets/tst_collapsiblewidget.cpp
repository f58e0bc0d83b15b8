// ZuCollapsibleWidget: the heights it fixes, the animation, the keys and names for screen readers,
// the icons picked by the background, content and header widgets.
#include "zubase/ZuCollapsibleWidget.h"

#include <QAccessible>
#include <QHBoxLayout>
#include <QLabel>
#include <QToolButton>
#include <QtTest>

namespace {

// Hints a height of 50, or 6000 / width when it has height-for-width.
struct Content : QWidget
{
    explicit Content(bool inHeightForWidth) : heightForWidthOn(inHeightForWidth) {}
    QSize sizeHint() const override { return QSize(10, heightForWidthOn ? 999 : 50); }
    bool hasHeightForWidth() const override { return heightForWidthOn; }
    int heightForWidth(int inWidth) const override { return 6000 / inWidth; }
    bool heightForWidthOn;
};

QToolButton* button(const ZuCollapsibleWidget& inWidget)
{
    return inWidget.findChild<QToolButton*>();
}

int headerHeight(const ZuCollapsibleWidget& inWidget)
{
    return button(inWidget)->parentWidget()->sizeHint().height() + 1;
}

// The test images are solid colours: red/green plain, blue/yellow "_dark".
QColor iconColour(const ZuCollapsibleWidget& inWidget)
{
    const QImage image = button(inWidget)->icon().pixmap(4, 4).toImage();
    return image.isNull() ? QColor() : image.pixelColor(0, 0);
}

} // namespace

class tst_CollapsibleWidget : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void heights_data();
    void heights();
    void animationAndKeys();
    void icons_data();
    void icons();
    void contentAndHeaderWidgets();
};

void tst_CollapsibleWidget::heights_data()
{
    QTest::addColumn<int>("content"); // 0 none, 1 size hint, 2 height-for-width
    QTest::addColumn<bool>("dynamic");
    QTest::addColumn<int>("expanded"); // content height at width 300
    QTest::addColumn<int>("resized");  // at width 150
    QTest::newRow("no content") << 0 << true << 0 << 0;
    QTest::newRow("size hint") << 1 << true << 50 << 50;
    QTest::newRow("height for width") << 2 << false << 20 << 20;
    QTest::newRow("height for width, dynamic") << 2 << true << 20 << 40;
}

void tst_CollapsibleWidget::heights()
{
    QFETCH(int, content);
    QFETCH(bool, dynamic);
    QFETCH(int, expanded);
    QFETCH(int, resized);
    ZuCollapsibleWidget widget(QStringLiteral("Series"), nullptr);
    widget.setResizeContentDynamically(dynamic);
    QWidget* frame = widget.findChildren<QFrame*>().last();
    if (content)
        widget.setContentWidget(new Content(content == 2));
    widget.resize(300, 100);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QVERIFY(!widget.isExpanded() && frame->maximumHeight() == 0);
    const int header = headerHeight(widget);
    for (bool open : {true, false, true}) {
        widget.setExpanded(open);
        QVERIFY(widget.isExpanded() == open && button(widget)->isChecked() == open);
        QCOMPARE(frame->maximumHeight(), open ? expanded : 0);
        QCOMPARE(widget.minimumHeight(), header + (open ? expanded : 0));
        QCOMPARE(widget.maximumHeight(), widget.minimumHeight());
    }
    widget.resize(150, widget.height());
    QTRY_COMPARE(widget.maximumHeight(), header + resized);
    QCOMPARE(widget.minimumHeight(), header + resized);
}

void tst_CollapsibleWidget::animationAndKeys()
{
    ZuCollapsibleWidget widget(QStringLiteral("Series"), nullptr);
    widget.setContentWidget(new Content(false));
    widget.setAnimationDuration(60);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    const int header = headerHeight(widget);
    QAccessibleInterface* accessible = QAccessible::queryAccessibleInterface(button(widget));
    QCOMPARE(accessible->text(QAccessible::Name), QStringLiteral("Expand Series"));
    QTest::mouseClick(button(widget), Qt::LeftButton);
    // Then the keys a user tries on the focused button; each one animates.
    bool open = true;
    for (Qt::Key key : {Qt::Key_Space, Qt::Key_Return, Qt::Key_Enter, Qt::Key_Space}) {
        QCOMPARE(widget.isExpanded(), open);
        QCOMPARE(accessible->text(QAccessible::Name),
                 QLatin1String(open ? "Collapse Series" : "Expand Series"));
        QCOMPARE(widget.maximumHeight(), open ? header : header + 50); // starts where it was
        QTRY_COMPARE(widget.maximumHeight(), open ? header + 50 : header);
        QCOMPARE(widget.minimumHeight(), widget.maximumHeight());
        QTest::keyClick(button(widget), key);
        open = !open;
    }
    widget.setTitle(QStringLiteral("Other"));
    QCOMPARE(accessible->text(QAccessible::Name), QStringLiteral("Collapse Other"));
}

void tst_CollapsibleWidget::icons_data()
{
    QTest::addColumn<int>("baseValue");
    QTest::addColumn<QColor>("closed");
    QTest::addColumn<QColor>("open");
    QTest::newRow("128: plain") << 128 << QColor(Qt::red) << QColor(Qt::green);
    QTest::newRow("129: dark") << 129 << QColor(Qt::blue) << QColor(Qt::yellow);
}

void tst_CollapsibleWidget::icons()
{
    QFETCH(int, baseValue);
    QFETCH(QColor, closed);
    QFETCH(QColor, open);
    QWidget parent;
    QPalette palette;
    palette.setColor(QPalette::Base, QColor::fromHsv(0, 0, baseValue));
    parent.setPalette(palette);
    auto* widget = new ZuCollapsibleWidget(QStringLiteral("Series"), &parent);
    QCOMPARE(iconColour(*widget), closed);
    palette.setColor(QPalette::Base, QColor::fromHsv(0, 0, 255 - baseValue));
    widget->setPalette(palette); // chosen once: the icons stay
    button(*widget)->click();
    QCOMPARE(iconColour(*widget), open);
}

void tst_CollapsibleWidget::contentAndHeaderWidgets()
{
    ZuCollapsibleWidget widget(QStringLiteral("Series"), nullptr);
    auto* first = new QLabel(QStringLiteral("first"));
    widget.setContentWidget(first);
    widget.setContentWidget(new QLabel(QStringLiteral("second")));
    QVERIFY(!first->isHidden()); // taken out of the layout only
    delete first;
    delete widget.contentWidget();
    QVERIFY(!widget.contentWidget()); // measured as without content
    widget.setExpanded(true);
    QCOMPARE(widget.maximumHeight(), headerHeight(widget));

    // Content indented by expanderButtonIndent() lines up with the title; the header widget
    // follows the title.
    auto* content = new QWidget;
    auto* text = new QLabel(QStringLiteral("Under the title"), content);
    (new QHBoxLayout(content))->addWidget(text);
    content->layout()->setContentsMargins(widget.expanderButtonIndent(), 0, 0, 0);
    widget.setContentWidget(content);
    widget.setHeaderWidget(new QLabel(QStringLiteral("old")));
    auto* header = new QLabel(QStringLiteral("12 images"));
    widget.setHeaderWidget(header);
    widget.setExpanded(true);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    const auto x = [&](QWidget* inChild) {
        return inChild->mapTo(&widget, QPoint()).x();
    };
    QCOMPARE(x(text), x(button(widget)->parentWidget()->findChildren<QLabel*>().first()));
    QVERIFY(header->isVisible() && x(header) > x(text));
    delete header;
    QVERIFY(!widget.headerWidget());
    widget.setExpanded(false); // the content area folds away whatever its content's minimum
    QTRY_COMPARE(content->parentWidget()->height(), 0);
}

QTEST_MAIN(tst_CollapsibleWidget)
#include "tst_collapsiblewidget.moc"
