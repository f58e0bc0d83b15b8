// The push button's delayed popup menu, the options button and the action with a context menu.
#include "ObjectCount.h"

#include "zubase/ZuActionWithContextMenu.h"
#include "zubase/ZuApplication.h"
#include "zubase/ZuOptionsButton.h"
#include "zubase/ZuPushButton.h"

#include <QAccessible>
#include <QElapsedTimer>
#include <QMenu>
#include <QSignalSpy>
#include <QVBoxLayout>
#include <QtTest>

#include <memory>

namespace {

// Records the button's signals in the order they come, as short words.
struct ButtonLog
{
    explicit ButtonLog(ZuPushButton* inButton)
    {
        QObject::connect(inButton, &QAbstractButton::pressed, [this] { words << "pressed"; });
        QObject::connect(inButton, &QAbstractButton::released, [this] { words << "released"; });
        QObject::connect(inButton, &QAbstractButton::clicked, [this] { words << "clicked"; });
        QObject::connect(inButton, &QAbstractButton::toggled, [this] { words << "toggled"; });
        QObject::connect(inButton, &ZuPushButton::delayedPopupMenuRequested,
                         [this](const QPoint& inPos) {
                             words << "menu";
                             menuPositions << inPos;
                         });
    }
    QStringList words;
    QList<QPoint> menuPositions;
};

// A widget of a fixed size hint, to constrain an options button.
class HintedWidget : public QWidget
{
public:
    explicit HintedWidget(const QSize& inHint) : mHint(inHint) {}
    QSize sizeHint() const override { return mHint; }

private:
    QSize mHint;
};

QStringList ownMethods(const QMetaObject& inMeta)
{
    QStringList methods;
    for (int i = inMeta.methodOffset(); i < inMeta.methodCount(); ++i)
        methods << QString::fromLatin1(inMeta.method(i).methodSignature());
    return methods;
}

} // namespace

class tst_Buttons : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void longPressAsksForMenu_data();
    void longPressAsksForMenu();
    void shortPressClicks_data();
    void shortPressClicks();
    void delayOffAndOnAgain();
    void toggleStopsWaitingMenu();
    void menuKeys_data();
    void menuKeys();
    void nothingOutlivesButton();
    void optionsButtonTakesConstraintHeight_data();
    void optionsButtonTakesConstraintHeight();
    void optionsButtonDeadConstraint();
    void optionsButtonHidesMenuIndicator();
    void optionsButtonForScreenReader();
    void actionAsksForContextMenu();
    void metaObjects();
};

void tst_Buttons::init()
{
    QCursor::setPos(QPoint(123, 45));
}

void tst_Buttons::longPressAsksForMenu_data()
{
    QTest::addColumn<int>("delay"); // 0: the default
    QTest::addColumn<bool>("checkable");
    QTest::newRow("default delay") << 0 << false;
    QTest::newRow("checkable, 300 ms") << 300 << true;
}

void tst_Buttons::longPressAsksForMenu()
{
    QFETCH(int, delay);
    QFETCH(bool, checkable);
    ZuPushButton button;
    button.setCheckable(checkable);
    if (delay > 0)
        button.setPopupMenuDelay(delay);
    ButtonLog log(&button);

    QElapsedTimer held;
    held.start();
    QTest::mousePress(&button, Qt::LeftButton);
    QTRY_COMPARE_WITH_TIMEOUT(log.words, QStringList({"pressed", "released", "menu"}), 10000);
    // The request never comes early; load may only make it late.
    QVERIFY2(held.elapsed() >= (delay > 0 ? delay : 1000),
             qPrintable(QString::number(held.elapsed())));
    QCOMPARE(log.menuPositions, QList<QPoint>({QPoint(123, 45)}));
    QVERIFY(!button.isDown());

    // The real release that follows is no click, and nothing else comes.
    QTest::mouseRelease(&button, Qt::LeftButton);
    QTest::qWait(50);
    QCOMPARE(log.words, QStringList({"pressed", "released", "menu"}));
    QVERIFY(!button.isChecked());
}

void tst_Buttons::shortPressClicks_data()
{
    QTest::addColumn<bool>("checkable");
    QTest::newRow("plain") << false;
    QTest::newRow("checkable") << true;
}

void tst_Buttons::shortPressClicks()
{
    QFETCH(bool, checkable);
    ZuPushButton button;
    button.setCheckable(checkable);
    button.setPopupMenuDelay(200);
    ButtonLog log(&button);

    QTest::mouseClick(&button, Qt::LeftButton);
    QStringList expected = {"pressed"};
    if (checkable)
        expected << "toggled";
    expected << "released"
             << "clicked";
    QCOMPARE(log.words, expected);
    // The release stopped the wait: no request comes later.
    QTest::qWait(400);
    QCOMPARE(log.words, expected);
}

void tst_Buttons::delayOffAndOnAgain()
{
    ZuPushButton button;
    button.setPopupMenuDelay(100);
    button.setPopupMenuDelay(0);
    ButtonLog log(&button);

    QTest::mousePress(&button, Qt::LeftButton);
    QTest::qWait(300);
    QTest::mouseRelease(&button, Qt::LeftButton);
    QCOMPARE(log.words, QStringList({"pressed", "released", "clicked"}));

    log.words.clear();
    button.setPopupMenuDelay(100);
    QTest::mousePress(&button, Qt::LeftButton);
    QTRY_COMPARE_WITH_TIMEOUT(log.words, QStringList({"pressed", "released", "menu"}), 10000);
    QTest::mouseRelease(&button, Qt::LeftButton);
}

void tst_Buttons::toggleStopsWaitingMenu()
{
    ZuPushButton button;
    button.setCheckable(true);
    button.setPopupMenuDelay(150);
    ButtonLog log(&button);

    QTest::mousePress(&button, Qt::LeftButton);
    button.toggle();
    QTest::qWait(400);
    QCOMPARE(log.words, QStringList({"pressed", "toggled"}));
    QTest::mouseRelease(&button, Qt::LeftButton);
    QVERIFY(!log.words.contains("menu"));
}

void tst_Buttons::menuKeys_data()
{
    QTest::addColumn<int>("key");
    QTest::addColumn<int>("modifiers");
    QTest::addColumn<int>("delay");
    QTest::addColumn<bool>("requested");
    QTest::newRow("menu key") << int(Qt::Key_Menu) << int(Qt::NoModifier) << 1000 << true;
    QTest::newRow("shift+F10") << int(Qt::Key_F10) << int(Qt::ShiftModifier) << 1000 << true;
    QTest::newRow("F10") << int(Qt::Key_F10) << int(Qt::NoModifier) << 1000 << false;
    QTest::newRow("ctrl+menu key")
        << int(Qt::Key_Menu) << int(Qt::ControlModifier) << 1000 << false;
    QTest::newRow("menu key, delayed menu off")
        << int(Qt::Key_Menu) << int(Qt::NoModifier) << 0 << false;
}

void tst_Buttons::menuKeys()
{
    QFETCH(int, key);
    QFETCH(int, modifiers);
    QFETCH(int, delay);
    QFETCH(bool, requested);
    QWidget window;
    auto* button = new ZuPushButton(&window);
    button->setGeometry(20, 30, 80, 24);
    button->setPopupMenuDelay(delay);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    ButtonLog log(button);

    QTest::keyClick(button, Qt::Key(key), Qt::KeyboardModifiers(modifiers));
    if (requested) {
        QCOMPARE(log.words, QStringList({"menu"}));
        QCOMPARE(log.menuPositions.first(), button->mapToGlobal(QPoint(39, 11))); // its centre
    } else {
        QCOMPARE(log.words, QStringList());
    }
}

void tst_Buttons::nothingOutlivesButton()
{
    // Once, so that whatever Qt makes on first use is not counted.
    delete new ZuPushButton;
    LiveObjects live;
    auto* button = new ZuPushButton;
    button->setPopupMenuDelay(0);
    button->setPopupMenuDelay(100);
    QTest::mousePress(button, Qt::LeftButton);
    delete button; // while the wait runs
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QCOMPARE(live.count(), 0);
    QTest::qWait(200);
}

void tst_Buttons::optionsButtonTakesConstraintHeight_data()
{
    QTest::addColumn<bool>("byFont");
    QTest::newRow("resize") << false;
    QTest::newRow("font change") << true;
}

void tst_Buttons::optionsButtonTakesConstraintHeight()
{
    QFETCH(bool, byFont);
    QWidget window;
    HintedWidget field(QSize(150, 22));
    auto* button = new ZuOptionsButton(&window);
    button->resize(40, 40);
    window.show(); // a hidden widget gets its resize events only when shown
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    button->setConstraintWidget(&field);
    QCOMPARE(button->size(), QSize(40, 40)); // only stored

    if (byFont) {
        QFont font = button->font();
        font.setPointSize(font.pointSize() + 3);
        button->setFont(font);
    } else {
        button->resize(30, 30);
    }
    const QSize expected(button->minimumSizeHint().width(), 22);
    QCOMPARE(button->size(), expected);
    QCOMPARE(button->minimumSize(), expected);
    QCOMPARE(button->maximumSize(), expected);
}

void tst_Buttons::optionsButtonDeadConstraint()
{
    QWidget window;
    auto* button = new ZuOptionsButton(&window);
    auto* field = new HintedWidget(QSize(150, 22));
    button->setConstraintWidget(field);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    delete field;
    button->resize(33, 31);
    QFont font = button->font();
    font.setPointSize(font.pointSize() + 3);
    button->setFont(font);
    QVERIFY(!button->grab().isNull());
    QCOMPARE(button->size(), QSize(33, 31));
    QCOMPARE(button->maximumSize(), QSize(QWIDGETSIZE_MAX, QWIDGETSIZE_MAX));
}

void tst_Buttons::optionsButtonHidesMenuIndicator()
{
    QWidget window;
    auto* plain = new ZuOptionsButton(&window);
    auto* withMenu = new ZuOptionsButton(&window);
    QMenu menu;
    menu.addAction(QStringLiteral("One"));
    withMenu->setMenu(&menu);
    for (ZuOptionsButton* button : {plain, withMenu})
        button->resize(40, 24);
    const QImage expected = plain->grab().toImage();
    QCOMPARE(withMenu->grab().toImage(), expected);
    // Whereas a tool button shows that it has a menu.
    QToolButton tool;
    tool.setArrowType(Qt::DownArrow);
    tool.resize(40, 24);
    const QImage toolPlain = tool.grab().toImage();
    tool.setMenu(&menu);
    QVERIFY(tool.grab().toImage() != toolPlain);
}

void tst_Buttons::optionsButtonForScreenReader()
{
    QWidget window;
    auto* button = new ZuOptionsButton(&window);
    QCOMPARE(button->arrowType(), Qt::DownArrow);
    QCOMPARE(button->focusPolicy(), Qt::StrongFocus);
    QAccessibleInterface* accessible = QAccessible::queryAccessibleInterface(button);
    QVERIFY(accessible);
    QCOMPARE(accessible->role(), QAccessible::Button);
    QCOMPARE(accessible->text(QAccessible::Name), QStringLiteral("Open menu"));
}

void tst_Buttons::actionAsksForContextMenu()
{
    QObject owner;
    ZuActionWithContextMenu action(QStringLiteral("Layout"), &owner);
    QCOMPARE(action.text(), QStringLiteral("Layout"));
    QCOMPARE(action.parent(), &owner);
    QSignalSpy spy(&action, &ZuActionWithContextMenu::customContextMenuRequested);
    action.showToolsContextMenu(QPoint(-7, 9000));
    QCOMPARE(spy.count(), 1);
    QCOMPARE(spy.at(0).at(0).toPoint(), QPoint(-7, 9000));
}

void tst_Buttons::metaObjects()
{
    QCOMPARE(ownMethods(ZuPushButton::staticMetaObject),
             QStringList({"delayedPopupMenuRequested(QPoint)"}));
    QCOMPARE(ownMethods(ZuOptionsButton::staticMetaObject), QStringList());
    QCOMPARE(ownMethods(ZuActionWithContextMenu::staticMetaObject),
             QStringList({"customContextMenuRequested(QPoint)"}));
    const QMetaMethod request = ZuActionWithContextMenu::staticMetaObject.method(
        ZuActionWithContextMenu::staticMetaObject.methodOffset());
    QCOMPARE(request.parameterNames(), QList<QByteArray>({"globalpos"}));
}

int main(int argc, char** argv)
{
    ZuApplication* application = ZuApplication::createInstance(argc, argv, nullptr);
    if (!application)
        return 1;
    tst_Buttons test;
    const int result = QTest::qExec(&test, argc, argv);
    delete application;
    return result;
}

#include "tst_buttons.moc"
