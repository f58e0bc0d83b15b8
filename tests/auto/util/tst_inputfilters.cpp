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
#include <QTableWidget>
#include <QtTest/qtestspontaneevent.h>
#include <QtTest>

class tst_InputFilters : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    // The eaten key, pressed or released, does not reach the dialog; others do.
    void keyEater()
    {
        struct KeyCounter : QObject // installed first, so it sees what gets past the eater
        {
            int keys = 0;
            bool eventFilter(QObject*, QEvent* inEvent) override
            {
                keys +=
                    inEvent->type() == QEvent::KeyPress || inEvent->type() == QEvent::KeyRelease;
                return false;
            }
        } counter;
        QDialog dialog;
        auto* edit = new QLineEdit(&dialog);
        dialog.installEventFilter(&counter);
        new ZuKeyEater(&dialog, Qt::Key_Escape);
        dialog.show();
        QTest::keyClick(edit, Qt::Key_Escape);
        QVERIFY(dialog.isVisible());
        QTest::keyClick(&dialog, Qt::Key_A);
        QCOMPARE(counter.keys, 2);
    }

    // Whole steps of 120; the remainder, also a negative one, is carried on by copies too.
    void wheelSteps_data()
    {
        QTest::addColumn<QList<int>>("deltas");
        QTest::addColumn<QList<int>>("steps");
        QTest::newRow("halves") << QList<int>{60, 60, 60} << QList<int>{0, 1, 0};
        QTest::newRow("remainder kept") << QList<int>{250, -130, 119} << QList<int>{2, -1, 0};
        QTest::newRow("negative remainder") << QList<int>{-60, -190, 130} << QList<int>{0, -2, 1};
        QTest::newRow("huge") << QList<int>{INT_MAX, INT_MAX, 106}
                              << QList<int>{17895697, 17895697, 1};
    }
    void wheelSteps()
    {
        QFETCH(QList<int>, deltas);
        ZuMouseWheelHelper helper;
        QList<int> steps;
        for (int delta : deltas) {
            ZuMouseWheelHelper copy = helper;
            steps << copy.calcMouseWheelStepsFor120Ticks(delta);
            helper = copy;
        }
        QTEST(steps, "steps");
    }

    // The wheel scrolls the area the combo box is in; keys still reach the combo box.
    void noWheelComboBox()
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
        QWheelEvent wheel(QPointF(5, 5), combo->mapToGlobal(QPoint(5, 5)), QPoint(),
                          QPoint(0, -120), Qt::NoButton, Qt::NoModifier, Qt::NoScrollPhase, false);
        QSpontaneKeyEvent::setSpontaneous(&wheel); // as from the window system, which propagates
        qApp->notify(combo, &wheel);
        QVERIFY(combo->currentIndex() == 0 && area.verticalScrollBar()->value() > 0);
        QTest::keyClick(combo, Qt::Key_Down);
        QCOMPARE(combo->currentIndex(), 1);
    }

    // A drag that moves the fixed column, drops onto it or crosses it is put right.
    void headerColumn_data()
    {
        QTest::addColumn<int>("fixed");
        QTest::addColumn<int>("from"); // dragged from this visual index onto that one
        QTest::addColumn<int>("to");
        QTest::addColumn<QList<int>>("order"); // logical indices in visual order, then the moves
        QTest::newRow("fixed dragged away") << 0 << 0 << 2 << QList<int>{0, 1, 2, 3, 2};
        QTest::newRow("dropped onto fixed") << 0 << 3 << 0 << QList<int>{0, 1, 2, 3, 2};
        QTest::newRow("elsewhere") << 0 << 1 << 3 << QList<int>{0, 2, 3, 1, 1};
        QTest::newRow("across, rightwards") << 1 << 0 << 3 << QList<int>{2, 1, 3, 0, 2};
        QTest::newRow("across, leftwards") << 2 << 3 << 0 << QList<int>{3, 0, 2, 1, 2};
        QTest::newRow("fixed column missing") << 5 << 0 << 3 << QList<int>{1, 2, 3, 0, 1};
    }
    void headerColumn()
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
        const int shift = to > from ? 3 : -3; // past the target's middle
        for (auto type :
             {QEvent::MouseButtonPress, QEvent::MouseMove, QEvent::MouseButtonRelease}) {
            const int logical = header->logicalIndex(type == QEvent::MouseButtonPress ? from : to);
            const QPoint pos(header->sectionViewportPosition(logical) +
                                 header->sectionSize(logical) / 2 +
                                 (type == QEvent::MouseButtonPress ? 0 : shift),
                             header->height() / 2);
            QMouseEvent event(type, pos, header->viewport()->mapToGlobal(pos), Qt::LeftButton,
                              type == QEvent::MouseButtonRelease ? Qt::NoButton : Qt::LeftButton,
                              Qt::NoModifier);
            QApplication::sendEvent(header->viewport(), &event);
        }
        QList<int> order;
        for (int visual = 0; visual < header->count(); ++visual)
            order << header->logicalIndex(visual);
        QTEST(order << moved.count(), "order");
    }
};

QTEST_MAIN(tst_InputFilters)
#include "tst_inputfilters.moc"
