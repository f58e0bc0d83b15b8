// ZuCheckBox's label works its box and names it; a ZuCheckBoxGroup's parent follows its children
// and drives them in three steps.
#include "zubase/ZuCheckBox.h"
#include "zubase/ZuCheckBoxGroup.h"

#include <QAccessible>
#include <QCheckBox>
#include <QLabel>
#include <QtTest>

using States = QVector<bool>;

namespace {

// Children under one parent box; the group's signals go to events as "t<child>" (toggled) and
// "c<child>" (clicked).
struct Panel
{
    explicit Panel(const States& inStates)
    {
        for (bool state : inStates) {
            children << new QCheckBox(QString::number(children.size()), &window);
            children.last()->setChecked(state);
            group.addCheckBox(children.last());
        }
        group.setParentCheckBox(&parent);
        QObject::connect(&group, &ZuCheckBoxGroup::checkBoxToggled,
                         [this](QCheckBox* inBox) { events += "t" + inBox->text(); });
        QObject::connect(&group, &ZuCheckBoxGroup::checkBoxClicked,
                         [this](QCheckBox* inBox) { events += "c" + inBox->text(); });
    }
    States states() const
    {
        States result;
        for (const QCheckBox* child : children)
            result << (child && child->isChecked());
        return result;
    }
    QWidget window;
    QCheckBox parent;
    ZuCheckBoxGroup group;
    QList<QPointer<QCheckBox>> children;
    QString events;
};

} // namespace

class tst_CheckBoxes : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void labelWorksBox_data();
    void labelWorksBox();
    void parentCycle();
    void membership();
};

void tst_CheckBoxes::labelWorksBox_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("name"); // read by a screen reader
    QTest::addColumn<int>("button");
    QTest::addColumn<bool>("enabled");

    QTest::newRow("mnemonic, right button") << "&Sync && zoom"
                                            << "Sync & zoom" << int(Qt::RightButton) << true;
    QTest::newRow("rich text, box disabled") << "<b>Bold</b><br>and <i>plain</i>"
                                             << "Bold and plain" << int(Qt::LeftButton) << false;
}

void tst_CheckBoxes::labelWorksBox()
{
    QFETCH(QString, text);
    QFETCH(QString, name);
    QFETCH(int, button);
    QFETCH(bool, enabled);

    ZuCheckBox widget(text, nullptr);
    QCheckBox* box = widget.checkBox();
    QLabel* label = widget.label();
    box->setEnabled(enabled);
    QSignalSpy clicked(box, &QCheckBox::clicked);
    for (const bool on : {true, false}) {
        QTest::mousePress(label, Qt::MouseButton(button));
        QVERIFY(box->isDown()); // drawn pressed until the release
        QTest::mouseRelease(label, Qt::MouseButton(button), {}, QPoint(-300, 80)); // outside
        QVERIFY(!box->isDown());
        QCOMPARE(box->isChecked(), enabled && on);
    }
    QCOMPARE(clicked.count(), enabled ? 2 : 0);
    QCOMPARE(QAccessible::queryAccessibleInterface(box)->text(QAccessible::Name), name);
    QCOMPARE(widget.sizeHint().width(), box->sizeHint().width() + label->sizeHint().width());

    widget.show(); // a new text is read once it is painted
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    label->setText(QStringLiteral("Second"));
    label->repaint();
    QCOMPARE(box->accessibleName(), QStringLiteral("Second"));
}

void tst_CheckBoxes::parentCycle()
{
    Panel panel({false, true, false});
    QCOMPARE(panel.parent.checkState(), Qt::PartiallyChecked);
    const struct
    {
        Qt::CheckState parent;
        States children;
        const char* events;
    } steps[] = {{Qt::Checked, {true, true, true}, "t0t2"},
                 {Qt::Unchecked, {false, false, false}, "t0t1t2"},
                 {Qt::PartiallyChecked, {false, true, false}, "t1"}}; // the mix comes back
    for (const auto& step : steps) {
        panel.events.clear();
        panel.parent.click();
        QCOMPARE(panel.parent.checkState(), step.parent);
        QCOMPARE(panel.states(), step.children);
        QCOMPARE(panel.events, QLatin1String(step.events));
    }
    panel.group.setCheckedAll(true); // records the uniform states: one click flips them all
    QVERIFY(!panel.parent.isTristate() && panel.parent.isChecked());
    panel.parent.click();
    QCOMPARE(panel.states(), States({false, false, false}));
    Panel empty({}); // no children: the parent is set
    empty.group.setCheckedAll(true);
    QVERIFY(empty.parent.isChecked());
}

void tst_CheckBoxes::membership()
{
    Panel panel({false, false});
    panel.children[1]->click();
    QCOMPARE(panel.events, QStringLiteral("t1c1"));
    QCOMPARE(panel.parent.checkState(), Qt::PartiallyChecked);
    for (int i = 0; i < 3; ++i) // the latest mix is the one recorded
        panel.parent.click();
    QCOMPARE(panel.states(), States({false, true}));
    panel.events.clear();
    panel.group.addCheckBox(panel.children[0]); // listed twice, counts twice
    panel.group.addCheckBox(nullptr);
    panel.children[0]->setChecked(true); // set by the program: no click reported
    QCOMPARE(panel.events, QStringLiteral("t0t0"));
    QCOMPARE(panel.parent.checkState(), Qt::Checked);
    panel.group.removeCheckBox(panel.children[0]); // every entry goes
    panel.group.removeCheckBox(nullptr);
    panel.children[0]->click();
    panel.children[1]->setChecked(false);
    QCOMPARE(panel.events, QStringLiteral("t0t0t1"));
    QCOMPARE(panel.parent.checkState(), Qt::Unchecked);

    // A destroyed box leaves the group: the parent follows the others at once.
    Panel destroyed({true, true, false});
    delete destroyed.children[2].data();
    QVERIFY(!destroyed.parent.isTristate() && destroyed.parent.isChecked());

    // A host drops a box while the mix comes back: more states recorded than boxes listed.
    Panel removed({false, true, true});
    connect(removed.children[1], &QCheckBox::toggled, this, [&](bool inOn) {
        if (inOn)
            removed.group.removeCheckBox(removed.children[2]);
    });
    for (int i = 0; i < 3; ++i)
        removed.parent.click();
    QCOMPARE(removed.states(), States({false, true, false}));
}

QTEST_MAIN(tst_CheckBoxes)
#include "tst_checkboxes.moc"
