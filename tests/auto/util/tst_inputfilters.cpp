// Input filters: the key eater on a dialog, wheel steps, the combo box that leaves the wheel
// to its scroll area, and the fixed header column after mouse drags.
#include "zubase/ZuHeaderColumnFixer.h"
#include "zubase/ZuKeyEater.h"
#include "zubase/ZuMouseWheelHelper.h"
#include "zubase/ZuNoWheelComboBox.h"

#include <QDialog>
#include <QHeaderView>
#include <QLineEdit>
#include <QScrollArea>
#include <QScrollBar>
#include <QSignalSpy>
#include <QTableWidget>
#include <QtTest/qtestspontaneevent.h>
#include <QtTest>

class tst_InputFilters : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void keyEater();
    void wheelSteps_data();
    void wheelSteps();
    void noWheelComboBox();
    void headerColumn_data();
    void headerColumn();
};

void tst_InputFilters::keyEater()
{
    // Counts the key events that get past the eater (filters run newest first).
    struct KeyCounter : QObject
    {
        int keys = 0;
        bool eventFilter(QObject*, QEvent* inEvent) override
        {
            keys += inEvent->type() == QEvent::KeyPress || inEvent->type() == QEvent::KeyRelease;
            return false;
        }
    } counter;
    QDialog dialog;
    auto* edit = new QLineEdit(&dialog);
    dialog.installEventFilter(&counter);
    new ZuKeyEater(&dialog, Qt::Key_Escape);
    QSignalSpy rejected(&dialog, &QDialog::rejected);
    dialog.show();
    QTest::keyClick(edit, Qt::Key_Escape);
    QKeyEvent repeat(QEvent::KeyPress, Qt::Key_Escape, Qt::NoModifier, QString(), true);
    QApplication::sendEvent(&dialog, &repeat);
    QVERIFY(dialog.isVisible());
    QCOMPARE(rejected.count(), 0);
    QCOMPARE(counter.keys, 0);
    QTest::keyClick(&dialog, Qt::Key_A);
    QCOMPARE(counter.keys, 2);
    QTest::keyClicks(edit, "ok");
    QCOMPARE(edit->text(), QStringLiteral("ok"));
    ZuKeyEater unattached(nullptr, Qt::Key_A); // watches nothing
}

void tst_InputFilters::wheelSteps_data()
{
    QTest::addColumn<QList<int>>("deltas");
    QTest::addColumn<QList<int>>("steps");
    QTest::newRow("halves") << QList<int>{60, 60, 60} << QList<int>{0, 1, 0};
    QTest::newRow("remainder kept") << QList<int>{250, -130, 119} << QList<int>{2, -1, 0};
    QTest::newRow("negative remainder") << QList<int>{-60, -190, 130} << QList<int>{0, -2, 1};
    QTest::newRow("huge") << QList<int>{INT_MAX, INT_MAX, 106} << QList<int>{17895697, 17895697, 1};
}

void tst_InputFilters::wheelSteps()
{
    QFETCH(QList<int>, deltas);
    ZuMouseWheelHelper helper;
    QList<int> steps;
    for (int delta : deltas) {
        ZuMouseWheelHelper copy = helper; // a copy carries the remainder on
        steps << copy.calcMouseWheelStepsFor120Ticks(delta);
        helper = copy;
    }
    QTEST(steps, "steps");
}

void tst_InputFilters::noWheelComboBox()
{
    QScrollArea area;
    auto* content = new QWidget;
    content->setFixedSize(200, 2000);
    auto* combo = new ZuNoWheelComboBox(content);
    combo->addItems({"one", "two"});
    area.setWidget(content);
    area.resize(240, 200);
    area.show();
    QVERIFY(QTest::qWaitForWindowExposed(&area));
    const QPoint pos = combo->rect().center();
    QWheelEvent wheel(pos, combo->mapToGlobal(pos), QPoint(), QPoint(0, -120), Qt::NoButton,
                      Qt::NoModifier, Qt::NoScrollPhase, false);
    QSpontaneKeyEvent::setSpontaneous(&wheel); // as from the window system, which propagates
    qApp->notify(combo, &wheel);
    QCOMPARE(combo->currentIndex(), 0);
    QVERIFY(area.verticalScrollBar()->value() > 0);
    QTest::keyClick(combo, Qt::Key_Down); // keys still reach it
    QCOMPARE(combo->currentIndex(), 1);
}

void tst_InputFilters::headerColumn_data()
{
    QTest::addColumn<int>("fixed");
    QTest::addColumn<int>("from"); // dragged from this visual index onto that one
    QTest::addColumn<int>("to");
    QTest::addColumn<QList<int>>("order"); // logical indices in visual order afterwards
    QTest::addColumn<int>("moves");
    QTest::newRow("fixed dragged away") << 0 << 0 << 2 << QList<int>{0, 1, 2, 3} << 2;
    QTest::newRow("dropped onto fixed") << 0 << 3 << 0 << QList<int>{0, 1, 2, 3} << 2;
    QTest::newRow("elsewhere") << 0 << 1 << 3 << QList<int>{0, 2, 3, 1} << 1;
    QTest::newRow("across, rightwards") << 1 << 0 << 3 << QList<int>{2, 1, 3, 0} << 2;
    QTest::newRow("across, leftwards") << 2 << 3 << 0 << QList<int>{3, 0, 2, 1} << 2;
}

void tst_InputFilters::headerColumn()
{
    QFETCH(int, fixed);
    QFETCH(int, from);
    QFETCH(int, to);
    QTableWidget table(2, 4);
    QHeaderView* header = table.horizontalHeader();
    header->setSectionsMovable(true);
    new ZuHeaderColumnFixer(header, fixed);
    table.resize(600, 200);
    table.show();
    QVERIFY(QTest::qWaitForWindowExposed(&table));
    QSignalSpy moved(header, &QHeaderView::sectionMoved);

    const auto mouse = [header](QEvent::Type inType, int inVisual, int inShift) {
        const int logical = header->logicalIndex(inVisual);
        const QPoint pos(header->sectionViewportPosition(logical) +
                             header->sectionSize(logical) / 2 + inShift,
                         header->height() / 2);
        QMouseEvent event(inType, pos, header->viewport()->mapToGlobal(pos), Qt::LeftButton,
                          inType == QEvent::MouseButtonRelease ? Qt::NoButton : Qt::LeftButton,
                          Qt::NoModifier);
        QApplication::sendEvent(header->viewport(), &event);
    };
    const int shift = to > from ? 3 : -3; // past the target's middle
    mouse(QEvent::MouseButtonPress, from, 0);
    mouse(QEvent::MouseMove, to, shift);
    mouse(QEvent::MouseButtonRelease, to, shift);

    QList<int> order;
    for (int visual = 0; visual < header->count(); ++visual)
        order << header->logicalIndex(visual);
    QTEST(order, "order");
    QTEST(int(moved.count()), "moves");
}

QTEST_MAIN(tst_InputFilters)
#include "tst_inputfilters.moc"
