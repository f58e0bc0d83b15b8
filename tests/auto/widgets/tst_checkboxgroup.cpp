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
    explicit Panel(const States& inStates, bool inTieParent = true)
    {
        auto* layout = new QVBoxLayout(&window);
        parent = new QCheckBox(QStringLiteral("All"), &window);
        layout->addWidget(parent);
        for (bool state : inStates) {
            auto* child = new QCheckBox(QStringLiteral("Child %1").arg(children.size()), &window);
            child->setChecked(state);
            layout->addWidget(child);
            children << child;
            group.addCheckBox(child);
        }
        if (inTieParent)
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

    QWidget window;
    ZuCheckBoxGroup group;
    QCheckBox* parent = nullptr;
    QList<QPointer<QCheckBox>> children;
};

QList<QCheckBox*> boxes(const QSignalSpy& inSpy)
{
    QList<QCheckBox*> result;
    for (const QList<QVariant>& arguments : inSpy)
        result << arguments.at(0).value<QCheckBox*>();
    return result;
}

void click(QCheckBox* inBox)
{
    QTest::mouseClick(inBox, Qt::LeftButton, Qt::NoModifier, QPoint(6, inBox->height() / 2));
}

} // namespace

class tst_CheckBoxGroup : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void parentCycle();
    void parentFollowsChildren_data();
    void parentFollowsChildren();
    void childClicks();
    void setCheckedAll_data();
    void setCheckedAll();
    void duplicatesAndRemoval();
    void destroyedChildLeaves();
    void restoreWhileSlotRemovesChild();
};

void tst_CheckBoxGroup::parentCycle()
{
    Panel panel({false, true, false});
    QVERIFY(panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    QSignalSpy clicked(&panel.group, &ZuCheckBoxGroup::checkBoxClicked);
    const auto& c = panel.children;

    click(panel.parent);
    QCOMPARE(panel.parent->checkState(), Qt::Checked);
    QCOMPARE(panel.states(), States({true, true, true}));
    QCOMPARE(boxes(toggled), QList<QCheckBox*>({c[0], c[2]}));

    toggled.clear();
    click(panel.parent);
    QCOMPARE(panel.parent->checkState(), Qt::Unchecked);
    QCOMPARE(panel.states(), States({false, false, false}));
    QCOMPARE(boxes(toggled), QList<QCheckBox*>({c[0], c[1], c[2]}));

    toggled.clear();
    click(panel.parent); // back to the mix recorded before the first click
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
    QCOMPARE(panel.states(), States({false, true, false}));
    QCOMPARE(boxes(toggled), QList<QCheckBox*>({c[1]}));
    QCOMPARE(clicked.count(), 0);
}

void tst_CheckBoxGroup::parentFollowsChildren_data()
{
    QTest::addColumn<States>("states");
    QTest::addColumn<bool>("tristate");
    QTest::addColumn<Qt::CheckState>("parentState");

    QTest::newRow("all checked") << States{true, true, true} << false << Qt::Checked;
    QTest::newRow("none checked") << States{false, false} << false << Qt::Unchecked;
    QTest::newRow("empty group") << States{} << false << Qt::Unchecked;
    QTest::newRow("mixed") << States{true, false} << true << Qt::PartiallyChecked;
}

void tst_CheckBoxGroup::parentFollowsChildren()
{
    QFETCH(States, states);
    QFETCH(bool, tristate);
    QFETCH(Qt::CheckState, parentState);

    Panel panel(states, false);
    panel.parent->setTristate(true);
    panel.parent->setCheckState(Qt::PartiallyChecked);
    panel.group.setParentCheckBox(panel.parent);
    QCOMPARE(panel.parent->isTristate(), tristate);
    QCOMPARE(panel.parent->checkState(), parentState);

    // A two-state parent sets every child.
    if (!tristate) {
        click(panel.parent);
        QCOMPARE(panel.states(), States(states.size(), parentState == Qt::Unchecked));
    }
}

void tst_CheckBoxGroup::childClicks()
{
    Panel panel({false, false, false});
    QStringList events;
    connect(&panel.group, &ZuCheckBoxGroup::checkBoxToggled, this,
            [&](QCheckBox* inBox) { events << "toggled " + inBox->text(); });
    connect(&panel.group, &ZuCheckBoxGroup::checkBoxClicked, this,
            [&](QCheckBox* inBox) { events << "clicked " + inBox->text(); });

    click(panel.children[1]);
    QCOMPARE(events, QStringList({"toggled Child 1", "clicked Child 1"}));
    QVERIFY(panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);

    // Set by the program, not by a click: re-evaluated, and no clicked signal.
    events.clear();
    panel.children[0]->setChecked(true);
    panel.children[2]->setChecked(true);
    QCOMPARE(events, QStringList({"toggled Child 0", "toggled Child 2"}));
    QVERIFY(!panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::Checked);

    // The mix recorded after the latest change by hand is the one that comes back.
    panel.children[2]->setChecked(false);
    click(panel.parent);
    click(panel.parent);
    click(panel.parent);
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
    QTest::newRow("no children sets the parent") << States{} << true << 0;
}

void tst_CheckBoxGroup::setCheckedAll()
{
    QFETCH(States, states);
    QFETCH(bool, checked);
    QFETCH(int, toggles);

    Panel panel(states);
    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    panel.group.setCheckedAll(checked);
    QCOMPARE(toggled.count(), toggles);
    QCOMPARE(panel.states(), States(states.size(), checked));
    QVERIFY(!panel.parent->isTristate());
    QCOMPARE(panel.parent->isChecked(), checked);

    // The uniform states are now the recorded ones: a click of the parent flips them all.
    click(panel.parent);
    QCOMPARE(panel.states(), States(states.size(), !checked));
}

void tst_CheckBoxGroup::duplicatesAndRemoval()
{
    Panel panel({true, false});
    QCheckBox* twice = panel.children[0];
    QCheckBox* other = panel.children[1];
    panel.group.addCheckBox(twice); // counts twice: two of three checked
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
    panel.group.addCheckBox(nullptr);
    panel.group.removeCheckBox(nullptr);

    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    twice->setChecked(false);
    QCOMPARE(toggled.count(), 2); // once per entry
    QCOMPARE(panel.parent->checkState(), Qt::Unchecked);

    panel.group.removeCheckBox(twice); // both entries go
    toggled.clear();
    twice->setChecked(true);
    click(twice);
    QCOMPARE(toggled.count(), 0);
    other->setChecked(true);
    QVERIFY(!panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::Checked);
    click(panel.parent);
    QVERIFY(!other->isChecked());
    QVERIFY(!twice->isChecked());

    // A replaced parent no longer drives the children.
    QCheckBox newParent;
    panel.group.setParentCheckBox(&newParent);
    click(panel.parent);
    QVERIFY(!other->isChecked());
    newParent.click();
    QVERIFY(other->isChecked());
}

void tst_CheckBoxGroup::destroyedChildLeaves()
{
    Panel panel({true, false, false});
    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    delete panel.children[0].data();
    // The two left agree: the parent follows them at once.
    QVERIFY(!panel.parent->isTristate());
    QCOMPARE(panel.parent->checkState(), Qt::Unchecked);

    panel.children[1]->setChecked(true);
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
    click(panel.parent);
    click(panel.parent);
    click(panel.parent);
    QCOMPARE(panel.states(), States({false, true, false}));
    QCOMPARE(toggled.count(), 1 + 1 + 2 + 1);
}

void tst_CheckBoxGroup::restoreWhileSlotRemovesChild()
{
    Panel panel({false, true, true});
    QCheckBox* removed = panel.children[2];
    // A host that drops a box from the group as soon as another one turns on.
    connect(panel.children[1], &QCheckBox::toggled, this, [&](bool inChecked) {
        if (inChecked)
            panel.group.removeCheckBox(removed);
    });
    click(panel.parent); // all on
    click(panel.parent); // all off
    QCOMPARE(panel.states(), States({false, false, false}));
    // Back to the mix: the second box turns on and the third leaves the group meanwhile, so
    // more states are recorded than boxes are listed.
    click(panel.parent);
    QCOMPARE(panel.states(), States({false, true, false}));
    QCOMPARE(panel.parent->checkState(), Qt::PartiallyChecked);
    QSignalSpy toggled(&panel.group, &ZuCheckBoxGroup::checkBoxToggled);
    removed->setChecked(true);
    QCOMPARE(toggled.count(), 0);
}

QTEST_MAIN(tst_CheckBoxGroup)
#include "tst_checkboxgroup.moc"
