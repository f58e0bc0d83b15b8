// ZuNewLayoutAction's grid: pointing, clicking, the keys in a menu, the caption, the cells painted.
#include "zubase/ZuNewLayoutAction.h"

#include <QAccessible>
#include <QMenu>
#include <QtTest>

using Points = QVector<QPoint>;

namespace {

QString caption(QWidget* inGrid)
{
    return QAccessible::queryAccessibleInterface(inGrid)->text(QAccessible::Description);
}

} // namespace

class tst_NewLayoutAction : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void pointing_data();
    void pointing();
    void keysInMenu();
};

void tst_NewLayoutAction::pointing_data()
{
    QTest::addColumn<int>("step");
    QTest::addColumn<Points>("moves"); // y from the top of the grid, below the caption
    QTest::addColumn<QSize>("layout");

    QTest::newRow("4 x 2") << 1 << Points{{3 * 34 + 5, 34 + 5}} << QSize(4, 2);
    QTest::newRow("x 33, above the grid") << 1 << Points{{33, -40}} << QSize(1, 1);
    QTest::newRow("x 34") << 1 << Points{{34, 0}} << QSize(2, 1);
    QTest::newRow("no upper clamp") << 1 << Points{{400, 300}} << QSize(12, 9);
    QTest::newRow("step 0 is 1") << 0 << Points{{40, 40}} << QSize(2, 2);
    QTest::newRow("step 3 starts at 3") << 3 << Points() << QSize(3, 1);
    QTest::newRow("step 3, column 6") << 3 << Points{{5 * 34 + 5, 0}} << QSize(6, 1);
    QTest::newRow("step 3, far left") << 3 << Points{{5 * 34, 0}, {-40, 0}} << QSize(3, 1);
}

void tst_NewLayoutAction::pointing()
{
    QFETCH(int, step);
    QFETCH(Points, moves);
    QFETCH(QSize, layout);
    ZuNewLayoutAction action(nullptr, step);
    QWidget* grid = action.defaultWidget();
    const int header = QFontMetrics(grid->font()).height() + 16;
    QCOMPARE(grid->size(), QSize(340, header + 170));
    QSignalSpy selected(&action, &ZuNewLayoutAction::layoutSelected);
    QPoint at(1, 1);
    for (const QPoint& move : moves) {
        at = move + QPoint(0, header);
        QMouseEvent event(QEvent::MouseMove, at, Qt::NoButton, Qt::NoButton, Qt::NoModifier);
        QApplication::sendEvent(grid, &event);
    }
    QCOMPARE(caption(grid),
             QStringLiteral("New Layout %1x%2").arg(layout.width()).arg(layout.height()));
    QCOMPARE(selected.count(), 0);
    QTest::mouseClick(grid, Qt::LeftButton, {}, at);
    QCOMPARE(selected.count(), 1);
    QCOMPARE(selected.at(0), QVariantList({layout.width(), layout.height()}));

    // The selected cells are filled with the highlight, the next ones are not.
    const QImage image = grid->grab().toImage();
    const QColor highlight = grid->palette().color(QPalette::Highlight);
    const auto cell = [&](int inColumn, int inRow) {
        return image.pixelColor(2 + 34 * inColumn + 15, header + 2 + 34 * inRow + 15);
    };
    const int column = qMin(layout.width(), 10) - 1, row = qMin(layout.height(), 5) - 1;
    QCOMPARE(cell(0, 0), highlight);
    QCOMPARE(cell(column, row), highlight);
    QVERIFY(layout.width() > 9 || cell(column + 1, row) != highlight);
    QVERIFY(layout.height() > 4 || cell(column, row + 1) != highlight);
    // An unselected cell is outlined in the text colour.
    if (layout.width() < 10)
        QCOMPARE(image.pixelColor(2 + 34 * 9 + 15, header + 2 + 34 * 4),
                 grid->palette().color(QPalette::WindowText));
}

void tst_NewLayoutAction::keysInMenu()
{
    QMenu menu;
    auto* action = new ZuNewLayoutAction(&menu, 2);
    menu.addAction(action);
    QWidget* grid = action->defaultWidget();
    QSignalSpy selected(action, &ZuNewLayoutAction::layoutSelected);
    menu.popup(QPoint(0, 0));
    QVERIFY(QTest::qWaitForWindowExposed(&menu));
    QTest::keyClick(&menu, Qt::Key_Down);
    QTRY_VERIFY(grid->hasFocus());
    QCOMPARE(caption(grid), QStringLiteral("New Layout 2x1"));

    const struct
    {
        Qt::Key key;
        int times;
        const char* caption;
    } steps[] = {{Qt::Key_Right, 6, "New Layout 10x1"}, {Qt::Key_Down, 7, "New Layout 10x5"},
                 {Qt::Key_Up, 1, "New Layout 10x4"},    {Qt::Key_Left, 1, "New Layout 8x4"},
                 {Qt::Key_Left, 5, "New Layout 2x4"},   {Qt::Key_Up, 5, "New Layout 2x1"}};
    for (const auto& step : steps) {
        for (int i = 0; i < step.times; ++i)
            QTest::keyClick(grid, step.key);
        QCOMPARE(caption(grid), QLatin1String(step.caption));
    }
    QTest::keyClick(grid, Qt::Key_Right);
    QTest::keyClick(grid, Qt::Key_Down);
    QTest::keyClick(grid, Qt::Key_Return);
    QTest::keyClick(grid, Qt::Key_Enter);
    QCOMPARE(selected.count(), 2);
    QCOMPARE(selected.at(1), QVariantList({4, 2}));
    QVERIFY(menu.isVisible());
    QTest::keyClick(grid, Qt::Key_Escape);
    QTRY_VERIFY(!menu.isVisible());
}

QTEST_MAIN(tst_NewLayoutAction)
#include "tst_newlayoutaction.moc"
