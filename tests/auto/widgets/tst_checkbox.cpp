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
    void sizeHints_data();
    void sizeHints();
    void accessibleName_data();
    void accessibleName();
    void accessibleNameFollowsLabel();
    void mnemonicClicksBox();
};

void tst_CheckBox::clickOnLabel_data()
{
    QTest::addColumn<int>("button");
    QTest::addColumn<bool>("releaseOutside");

    QTest::newRow("left") << int(Qt::LeftButton) << false;
    QTest::newRow("right") << int(Qt::RightButton) << false;
    QTest::newRow("left, released outside") << int(Qt::LeftButton) << true;
}

void tst_CheckBox::clickOnLabel()
{
    QFETCH(int, button);
    QFETCH(bool, releaseOutside);

    ZuCheckBox widget(QStringLiteral("Show annotations"), nullptr);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QCheckBox* box = widget.checkBox();
    QLabel* label = widget.label();
    QSignalSpy pressed(box, &QCheckBox::pressed);
    QSignalSpy released(box, &QCheckBox::released);
    QSignalSpy clicked(box, &QCheckBox::clicked);
    QSignalSpy toggled(box, &QCheckBox::toggled);

    for (const bool checkedAfter : {true, false}) {
        QTest::mousePress(label, Qt::MouseButton(button), Qt::NoModifier, label->rect().center());
        QVERIFY(box->isDown()); // drawn pressed until the release
        QCOMPARE(box->isChecked(), !checkedAfter);
        QCOMPARE(clicked.count(), checkedAfter ? 0 : 1);
        const QPoint at = releaseOutside ? QPoint(-40, label->height() * 3) : label->rect().center();
        QTest::mouseRelease(label, Qt::MouseButton(button), Qt::NoModifier, at);
        QVERIFY(!box->isDown());
        QCOMPARE(box->isChecked(), checkedAfter);
    }
    QCOMPARE(pressed.count(), 2);
    QCOMPARE(released.count(), 2);
    QCOMPARE(clicked.count(), 2);
    QCOMPARE(toggled.count(), 2);
    QCOMPARE(toggled.at(0).at(0).toBool(), true);
    QCOMPARE(toggled.at(1).at(0).toBool(), false);
}

void tst_CheckBox::sizeHints_data()
{
    QTest::addColumn<QString>("text");

    QTest::newRow("empty") << QString();
    QTest::newRow("plain") << QStringLiteral("Show annotations");
    QTest::newRow("two rich lines") << QStringLiteral("<b>Sync</b><br>scrolling and zoom");
}

void tst_CheckBox::sizeHints()
{
    QFETCH(QString, text);

    ZuCheckBox widget(text, nullptr);
    const QSize box = widget.checkBox()->sizeHint();
    const QSize label = widget.label()->sizeHint();
    QCOMPARE(widget.sizeHint(),
             QSize(box.width() + label.width(), qMax(box.height(), label.height())));
    const QSize boxMinimum = widget.checkBox()->minimumSizeHint();
    const QSize labelMinimum = widget.label()->minimumSizeHint();
    QCOMPARE(widget.minimumSizeHint(),
             QSize(boxMinimum.width() + labelMinimum.width(),
                   qMax(boxMinimum.height(), labelMinimum.height())));
    QCOMPARE(widget.label()->text(), text);
}

void tst_CheckBox::accessibleName_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("name");

    QTest::newRow("plain") << "Show annotations"
                           << "Show annotations";
    QTest::newRow("mnemonic") << "&Sync scrolling"
                              << "Sync scrolling";
    QTest::newRow("ampersand") << "Fish && chips"
                               << "Fish & chips";
    QTest::newRow("rich text") << "<b>Bold</b> and <i>plain</i>"
                               << "Bold and plain";
}

void tst_CheckBox::accessibleName()
{
    QFETCH(QString, text);
    QFETCH(QString, name);

    ZuCheckBox widget(text, nullptr);
    QAccessibleInterface* box = QAccessible::queryAccessibleInterface(widget.checkBox());
    QVERIFY(box);
    QCOMPARE(box->role(), QAccessible::CheckBox);
    QCOMPARE(box->text(QAccessible::Name), name);
    QCOMPARE(widget.label()->buddy(), widget.checkBox());
}

void tst_CheckBox::accessibleNameFollowsLabel()
{
    ZuCheckBox widget(QStringLiteral("First"), nullptr);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QCheckBox* box = widget.checkBox();

    widget.label()->setText(QStringLiteral("Second"));
    QTRY_COMPARE(box->accessibleName(), QStringLiteral("Second"));

    // A name the caller gave the box is kept.
    box->setAccessibleName(QStringLiteral("Mine"));
    widget.label()->setText(QStringLiteral("Third"));
    widget.label()->repaint();
    box->setFocus();
    QCOMPARE(box->accessibleName(), QStringLiteral("Mine"));
}

void tst_CheckBox::mnemonicClicksBox()
{
    ZuCheckBox widget(QStringLiteral("&Sync scrolling"), nullptr);
    widget.show();
    widget.activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(&widget));
    QSignalSpy clicked(widget.checkBox(), &QCheckBox::clicked);
    QTest::keyClick(&widget, Qt::Key_S, Qt::AltModifier);
    QTRY_COMPARE(clicked.count(), 1);
    QVERIFY(widget.checkBox()->isChecked());
    QVERIFY(widget.checkBox()->hasFocus());
}

QTEST_MAIN(tst_CheckBox)
#include "tst_checkbox.moc"
