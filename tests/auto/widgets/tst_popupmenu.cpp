// The popup-menu line edit and combo box: scheme colours, accepted text, editing, the menu.
#include "TestSupport.h"
#include "WidgetTest.h"
#include "zubase/ZuOptionsButton.h"
#include "zubase/ZuPopupMenuComboBox.h"
#include "zubase/ZuStyle.h"
#include "zubase/ZuStyleFactory.h"

#include <QDesktopWidget>
#include <QMenu>
#include <QToolButton>

using Colors = QPair<QColor, QColor>; // text, background
// The colours of the schemes in tests/data/widgets.
static const QColor kWindow(200, 201, 202), kText(10, 11, 12), kLight(250, 249, 248);
static const QColor kViewer(40, 50, 60), kWhite(255, 254, 253);

// A field's text and background (or its button's background) in a group none sets by itself.
static Colors colors(const QWidget* inWidget)
{
    const QPalette palette = inWidget->palette();
    return {palette.color(QPalette::Disabled, inWidget->foregroundRole()),
            palette.color(QPalette::Disabled, inWidget->backgroundRole())};
}

static ZuOptionsButton* buttonOf(QWidget* inCombo)
{
    return inCombo->findChild<ZuOptionsButton*>();
}

static void hover(QWidget* inWidget, bool inEnter)
{
    QEvent event(inEnter ? QEvent::Enter : QEvent::Leave);
    QApplication::sendEvent(inWidget, &event);
}

class tst_PopupMenu : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void colors_data();
    void colors();
    void textAccepted_data();
    void textAccepted();
    void startEditing();
    void popupPosition_data();
    void popupPosition();
    void openAndChoose();
    void ownershipAndLeaks();
};

void tst_PopupMenu::initTestCase()
{
    qRegisterMetaType<QAction*>();
    QCOMPARE(ZuStyleFactory::instance().addStylesFromPath(TestSupport::dataPath("widgets")), 3);
}

void tst_PopupMenu::colors_data()
{
    QTest::addColumn<QString>("scheme");
    QTest::addColumn<Colors>("normal");
    QTest::addColumn<Colors>("hovered");
    QTest::addColumn<QString>("switchTo");
    QTest::newRow("viewer colours")
        << "Viewer" << Colors(kWhite, kViewer) << Colors(kWhite, kViewer.lighter(130)) << "Plain";
    QTest::newRow("no viewer colours")
        << "Plain" << Colors(kText, kWindow) << Colors(kText, kLight) << "Viewer";
    // Not black (invalid) text on the dark viewer colour.
    QTest::newRow("viewer colour without text colour")
        << "ViewerNoWhite" << Colors(kText, kViewer) << Colors(kText, kViewer.lighter(130))
        << "Viewer";
}

void tst_PopupMenu::colors()
{
    QFETCH(QString, scheme);
    QFETCH(Colors, normal);
    QFETCH(Colors, hovered);
    QFETCH(QString, switchTo);
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    factory.setCurrentStyle(scheme);
    ZuPopupMenuLineEdit edit(nullptr, "caf\xe9");
    QCOMPARE(edit.objectName(), QString::fromUtf8("caf\xc3\xa9")); // Latin-1
    QVERIFY(!edit.acceptDrops());
    ZuPopupMenuComboBox combo;
    QLineEdit foreign;
    ZuPopupMenuLineEdit::skinify(&foreign);
    QCOMPARE(::colors(&foreign), normal);
    QVERIFY(!foreign.hasFrame() && !foreign.dragEnabled());
    QCOMPARE(::colors(&edit), normal);
    hover(&combo, true);
    QCOMPARE(::colors(&combo), hovered);
    QCOMPARE(::colors(buttonOf(&combo)).second, hovered.second);
    hover(&combo, false);
    QCOMPARE(::colors(&combo), normal);
    QCOMPARE(::colors(buttonOf(&combo)).second, normal.second);
    // A scheme switch re-colours, keeping the hover: as if made in the new scheme.
    hover(&combo, true);
    factory.setCurrentStyle(switchTo);
    ZuPopupMenuLineEdit madeThen;
    ZuPopupMenuComboBox comboMadeThen;
    hover(&comboMadeThen, true);
    QVERIFY(::colors(&madeThen) != normal);
    QCOMPARE(::colors(&edit), ::colors(&madeThen));
    QCOMPARE(::colors(&combo), ::colors(&comboMadeThen));
    QCOMPARE(::colors(buttonOf(&combo)), ::colors(buttonOf(&comboMadeThen)));
}

void tst_PopupMenu::textAccepted_data()
{
    QTest::addColumn<int>("key"); // 0: focus to another field; -1: a context menu
    QTest::addColumn<int>("accepted");
    QTest::newRow("return") << int(Qt::Key_Return) << 1;
    QTest::newRow("tab, keeping the focus") << int(Qt::Key_Tab) << 1;
    QTest::newRow("focus out") << 0 << 1;
    QTest::newRow("context menu") << -1 << 0;
}

void tst_PopupMenu::textAccepted()
{
    QFETCH(int, key);
    QFETCH(int, accepted);
    QWidget window;
    auto* edit = new ZuPopupMenuLineEdit(&window);
    auto* other = new QLineEdit(&window);
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    edit->setFocus();
    QTest::keyClicks(edit, QStringLiteral("CT"));
    QSignalSpy spy(edit, &ZuPopupMenuLineEdit::textAccepted);
    QSignalSpy finished(edit, &QLineEdit::editingFinished); // the line edit's own handling
    if (key > 0) {
        QTest::keyClick(edit, Qt::Key(key));
    } else if (key == 0) {
        other->setFocus();
        edit->setFocus();
        other->setFocus();
    } else { // a host's standard menu: its popup takes the focus for a while
        edit->setContextMenuPolicy(Qt::DefaultContextMenu);
        QContextMenuEvent event(QContextMenuEvent::Keyboard, QPoint(5, 5));
        QApplication::sendEvent(edit, &event);
        QVERIFY(QApplication::activePopupWidget());
        QApplication::activePopupWidget()->close();
    }
    QCOMPARE(spy.count(), key ? accepted : 2);
    QVERIFY(spy.isEmpty() || spy.first().first() == "CT");
    QCOMPARE(edit->hasFocus(), key != 0);
    QCOMPARE(finished.count(), key == Qt::Key_Return || key == 0 ? 1 : 0);
}

void tst_PopupMenu::startEditing()
{
    QWidget window;
    auto* edit = new ZuPopupMenuLineEdit(&window);
    auto* other = new QLineEdit(&window);
    edit->setText(QStringLiteral("abcdef"));
    edit->setCursorPosition(2);
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    other->setFocus();
    // The on-screen keyboard relies on the order: the position first, then the focus.
    QList<QPair<int, bool>> starts;
    connect(edit, &ZuPopupMenuLineEdit::startEditingAtPosition, this,
            [&](int inPosition) { starts << qMakePair(inPosition, edit->hasFocus()); });
    edit->activateEditing();
    other->setFocus();
    QTest::mouseClick(edit, Qt::LeftButton, {}, QPoint(edit->width() - 2, 5)); // after the text
    QCOMPARE(starts, (QList<QPair<int, bool>>{{2, false}, {6, true}})); // a click focuses first
    QVERIFY(edit->hasFocus());
}

void tst_PopupMenu::popupPosition_data()
{
    QTest::addColumn<bool>("nearBottom");
    QTest::newRow("room below") << false;
    QTest::newRow("bottom of the desktop") << true;
}

void tst_PopupMenu::popupPosition()
{
    QFETCH(bool, nearBottom);
    ZuPopupMenuComboBox combo;
    combo.setGeometry(40, nearBottom ? QApplication::desktop()->height() - 40 : 60, 200, 24);
    combo.show();
    QVERIFY(QTest::qWaitForWindowExposed(&combo));
    // No menu: only asked for; a handler may make one then.
    QSignalSpy about(&combo, &ZuPopupMenuComboBox::popupAboutToShow);
    combo.popup();
    QCOMPARE(about.count(), 1);
    QMenu menu;
    menu.addAction(QStringLiteral("Axial"));
    connect(&combo, &ZuPopupMenuComboBox::popupAboutToShow, [&] { combo.setPopupMenu(&menu); });
    combo.popup();
    QVERIFY(menu.isVisible());
    const QPoint topLeft = combo.mapToGlobal(QPoint(0, 0));
    QCOMPARE(menu.geometry().left(), topLeft.x());
    QCOMPARE(nearBottom ? menu.geometry().bottom() + 1 : menu.geometry().top(),
             topLeft.y() + (nearBottom ? 0 : 24));
    combo.popup(); // showing already: left alone, nothing said
    QCOMPARE(about.count(), 2);
    combo.setPopupMenu(nullptr); // not deleted with the combo box
}

void tst_PopupMenu::openAndChoose()
{
    QWidget window;
    auto* combo = new ZuPopupMenuComboBox(&window);
    combo->resize(150, 24);
    QMenu menu;
    QAction* axial = menu.addAction(QStringLiteral("Axial"));
    combo->setPopupMenu(&menu);
    combo->setPopupMenu(&menu); // connected once, not twice
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    QSignalSpy editing(combo, &ZuPopupMenuLineEdit::startEditingAtPosition);
    QSignalSpy activated(combo, &ZuPopupMenuComboBox::popupActivated);
    // What opens the menu: the button of an editable one, the keys, a read-only one's field.
    auto opens = [&](std::function<void()> inDo) {
        inDo();
        const bool shown = menu.isVisible();
        menu.hide();
        return shown;
    };
    QVERIFY(!opens([&] { QTest::mouseClick(combo, Qt::LeftButton); }));
    QVERIFY(combo->hasFocus() && editing.count() == 1);
    QVERIFY(opens([&] { QTest::mousePress(buttonOf(combo), Qt::LeftButton); }));
    QVERIFY(opens([&] { QTest::keyClick(combo, Qt::Key_Down, Qt::AltModifier); }));
    QVERIFY(opens([&] { QTest::keyClick(combo, Qt::Key_F4); }));
    QVERIFY(!opens([&] { QTest::keyClick(combo, Qt::Key_Down); }));
    combo->setReadOnly(true);
    QVERIFY(!opens([&] { QTest::mousePress(combo, Qt::RightButton); }));
    QVERIFY(buttonOf(combo)->isDown());
    QVERIFY(!opens([&] { QTest::mouseRelease(combo, Qt::RightButton); }));
    QVERIFY(!buttonOf(combo)->isDown());
    QVERIFY(opens([&] { QTest::mousePress(combo, Qt::LeftButton); }));
    QCOMPARE(editing.count(), 1);

    // A choice is passed on; closing the menu lifts the button; a replaced menu says nothing.
    QTest::mousePress(combo, Qt::LeftButton);
    axial->trigger();
    menu.hide();
    QVERIFY(!buttonOf(combo)->isDown());
    combo->setPopupMenu(new QMenu(combo));
    axial->trigger();
    QCOMPARE(activated.count(), 1);
    QCOMPARE(activated.at(0).at(0).value<QAction*>(), axial);
}

void tst_PopupMenu::ownershipAndLeaks()
{
    // A menu its own parent deleted first is not deleted again; the last menu goes with it.
    auto* owner = new QWidget;
    auto* combo = new ZuPopupMenuComboBox;
    combo->setPopupMenu(new QMenu(owner));
    delete owner;
    QCOMPARE(combo->popupMenu(), nullptr);
    QPointer<QMenu> last = new QMenu;
    combo->setPopupMenu(last);
    delete combo;
    QVERIFY(last.isNull());

    // The styles made for its button and for a skinned tool button go with the button.
    LiveObjects live;
    delete new ZuPopupMenuComboBox;
    auto* button = new QToolButton;
    ZuPopupMenuLineEdit::skinify(button);
    QStyle* style = button->style();
    ZuPopupMenuLineEdit::skinify(button);
    QVERIFY(dynamic_cast<ZuStyle*>(style) && style != QApplication::style());
    QVERIFY(button->style() == style && button->autoRaise());
    delete button;
    ZuPopupMenuLineEdit::skinify(static_cast<QToolButton*>(nullptr));
    ZuPopupMenuLineEdit::skinify(static_cast<QLineEdit*>(nullptr));
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QCOMPARE(live.count(), 0);
}

ZU_WIDGET_TEST_MAIN(tst_PopupMenu)
#include "tst_popupmenu.moc"
