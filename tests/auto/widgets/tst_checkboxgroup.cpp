// ZuCheckBoxGroup driven by clicks: the parent's three-step cycle, the parent following its
// children, the signals, and boxes that leave the group or die while listed.
#include "zubase/ZuCheckBoxGroup.h"

#include <QCheckBox>
#include <QVBoxLayout>
#include <QtTest>

using States = QVector<bool>;

namespace {

// A window with a parent box and children in the given states, tied by a group.
struct Panel
{
    explicit Panel(const States& inStates)
    {
        auto* layout = new QVBoxLayout(&window);
        parent = new QCheckBox(QStringLiteral("All"), &window);
        layout->addWidget(parent);
        for (bool state : inStates) {
            auto* child = new QCheckBox(QString::number(children.size()), &window);
            child->setChecked(state);
            layout->addWidget(child);
            children << child;
            group.addCheckBox(child);
        }
        group.setParentCheckBox(parent);
        window.show();
    }
    States states() const
    {
        States result;
        for (const QCheckBox* child : children)
            result << (child && child->isChecked());
        return result;
    }
    void click(QCheckBox* inBox) { QTest::mouseClick(inBox, Qt::LeftButton, {}, QPoint(6, 8)); }

    QWidget window;
    ZuCheckBoxGroup group;
    QCheckBox* parent = nullptr;
    QList<QPointer<QCheckBox>> children;
    QString events; // from the group's signals: "t1" toggled child 1, "c1" clicked child 1

    void record()
    {
        QObject::connect(&group, &ZuCheckBoxGroup::checkBoxToggled,
                         [this](QCheckBox* inBox) { events += "t" + inBox->text(); });
        QObject::connect(&group, &ZuCheckBoxGroup::checkBoxClicked,
                         [this](QCheckBox* inBox) { events += "c" + inBox->text(); });
    }
};

} // namespace

class tst_CheckBoxGroup : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void parentCycle();
    void childChanges();
    void setCheckedAll_data();
    void setCheckedAll();
    void duplicatesAndRemoval();
    void destroyedChildLeaves();
    void restoreWhileSlotRemovesChild();
};

void tst_CheckBoxGroup::parentCycle()
{
    Panel panel({false, true, false});
    panel.record();
    QVERIFY(panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
    const struct
    {
        Qt::CheckState parent;
        States children;
        QString events;
    } steps[] = {{Qt::Checked, {true, true, true}, "t0t2"},
                 {Qt::Unchecked, {false, false, false}, "t0t1t2"},
                 {Qt::PartiallyChecked, {false, true, false}, "t1"}}; // the mix comes back
    for (const auto& step : steps) {
        panel.events.clear();
        panel.click(panel.parent);
        QCOMPARE(panel.parent->checkState(), step.parent);
        QCOMPARE(panel.states(), step.children);
        QCOMPARE(panel.events, step.events);
    }
}

void tst_CheckBoxGroup::childChanges()
{
    Panel panel({false, false, false});
    panel.record();
    panel.click(panel.children[1]);
    QCOMPARE(panel.events, QStringLiteral("t1c1"));
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);

    panel.events.clear(); // by the program: re-evaluated, no click reported
    panel.children[0]->setChecked(true);
    panel.children[2]->setChecked(true);
    QCOMPARE(panel.events, QStringLiteral("t0t2"));
    QVERIFY(!panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::Checked);

    panel.children[2]->setChecked(false); // the latest mix is the one that comes back
    for (int i = 0; i < 3; ++i)
        panel.click(panel.parent);
    QCOMPARE(panel.states(), States({true, true, false}));
}

void tst_CheckBoxGroup::setCheckedAll_data()
{
    QTest::addColumn<States>("states");
    QTest::addColumn<bool>("checked");
    QTest::addColumn<int>("toggles");

    QTest::newRow("mixed, on") << States{true, false, false} << true << 2;
    QTest::newRow("mixed, off") << States{true, false, true} << false << 2;
    QTest::newRow("already on") << States{true, true} << true << 0;
    QTest::newRow("no children: the parent") << States{} << true << 0;
}

void tst_CheckBoxGroup::setCheckedAll()
{
    QFETCH(States, states);
    QFETCH(bool, checked);
    QFETCH(int, toggles);

    Panel panel(states);
    QCOMPARE(panel.parent->isTristate(), states.contains(true) && states.contains(false));
    QCOMPARE(panel.parent->checkState(), !states.contains(true)   ? Qt::Unchecked
                                         : states.contains(false) ? Qt::PartiallyChecked
                                                                  : Qt::Checked);
    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    panel.group.setCheckedAll(checked);
    QCOMPARE(toggled.count(), toggles);
    QCOMPARE(panel.states(), States(states.size(), checked));
    QVERIFY(!panel.parent->isTristate());
    QCOMPARE(panel.parent->isChecked(), checked);
    panel.click(panel.parent); // uniform now: a click flips them all
    QCOMPARE(panel.states(), States(states.size(), !checked));
}

void tst_CheckBoxGroup::duplicatesAndRemoval()
{
    Panel panel({true, false});
    QCheckBox* twice = panel.children[0];
    QCheckBox* other = panel.children[1];
    panel.group.addCheckBox(twice); // counts twice
    panel.group.addCheckBox(nullptr);
    panel.group.removeCheckBox(nullptr);
    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    twice->setChecked(false);
    QCOMPARE(toggled.count(), 2);
    QCOMPARE(panel.parent->checkState(), Qt::Unchecked);

    panel.group.removeCheckBox(twice); // both entries go
    panel.click(twice);
    QCOMPARE(toggled.count(), 2);
    other->setChecked(true);
    QCOMPARE(panel.parent->checkState(), Qt::Checked);
    panel.click(panel.parent);
    QVERIFY(!other->isChecked() && twice->isChecked());

    QCheckBox newParent; // a replaced parent no longer drives the children
    panel.group.setParentCheckBox(&newParent);
    panel.click(panel.parent);
    QVERIFY(!other->isChecked());
    newParent.click();
    QVERIFY(other->isChecked());
}

void tst_CheckBoxGroup::destroyedChildLeaves()
{
    Panel panel({true, true, false});
    delete panel.children[2].data();
    QVERIFY(!panel.parent->isTristate()); // the two left agree
    QCOMPARE(panel.parent->checkState(), Qt::Checked);
    panel.children[1]->setChecked(false);
    for (int i = 0; i < 3; ++i)
        panel.click(panel.parent);
    QCOMPARE(panel.states(), States({true, false, false}));
}

void tst_CheckBoxGroup::restoreWhileSlotRemovesChild()
{
    Panel panel({false, true, true});
    QCheckBox* removed = panel.children[2];
    // A host that drops a box from the group when another one turns on.
    connect(panel.children[1], &QCheckBox::toggled, this, [&](bool inOn) {
        if (inOn)
            panel.group.removeCheckBox(removed);
    });
    panel.click(panel.parent); // all on
    panel.click(panel.parent); // all off
    // Back to the mix: the second box turns on and the third leaves meanwhile, so more states
    // are recorded than boxes are listed.
    panel.click(panel.parent);
    QCOMPARE(panel.states(), States({false, true, false}));
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
}

QTEST_MAIN(tst_CheckBoxGroup)
#include "tst_checkboxgroup.moc"
