// Input filters: the key eater on a dialog and on a plain widget, wheel steps, the combo box
// that leaves the wheel to its scroll area, and the fixed header column after mouse drags.
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
#include <QVBoxLayout>
#include <QtTest/qtestspontaneevent.h>
#include <QtTest>

namespace {

// Records the keys that reach it.
class KeyRecorder : public QWidget
{
public:
    QStringList seen;

protected:
    void keyPressEvent(QKeyEvent* inEvent) override { record("press", inEvent); }
    void keyReleaseEvent(QKeyEvent* inEvent) override { record("release", inEvent); }

private:
    void record(const char* inWhat, QKeyEvent* inEvent)
    {
        seen << QStringLiteral("%1 %2%3").arg(
            QLatin1String(inWhat), QKeySequence(inEvent->key()).toString(),
            inEvent->isAutoRepeat() ? QStringLiteral(" repeat") : QString());
    }
};

void sendMouse(QWidget* inTarget, QEvent::Type inType, const QPoint& inPos,
               Qt::MouseButtons inButtons)
{
    QMouseEvent event(inType, inPos, inTarget->mapToGlobal(inPos), Qt::LeftButton, inButtons,
                      Qt::NoModifier);
    QApplication::sendEvent(inTarget, &event);
}

// Drags the section at visual index inFrom onto the section at visual index inTo.
void dragSection(QHeaderView* inHeader, int inFrom, int inTo)
{
    QWidget* viewport = inHeader->viewport();
    const auto centre = [inHeader](int inVisual) {
        const int logical = inHeader->logicalIndex(inVisual);
        return inHeader->sectionViewportPosition(logical) + inHeader->sectionSize(logical) / 2;
    };
    const int y = inHeader->height() / 2;
    const int target = centre(inTo) + (inTo > inFrom ? 3 : -3);
    sendMouse(viewport, QEvent::MouseButtonPress, QPoint(centre(inFrom), y), Qt::LeftButton);
    sendMouse(viewport, QEvent::MouseMove, QPoint((centre(inFrom) + target) / 2, y),
              Qt::LeftButton);
    sendMouse(viewport, QEvent::MouseMove, QPoint(target, y), Qt::LeftButton);
    sendMouse(viewport, QEvent::MouseButtonRelease, QPoint(target, y), Qt::NoButton);
}

QList<int> visualOrder(const QHeaderView* inHeader)
{
    QList<int> order;
    for (int visual = 0; visual < inHeader->count(); ++visual)
        order << inHeader->logicalIndex(visual);
    return order;
}

} // namespace

class tst_InputFilters : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void keyEaterKeepsDialogOpen();
    void keyEaterSwallowsOnlyItsKey();
    void wheelSteps_data();
    void wheelSteps();
    void noWheelComboBoxScrollsArea();
    void headerColumnStaysFixed_data();
    void headerColumnStaysFixed();
};

void tst_InputFilters::keyEaterKeepsDialogOpen()
{
    QDialog dialog;
    auto* edit = new QLineEdit(&dialog);
    new QVBoxLayout(&dialog);
    dialog.layout()->addWidget(edit);
    new ZuKeyEater(&dialog, Qt::Key_Escape);
    QSignalSpy rejected(&dialog, &QDialog::rejected);
    dialog.show();
    QTest::keyClick(edit, Qt::Key_Escape);
    QVERIFY(dialog.isVisible());
    QCOMPARE(rejected.count(), 0);
    QTest::keyClicks(edit, "ok");
    QCOMPARE(edit->text(), QStringLiteral("ok"));
}

void tst_InputFilters::keyEaterSwallowsOnlyItsKey()
{
    KeyRecorder recorder;
    auto* eater = new ZuKeyEater(&recorder, Qt::Key_Escape);
    QCOMPARE(eater->parent(), &recorder);
    QTest::keyClick(&recorder, Qt::Key_Escape);
    QTest::sendKeyEvent(QTest::Press, &recorder, Qt::Key_Escape, QString(), Qt::NoModifier);
    QKeyEvent repeat(QEvent::KeyPress, Qt::Key_Escape, Qt::NoModifier, QString(), true);
    QApplication::sendEvent(&recorder, &repeat);
    QTest::keyClick(&recorder, Qt::Key_A);
    QCOMPARE(recorder.seen, QStringList({"press A", "release A"}));

    ZuKeyEater unattached(nullptr, Qt::Key_A); // watches nothing, harms nothing
    QTest::keyClick(&recorder, Qt::Key_A);
    QCOMPARE(recorder.seen.size(), 4);
}

void tst_InputFilters::wheelSteps_data()
{
    QTest::addColumn<QList<int>>("deltas");
    QTest::addColumn<QList<int>>("steps");
    QTest::newRow("halves add up") << QList<int>{60, 60, 60} << QList<int>{0, 1, 0};
    QTest::newRow("remainder kept") << QList<int>{250, -130, 119} << QList<int>{2, -1, 0};
    QTest::newRow("down") << QList<int>{-60, -60} << QList<int>{0, -1};
    QTest::newRow("negative remainder") << QList<int>{-250, 130} << QList<int>{-2, 1};
    QTest::newRow("huge deltas") << QList<int>{2147483647, 2147483647, 106}
                                 << QList<int>{17895697, 17895697, 1};
}

void tst_InputFilters::wheelSteps()
{
    QFETCH(QList<int>, deltas);
    ZuMouseWheelHelper helper;
    QList<int> steps;
    for (int delta : deltas)
        steps << helper.calcMouseWheelStepsFor120Ticks(delta);
    QTEST(steps, "steps");

    // A copy carries the remainder on.
    ZuMouseWheelHelper half;
    half.calcMouseWheelStepsFor120Ticks(60);
    ZuMouseWheelHelper copy = half;
    QCOMPARE(copy.calcMouseWheelStepsFor120Ticks(60), 1);
}

void tst_InputFilters::noWheelComboBoxScrollsArea()
{
    QScrollArea area;
    auto* content = new QWidget;
    content->setFixedSize(200, 2000);
    auto* combo = new ZuNoWheelComboBox(content);
    combo->addItems({"one", "two", "three"});
    combo->move(10, 10);
    area.setWidget(content);
    area.resize(240, 200);
    area.show();
    QVERIFY(QTest::qWaitForWindowExposed(&area));

    const QPoint pos = combo->rect().center();
    QWheelEvent wheel(pos, combo->mapToGlobal(pos), QPoint(), QPoint(0, -120), Qt::NoButton,
                      Qt::NoModifier, Qt::NoScrollPhase, false);
    // As from the window system: Qt hands a sent wheel event to its receiver only.
    QSpontaneKeyEvent::setSpontaneous(&wheel);
    qApp->notify(combo, &wheel);
    QCOMPARE(combo->currentIndex(), 0);
    QVERIFY(area.verticalScrollBar()->value() > 0);

    // Everything else still reaches the combo box.
    QTest::keyClick(combo, Qt::Key_Down);
    QCOMPARE(combo->currentIndex(), 1);
}

void tst_InputFilters::headerColumnStaysFixed_data()
{
    QTest::addColumn<int>("fixed");
    QTest::addColumn<int>("from");
    QTest::addColumn<int>("to");
    QTest::addColumn<QList<int>>("order");
    QTest::addColumn<int>("moves");
    QTest::newRow("fixed dragged away") << 0 << 0 << 2 << QList<int>{0, 1, 2, 3} << 2;
    QTest::newRow("dropped onto fixed") << 0 << 3 << 0 << QList<int>{0, 1, 2, 3} << 2;
    QTest::newRow("elsewhere") << 0 << 1 << 3 << QList<int>{0, 2, 3, 1} << 1;
    QTest::newRow("middle dragged away") << 2 << 2 << 0 << QList<int>{0, 1, 2, 3} << 2;
    QTest::newRow("across, rightwards") << 2 << 0 << 3 << QList<int>{1, 3, 2, 0} << 2;
    QTest::newRow("across, leftwards") << 2 << 3 << 0 << QList<int>{3, 0, 2, 1} << 2;
}

void tst_InputFilters::headerColumnStaysFixed()
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
    dragSection(header, from, to);
    QTEST(visualOrder(header), "order");
    QTEST(int(moved.count()), "moves");
}

QTEST_MAIN(tst_InputFilters)
#include "tst_inputfilters.moc"
