// ZuCheckBox as a user works it: the label works the box, sizes add up, screen readers read the
// label's text.
#include "zubase/ZuCheckBox.h"

#include <QAccessible>
#include <QCheckBox>
#include <QLabel>
#include <QtTest>

class tst_CheckBox : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void clickOnLabel_data();
    void clickOnLabel();
    void accessibleNameAndSize_data();
    void accessibleNameAndSize();
};

void tst_CheckBox::clickOnLabel_data()
{
    QTest::addColumn<int>("button");
    QTest::addColumn<QPoint>("releaseAt"); // from the label's centre

    QTest::addColumn<bool>("enabled"); // the inner box

    QTest::newRow("left") << int(Qt::LeftButton) << QPoint() << true;
    QTest::newRow("right") << int(Qt::RightButton) << QPoint() << true;
    QTest::newRow("released outside") << int(Qt::LeftButton) << QPoint(-300, 80) << true;
    QTest::newRow("box disabled") << int(Qt::LeftButton) << QPoint() << false;
}

void tst_CheckBox::clickOnLabel()
{
    QFETCH(int, button);
    QFETCH(QPoint, releaseAt);
    QFETCH(bool, enabled);

    ZuCheckBox widget(QStringLiteral("Show annotations"), nullptr);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QCheckBox* box = widget.checkBox();
    QLabel* label = widget.label();
    box->setEnabled(enabled);
    QStringList events;
    connect(box, &QCheckBox::pressed, this, [&] { events << "pressed"; });
    connect(box, &QCheckBox::released, this, [&] { events << "released"; });
    connect(box, &QCheckBox::toggled, this, [&](bool inOn) { events << (inOn ? "on" : "off"); });
    connect(box, &QCheckBox::clicked, this, [&] { events << "clicked"; });

    for (const bool on : {true, false}) {
        QTest::mousePress(label, Qt::MouseButton(button), {}, label->rect().center());
        QVERIFY(box->isDown()); // drawn pressed until the release
        QCOMPARE(box->isChecked(), enabled && !on);
        QTest::mouseRelease(label, Qt::MouseButton(button), {}, label->rect().center() + releaseAt);
        QVERIFY(!box->isDown());
        QCOMPARE(box->isChecked(), enabled && on);
    }
    QCOMPARE(events, enabled ? QStringList({"pressed", "on", "released", "clicked", "pressed",
                                            "off", "released", "clicked"})
                             : QStringList());
}

void tst_CheckBox::accessibleNameAndSize_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("name");

    QTest::newRow("plain") << "Show annotations"
                           << "Show annotations";
    QTest::newRow("mnemonic") << "&Sync && zoom"
                              << "Sync & zoom";
    QTest::newRow("rich text") << "<b>Bold</b><br>and <i>plain</i>"
                               << "Bold and plain";
}

void tst_CheckBox::accessibleNameAndSize()
{
    QFETCH(QString, text);
    QFETCH(QString, name);

    ZuCheckBox widget(text, nullptr);
    QCheckBox* box = widget.checkBox();
    QCOMPARE(QAccessible::queryAccessibleInterface(box)->text(QAccessible::Name), name);
    QCOMPARE(widget.label()->buddy(), box);
    const QSize boxHint = box->sizeHint(), labelHint = widget.label()->sizeHint();
    QCOMPARE(widget.sizeHint(), QSize(boxHint.width() + labelHint.width(),
                                      qMax(boxHint.height(), labelHint.height())));
    const QSize boxMin = box->minimumSizeHint(), labelMin = widget.label()->minimumSizeHint();
    QCOMPARE(widget.minimumSizeHint(),
             QSize(boxMin.width() + labelMin.width(), qMax(boxMin.height(), labelMin.height())));

    // A new text is read when it is painted or the box gets the focus; a name the caller gave
    // the box stays.
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    widget.label()->setText(QStringLiteral("Second"));
    widget.label()->repaint();
    QCOMPARE(box->accessibleName(), QStringLiteral("Second"));
    widget.label()->setText(QStringLiteral("Third"));
    QFocusEvent focusIn(QEvent::FocusIn);
    QApplication::sendEvent(box, &focusIn);
    QCOMPARE(box->accessibleName(), QStringLiteral("Third"));
    box->setAccessibleName(QStringLiteral("Mine"));
    widget.label()->setText(QStringLiteral("Fourth"));
    widget.label()->repaint();
    QCOMPARE(box->accessibleName(), QStringLiteral("Mine"));
}

QTEST_MAIN(tst_CheckBox)
#include "tst_checkbox.moc"
