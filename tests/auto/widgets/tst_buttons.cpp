// The push button's delayed popup menu, the options button and the action with a context menu.
#include "WidgetTest.h"
#include "zubase/ZuActionWithContextMenu.h"
#include "zubase/ZuOptionsButton.h"
#include "zubase/ZuPushButton.h"

#include <QAccessible>
#include <QElapsedTimer>
#include <QLineEdit>
#include <QMenu>

class tst_Buttons : public QObject
{
    Q_OBJECT
private slots:
    void pushButton();
    void optionsButton();
    void actionAsksForContextMenu();
};

// Presses the button for inHoldMs (-1: until it asks for the menu), toggles it first if asked,
// releases it (at its centre, or after sliding off to inReleaseAt) and returns its signals in
// order ("menu@x,y" for a request).
static QStringList hold(ZuPushButton* inButton, int inHoldMs, bool inToggle = false,
                        QPoint inReleaseAt = {})
{
    QStringList log;
    QObject context;
    QObject::connect(inButton, &QAbstractButton::pressed, &context, [&] { log << "pressed"; });
    QObject::connect(inButton, &QAbstractButton::released, &context, [&] { log << "released"; });
    QObject::connect(inButton, &QAbstractButton::clicked, &context, [&] { log << "clicked"; });
    QObject::connect(inButton, &QAbstractButton::toggled, &context, [&] { log << "toggled"; });
    QObject::connect(
        inButton, &ZuPushButton::delayedPopupMenuRequested, &context,
        [&](QPoint inAt) { log << QStringLiteral("menu@%1,%2").arg(inAt.x()).arg(inAt.y()); });
    QTest::mousePress(inButton, Qt::LeftButton);
    if (inToggle)
        inButton->toggle();
    if (inHoldMs == -1 && !QTest::qWaitFor([&] { return !log.filter("menu").isEmpty(); }, 10000))
        return log;
    QTest::qWait(qMax(inHoldMs, 0));
    if (!inReleaseAt.isNull()) {
        QMouseEvent move(QEvent::MouseMove, inReleaseAt, Qt::NoButton, Qt::LeftButton, {});
        QApplication::sendEvent(inButton, &move);
    }
    QTest::mouseRelease(inButton, Qt::LeftButton, {}, inReleaseAt);
    QTest::qWait(400); // nothing comes late
    return log;
}

void tst_Buttons::pushButton()
{
    QCursor::setPos(123, 45);
    const QStringList menu = {"pressed", "released", "menu@123,45"};
    const QStringList click = {"pressed", "released", "clicked"};
    ZuPushButton button;
    QElapsedTimer held;
    held.start();
    QCOMPARE(hold(&button, -1), menu); // and the release that follows does not click
    QVERIFY(held.elapsed() >= 1000);   // never early; load can only make it late
    QCOMPARE(hold(&button, 0), click);
    button.setPopupMenuDelay(0);
    QCOMPARE(hold(&button, 400), click);
    button.setPopupMenuDelay(300);
    button.setCheckable(true);
    held.restart();
    QCOMPARE(hold(&button, -1), menu);
    QVERIFY(held.elapsed() >= 300);
    QCOMPARE(hold(&button, 0, false, {-50, -50}), QStringList({"pressed", "released"})); // slid off
    QCOMPARE(hold(&button, 400, true),
             QStringList({"pressed", "toggled", "toggled", "released", "clicked"}));

    // The menu key and Shift+F10 ask at the button's centre and are taken; unless switched off.
    button.setGeometry(20, 30, 80, 24);
    QSignalSpy requests(&button, &ZuPushButton::delayedPopupMenuRequested);
    QTest::keyClick(&button, Qt::Key_F10);
    QCOMPARE(requests.count(), 0);
    QKeyEvent menuKey(QEvent::KeyPress, Qt::Key_Menu, Qt::NoModifier);
    QApplication::sendEvent(&button, &menuKey);
    QVERIFY(menuKey.isAccepted());
    QCOMPARE(requests, QList<QList<QVariant>>({{button.mapToGlobal(QPoint(39, 11))}}));
    QTest::keyClick(&button, Qt::Key_F10, Qt::ShiftModifier);
    button.setPopupMenuDelay(-1);
    QTest::keyClick(&button, Qt::Key_Menu);
    QCOMPARE(requests.count(), 2);

    // Its private part and timer go with it, also while it waits.
    auto* doomed = new ZuPushButton;
    QTest::mousePress(doomed, Qt::LeftButton);
    LiveObjects live;
    delete doomed;
    QCOMPARE(live.count(), -3);
}

void tst_Buttons::optionsButton()
{
    QWidget window;
    ZuOptionsButton* buttons[] = {new ZuOptionsButton(&window), new ZuOptionsButton(&window),
                                  new ZuOptionsButton(&window)};
    auto* constraint = new QLineEdit(&window);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    for (ZuOptionsButton* button : buttons)
        button->setConstraintWidget(constraint); // only stored
    const QSize fixed(buttons[0]->minimumSizeHint().width(), constraint->sizeHint().height());
    QVERIFY(buttons[0]->size() != fixed);
    buttons[0]->resize(50, 50);
    QCOMPARE(buttons[0]->size(), fixed);
    QCOMPARE(buttons[0]->maximumSize(), fixed);
    QFont font = buttons[1]->font();
    font.setPointSize(font.pointSize() + 3);
    buttons[1]->setFont(font);
    QCOMPARE(buttons[1]->minimumSize(),
             QSize(buttons[1]->minimumSizeHint().width(), fixed.height()));
    delete constraint; // forgotten, not used
    buttons[2]->resize(33, 31);
    buttons[2]->setFont(font);
    QCOMPARE(buttons[2]->size(), QSize(33, 31));

    // A tool button's down arrow, without the menu indicator; a screen reader gets a name.
    QToolButton reference(&window);
    reference.setArrowType(Qt::DownArrow);
    reference.resize(buttons[2]->size());
    QMenu menu;
    buttons[2]->setMenu(&menu);
    QCOMPARE(buttons[2]->grab().toImage(), reference.grab().toImage());
    QCOMPARE(buttons[2]->focusPolicy(), Qt::StrongFocus);
    QCOMPARE(QAccessible::queryAccessibleInterface(buttons[2])->text(QAccessible::Name),
             QStringLiteral("Open menu"));
}

void tst_Buttons::actionAsksForContextMenu()
{
    ZuActionWithContextMenu action(QStringLiteral("Layout"), this);
    QSignalSpy spy(&action, &ZuActionWithContextMenu::customContextMenuRequested);
    action.showToolsContextMenu(QPoint(-7, 9000));
    QCOMPARE(spy, QList<QList<QVariant>>({{QPoint(-7, 9000)}}));
    QCOMPARE(action.text(), QStringLiteral("Layout"));
}

ZU_WIDGET_TEST_MAIN(tst_Buttons)
#include "tst_buttons.moc"
