// The popup-menu line edit and combo box: scheme colours, accepted text, editing, the menu.
#include "ObjectCount.h"

#include "zubase/ZuApplication.h"
#include "zubase/ZuOptionsButton.h"
#include "zubase/ZuPopupMenuComboBox.h"
#include "zubase/ZuPopupMenuLineEdit.h"
#include "zubase/ZuStyle.h"
#include "zubase/ZuStyleFactory.h"

#include <QAccessible>
#include <QDesktopWidget>
#include <QMenu>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QToolButton>
#include <QtTest>

namespace {

const QColor kWindow(200, 201, 202), kWindowText(10, 11, 12), kLight(250, 249, 248);
const QColor kViewer(40, 50, 60), kWhite(255, 254, 253);

// A scheme with the three palette colours above and, by choice, the viewer-control colours.
QString schemeText(const QString& inName, bool inViewer, bool inWhite)
{
    auto rgb = [](const char* inId, const QColor& inColor) {
        return QStringLiteral("<Color Id=\"%1\" Red=\"%2\" Green=\"%3\" Blue=\"%4\"/>")
            .arg(QLatin1String(inId))
            .arg(inColor.red())
            .arg(inColor.green())
            .arg(inColor.blue());
    };
    const QString group =
        rgb("Window", kWindow) + rgb("WindowText", kWindowText) + rgb("Light", kLight);
    QString user;
    if (inViewer)
        user += rgb("ZIVOD_ViewerControl", kViewer);
    if (inWhite)
        user += rgb("ZIVOD_White", kWhite);
    return QStringLiteral("<ColorScheme Version=\"1.0\" Name=\"%1\"><Active>%2</Active>"
                          "<Inactive>%2</Inactive><Disabled>%2</Disabled>"
                          "<UserDefined>%3</UserDefined></ColorScheme>")
        .arg(inName, group, user);
}

void sendEnter(QWidget* inWidget, bool inEnter)
{
    QEvent event(inEnter ? QEvent::Enter : QEvent::Leave);
    QApplication::sendEvent(inWidget, &event);
}

// Text and background of the field, the same in every colour group, else invalid colours.
QPair<QColor, QColor> fieldColors(const QWidget* inWidget)
{
    const QPalette palette = inWidget->palette();
    const QColor text = palette.color(QPalette::Active, inWidget->foregroundRole());
    const QColor background = palette.color(QPalette::Active, inWidget->backgroundRole());
    for (QPalette::ColorGroup group : {QPalette::Inactive, QPalette::Disabled}) {
        if (palette.color(group, inWidget->foregroundRole()) != text ||
            palette.color(group, inWidget->backgroundRole()) != background)
            return {};
    }
    return {text, background};
}

QColor buttonBackground(ZuPopupMenuComboBox* inCombo)
{
    auto* button = inCombo->findChild<ZuOptionsButton*>();
    return button ? button->palette().color(QPalette::Disabled, button->backgroundRole())
                  : QColor();
}

QStringList ownMethods(const QMetaObject& inMeta)
{
    QStringList methods;
    for (int i = inMeta.methodOffset(); i < inMeta.methodCount(); ++i)
        methods << QString::fromLatin1(inMeta.method(i).methodSignature());
    return methods;
}

} // namespace

class tst_PopupMenu : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void colors_data();
    void colors();
    void followSchemeSwitch();
    void textAccepted_data();
    void textAccepted();
    void startEditing();
    void buttonAtRightEnd();
    void popupBelowOrAbove_data();
    void popupBelowOrAbove();
    void popupCreatedOnDemand();
    void readOnlyMouse();
    void editableMouse();
    void menuChoiceAndHide();
    void keysOpenMenu_data();
    void keysOpenMenu();
    void menuOwnership();
    void nothingOutlivesWidgets();
    void metaObjects();

private:
    QTemporaryDir mTemp;
};

void tst_PopupMenu::initTestCase()
{
    QVERIFY(mTemp.isValid());
    qRegisterMetaType<QAction*>();
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    const struct
    {
        const char* name;
        bool viewer;
        bool white;
    } schemes[] = {{"Viewer", true, true}, {"Plain", false, false}, {"ViewerNoWhite", true, false}};
    for (const auto& scheme : schemes) {
        const QString path = mTemp.filePath(QLatin1String(scheme.name) + ".xml");
        QFile file(path);
        QVERIFY(file.open(QIODevice::WriteOnly));
        file.write(schemeText(QLatin1String(scheme.name), scheme.viewer, scheme.white).toUtf8());
        file.close();
        QVERIFY(factory.addStyle(path));
    }
}

void tst_PopupMenu::colors_data()
{
    QTest::addColumn<QString>("scheme");
    QTest::addColumn<QColor>("text");
    QTest::addColumn<QColor>("normal");
    QTest::addColumn<QColor>("hovered");
    QTest::newRow("viewer colours") << "Viewer" << kWhite << kViewer << kViewer.lighter(130);
    QTest::newRow("no viewer colours") << "Plain" << kWindowText << kWindow << kLight;
    // Black (invalid) text on the dark viewer colour would be unreadable.
    QTest::newRow("viewer colour, no text colour")
        << "ViewerNoWhite" << kWindowText << kViewer << kViewer.lighter(130);
}

void tst_PopupMenu::colors()
{
    QFETCH(QString, scheme);
    QFETCH(QColor, text);
    QFETCH(QColor, normal);
    QFETCH(QColor, hovered);
    ZuStyleFactory::instance().setCurrentStyle(scheme);
    QWidget window;
    auto* edit = new ZuPopupMenuLineEdit(&window);
    auto* combo = new ZuPopupMenuComboBox(&window);
    QLineEdit foreign(&window);
    ZuPopupMenuLineEdit::skinify(&foreign);
    edit->resize(100, 20);

    for (QWidget* field : {static_cast<QWidget*>(edit), static_cast<QWidget*>(&foreign)}) {
        const auto colors = fieldColors(field);
        QCOMPARE(colors.first, text);
        QCOMPARE(colors.second, normal);
    }
    QVERIFY(!foreign.hasFrame());
    QVERIFY(!foreign.dragEnabled());
    // The frameless field is painted in its background colour.
    QCOMPARE(edit->grab().toImage().pixelColor(3, 3), normal);

    for (ZuPopupMenuLineEdit* field : {edit, static_cast<ZuPopupMenuLineEdit*>(combo)}) {
        sendEnter(field, true);
        QCOMPARE(fieldColors(field), qMakePair(text, hovered));
        sendEnter(field, false);
        QCOMPARE(fieldColors(field).second, normal);
    }
    sendEnter(combo, true);
    QCOMPARE(buttonBackground(combo), hovered);
    sendEnter(combo, false);
    QCOMPARE(buttonBackground(combo), normal);
}

void tst_PopupMenu::followSchemeSwitch()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    factory.setCurrentStyle(QStringLiteral("Plain"));
    ZuPopupMenuLineEdit edit;
    ZuPopupMenuComboBox combo;
    sendEnter(&combo, true);

    factory.setCurrentStyle(QStringLiteral("Viewer"));
    QCOMPARE(fieldColors(&edit), qMakePair(kWhite, kViewer));
    QCOMPARE(fieldColors(&combo), qMakePair(kWhite, kViewer.lighter(130)));
    QCOMPARE(buttonBackground(&combo), kViewer.lighter(130));

    sendEnter(&combo, false);
    factory.setCurrentStyle(QStringLiteral("Plain"));
    QCOMPARE(fieldColors(&edit), qMakePair(kWindowText, kWindow));
    QCOMPARE(fieldColors(&combo), qMakePair(kWindowText, kWindow));
    QCOMPARE(buttonBackground(&combo), kWindow);
}

void tst_PopupMenu::textAccepted_data()
{
    QTest::addColumn<QString>("how");
    QTest::addColumn<int>("accepted");
    QTest::addColumn<bool>("keepsFocus");
    QTest::newRow("return") << "return" << 1 << true;
    QTest::newRow("tab") << "tab" << 1 << true;
    QTest::newRow("focus out") << "focus out" << 1 << false;
    QTest::newRow("context menu") << "context menu" << 0 << true;
    QTest::newRow("typing") << "typing" << 0 << true;
}

void tst_PopupMenu::textAccepted()
{
    QFETCH(QString, how);
    QFETCH(int, accepted);
    QFETCH(bool, keepsFocus);
    ZuStyleFactory::instance().setCurrentStyle(QStringLiteral("Plain"));
    QWidget window;
    auto* edit = new ZuPopupMenuLineEdit(&window);
    auto* other = new QLineEdit(&window);
    other->move(0, 40);
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    edit->setFocus();
    QTRY_VERIFY(edit->hasFocus());
    QTest::keyClicks(edit, QStringLiteral("CT"));
    QSignalSpy spy(edit, &ZuPopupMenuLineEdit::textAccepted);

    if (how == "return") {
        QTest::keyClick(edit, Qt::Key_Return);
    } else if (how == "tab") {
        QTest::keyClick(edit, Qt::Key_Tab);
    } else if (how == "focus out") {
        QTest::mouseClick(other, Qt::LeftButton);
    } else if (how == "context menu") {
        // A host that allows the standard menu: its popup takes the focus for a while.
        edit->setContextMenuPolicy(Qt::DefaultContextMenu);
        QTimer::singleShot(50, [] {
            if (QWidget* popup = QApplication::activePopupWidget())
                popup->close();
        });
        QContextMenuEvent event(QContextMenuEvent::Keyboard, QPoint(5, 5));
        QApplication::sendEvent(edit, &event);
    } else {
        QTest::keyClicks(edit, QStringLiteral(" head"));
    }
    QCOMPARE(spy.count(), accepted);
    if (accepted)
        QCOMPARE(spy.at(0).at(0).toString(), QStringLiteral("CT"));
    QCOMPARE(edit->hasFocus(), keepsFocus);
    if (!keepsFocus) { // and coming back and leaving again accepts once more
        edit->setFocus();
        other->setFocus();
        QCOMPARE(spy.count(), accepted + 1);
    }
}

void tst_PopupMenu::startEditing()
{
    QWidget window;
    auto* edit = new ZuPopupMenuLineEdit(&window, "caf\xe9");
    QCOMPARE(edit->objectName(), QString::fromUtf8("caf\xc3\xa9"));
    auto* other = new QLineEdit(&window);
    other->move(0, 40);
    edit->resize(200, 22);
    edit->setText(QStringLiteral("abcdef"));
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    other->setFocus();
    QTRY_VERIFY(other->hasFocus());

    // The on-screen keyboard relies on the order: the position first, then the focus.
    QList<QPair<int, bool>> starts;
    connect(edit, &ZuPopupMenuLineEdit::startEditingAtPosition, this,
            [&](int inPosition) { starts << qMakePair(inPosition, edit->hasFocus()); });
    edit->setCursorPosition(2);
    edit->activateEditing();
    QCOMPARE(starts, (QList<QPair<int, bool>>{{2, false}}));
    QVERIFY(edit->hasFocus());

    // A click places the cursor first; the position reported is the new one.
    other->setFocus();
    starts.clear();
    QTest::mouseClick(edit, Qt::LeftButton, Qt::NoModifier, QPoint(190, 11));
    QCOMPARE(starts.size(), 1);
    QCOMPARE(starts.first().first, 6);
    QVERIFY(edit->hasFocus());
}

void tst_PopupMenu::buttonAtRightEnd()
{
    QWidget window;
    auto* combo = new ZuPopupMenuComboBox(&window);
    combo->resize(200, 24);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    auto* button = combo->findChild<ZuOptionsButton*>();
    QVERIFY(button);
    QCOMPARE(button->geometry(), QRect(176, 0, 24, 24));
    QVERIFY(button->autoRaise());
    QVERIFY(dynamic_cast<ZuStyle*>(button->style()));
    QCOMPARE(button->cursor().shape(), Qt::ArrowCursor);
    combo->resize(90, 30);
    QCOMPARE(button->geometry(), QRect(60, 0, 30, 30));
    // A screen reader finds the menu button among the field's parts.
    QAccessibleInterface* field = QAccessible::queryAccessibleInterface(combo);
    QVERIFY(field);
    QStringList names;
    for (int i = 0; i < field->childCount(); ++i)
        names << field->child(i)->text(QAccessible::Name);
    QVERIFY2(names.contains(QStringLiteral("Open menu")), qPrintable(names.join(',')));
}

void tst_PopupMenu::popupBelowOrAbove_data()
{
    QTest::addColumn<bool>("nearBottom");
    QTest::newRow("room below") << false;
    QTest::newRow("bottom of the desktop") << true;
}

void tst_PopupMenu::popupBelowOrAbove()
{
    QFETCH(bool, nearBottom);
    ZuPopupMenuComboBox combo;
    combo.setReadOnly(true);
    combo.resize(150, 24);
    QMenu* menu = new QMenu;
    for (const char* text : {"Axial", "Sagittal", "Coronal", "Oblique"})
        menu->addAction(QLatin1String(text));
    combo.setPopupMenu(menu);
    const int desktopHeight = QApplication::desktop()->height();
    combo.move(40, nearBottom ? desktopHeight - 40 : 60);
    combo.show();
    QVERIFY(QTest::qWaitForWindowExposed(&combo));
    QSignalSpy about(&combo, &ZuPopupMenuComboBox::popupAboutToShow);

    QTest::mouseClick(&combo, Qt::LeftButton);
    QTRY_VERIFY(menu->isVisible());
    QCOMPARE(about.count(), 1);
    const QPoint top = combo.mapToGlobal(QPoint(0, 0));
    QCOMPARE(menu->geometry().left(), top.x());
    if (nearBottom)
        QCOMPARE(menu->geometry().bottom() + 1, top.y());
    else
        QCOMPARE(menu->geometry().top(), top.y() + 24);

    // Showing already: left alone, nothing said.
    combo.popup();
    QCOMPARE(about.count(), 1);
    menu->close();
}

void tst_PopupMenu::popupCreatedOnDemand()
{
    ZuPopupMenuComboBox combo;
    combo.resize(150, 24);
    combo.show();
    QVERIFY(QTest::qWaitForWindowExposed(&combo));
    QSignalSpy about(&combo, &ZuPopupMenuComboBox::popupAboutToShow);
    combo.popup();
    QCOMPARE(about.count(), 1);
    QVERIFY(!QApplication::activePopupWidget());

    QPointer<QMenu> made;
    connect(&combo, &ZuPopupMenuComboBox::popupAboutToShow, this, [&] {
        if (!made) {
            made = new QMenu(&combo);
            made->addAction(QStringLiteral("Made on demand"));
            combo.setPopupMenu(made);
        }
    });
    combo.popup();
    QCOMPARE(about.count(), 2);
    QTRY_VERIFY(made && made->isVisible());
    QCOMPARE(made->geometry().topLeft(), combo.mapToGlobal(QPoint(0, 24)));
    made->close();
}

void tst_PopupMenu::readOnlyMouse()
{
    ZuPopupMenuComboBox combo;
    combo.setReadOnly(true);
    combo.resize(150, 24);
    QMenu menu;
    menu.addAction(QStringLiteral("One"));
    combo.setPopupMenu(&menu);
    combo.show();
    QVERIFY(QTest::qWaitForWindowExposed(&combo));
    auto* button = combo.findChild<ZuOptionsButton*>();
    QSignalSpy about(&combo, &ZuPopupMenuComboBox::popupAboutToShow);
    QSignalSpy editing(&combo, &ZuPopupMenuLineEdit::startEditingAtPosition);

    // Other buttons press the drop-down button but open nothing.
    QTest::mousePress(&combo, Qt::RightButton);
    QVERIFY(button->isDown());
    QTest::mouseRelease(&combo, Qt::RightButton);
    QVERIFY(!button->isDown());
    QCOMPARE(about.count(), 0);

    // The release opens a menu that the press did not (it was closed in between).
    QTest::mousePress(&combo, Qt::LeftButton);
    QVERIFY(menu.isVisible());
    QVERIFY(button->isDown());
    menu.hide();
    QTest::mouseRelease(&combo, Qt::LeftButton);
    QVERIFY(!button->isDown());
    QVERIFY(menu.isVisible());
    QCOMPARE(about.count(), 2);
    QCOMPARE(editing.count(), 0);
    menu.close();
}

void tst_PopupMenu::editableMouse()
{
    QWidget window;
    auto* combo = new ZuPopupMenuComboBox(&window);
    combo->resize(150, 24);
    QMenu menu;
    menu.addAction(QStringLiteral("One"));
    combo->setPopupMenu(&menu);
    window.show();
    QVERIFY(QTest::qWaitForWindowActive(&window));
    QSignalSpy about(combo, &ZuPopupMenuComboBox::popupAboutToShow);
    QSignalSpy editing(combo, &ZuPopupMenuLineEdit::startEditingAtPosition);

    QTest::mouseClick(combo, Qt::LeftButton, Qt::NoModifier, QPoint(20, 12));
    QCOMPARE(editing.count(), 1);
    QCOMPARE(about.count(), 0);
    QVERIFY(!menu.isVisible());
    QVERIFY(combo->hasFocus());

    // Its own button opens the menu without editing.
    QTest::mousePress(combo->findChild<ZuOptionsButton*>(), Qt::LeftButton);
    QVERIFY(menu.isVisible());
    QCOMPARE(about.count(), 1);
    QCOMPARE(editing.count(), 1);
    menu.close();
}

void tst_PopupMenu::menuChoiceAndHide()
{
    ZuPopupMenuComboBox combo;
    combo.setReadOnly(true);
    combo.show();
    QVERIFY(QTest::qWaitForWindowExposed(&combo));
    QMenu first, second;
    QAction* axial = first.addAction(QStringLiteral("Axial"));
    QAction* other = second.addAction(QStringLiteral("Other"));
    combo.setPopupMenu(&first);
    combo.setPopupMenu(&first); // once connected, not twice
    QSignalSpy activated(&combo, &ZuPopupMenuComboBox::popupActivated);
    auto* button = combo.findChild<ZuOptionsButton*>();

    QTest::mousePress(&combo, Qt::LeftButton);
    QVERIFY(button->isDown());
    axial->trigger();
    first.hide();
    QCOMPARE(activated.count(), 1);
    QCOMPARE(activated.at(0).at(0).value<QAction*>(), axial);
    QVERIFY(!button->isDown()); // lifted by the menu's closing

    // A replaced menu no longer speaks for the combo box, and is not deleted by it.
    combo.setPopupMenu(&second);
    QCOMPARE(combo.popupMenu(), &second);
    axial->trigger();
    other->trigger();
    QCOMPARE(activated.count(), 2);
    QCOMPARE(activated.at(1).at(0).value<QAction*>(), other);
    combo.setPopupMenu(nullptr);
    QCOMPARE(combo.popupMenu(), static_cast<QMenu*>(nullptr));
}

void tst_PopupMenu::keysOpenMenu_data()
{
    QTest::addColumn<int>("key");
    QTest::addColumn<int>("modifiers");
    QTest::addColumn<bool>("opens");
    QTest::newRow("alt+down") << int(Qt::Key_Down) << int(Qt::AltModifier) << true;
    QTest::newRow("F4") << int(Qt::Key_F4) << int(Qt::NoModifier) << true;
    QTest::newRow("down") << int(Qt::Key_Down) << int(Qt::NoModifier) << false;
    QTest::newRow("alt+F4") << int(Qt::Key_F4) << int(Qt::AltModifier) << false;
}

void tst_PopupMenu::keysOpenMenu()
{
    QFETCH(int, key);
    QFETCH(int, modifiers);
    QFETCH(bool, opens);
    ZuPopupMenuComboBox combo;
    QMenu menu;
    menu.addAction(QStringLiteral("One"));
    combo.setPopupMenu(&menu);
    combo.show();
    QVERIFY(QTest::qWaitForWindowActive(&combo));
    QSignalSpy about(&combo, &ZuPopupMenuComboBox::popupAboutToShow);
    QTest::keyClick(&combo, Qt::Key(key), Qt::KeyboardModifiers(modifiers));
    QCOMPARE(menu.isVisible(), opens);
    QCOMPARE(about.count(), opens ? 1 : 0);
    menu.close();
}

void tst_PopupMenu::menuOwnership()
{
    // A menu that its own parent deleted first is not deleted again.
    auto* owner = new QWidget;
    auto* combo = new ZuPopupMenuComboBox;
    combo->setPopupMenu(new QMenu(owner));
    delete owner;
    QCOMPARE(combo->popupMenu(), static_cast<QMenu*>(nullptr));
    delete combo;

    // The menu set last goes with the combo box; a replaced one stays with its owner.
    combo = new ZuPopupMenuComboBox;
    QMenu replaced;
    QPointer<QMenu> last = new QMenu;
    combo->setPopupMenu(&replaced);
    combo->setPopupMenu(last);
    delete combo;
    QVERIFY(last.isNull());
}

void tst_PopupMenu::nothingOutlivesWidgets()
{
    ZuStyleFactory::instance().setCurrentStyle(QStringLiteral("Viewer"));
    delete new ZuPopupMenuComboBox; // whatever Qt makes on first use is not counted
    LiveObjects live;
    delete new ZuPopupMenuComboBox;
    {
        QToolButton button;
        ZuPopupMenuLineEdit::skinify(&button);
        QStyle* style = button.style();
        QVERIFY(dynamic_cast<ZuStyle*>(style));
        ZuPopupMenuLineEdit::skinify(&button); // keeps the style it has
        QCOMPARE(button.style(), style);
        QVERIFY(button.autoRaise());
    }
    ZuPopupMenuLineEdit::skinify(static_cast<QToolButton*>(nullptr));
    ZuPopupMenuLineEdit::skinify(static_cast<QLineEdit*>(nullptr));
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QCOMPARE(live.count(), 0);
}

void tst_PopupMenu::metaObjects()
{
    QCOMPARE(ownMethods(ZuPopupMenuLineEdit::staticMetaObject),
             QStringList({"textAccepted(QString)", "startEditingAtPosition(int)", "acceptText()",
                          "paletteChanged()", "activateEditing()"}));
    QCOMPARE(ownMethods(ZuPopupMenuComboBox::staticMetaObject),
             QStringList({"popupAboutToShow()", "popupActivated(QAction*)",
                          "emitPopupActivated(QAction*)", "popup()", "unsetButton()",
                          "paletteChanged()"}));
}

int main(int argc, char** argv)
{
    ZuApplication* application = ZuApplication::createInstance(argc, argv, nullptr);
    if (!application)
        return 1;
    tst_PopupMenu test;
    const int result = QTest::qExec(&test, argc, argv);
    delete application;
    return result;
}

#include "tst_popupmenu.moc"
