// Text edit: "Find..." in the context menu and on the find shortcut of the focused text edit,
// one dialog per text edit, no menus left behind, and the dialog going with its text edit.
#include "zubase/ZuFindReplaceDialog.h"
#include "zubase/ZuTextEdit.h"

#include <QContextMenuEvent>
#include <QLineEdit>
#include <QMenu>
#include <QPushButton>
#include <QVBoxLayout>
#include <QtTest>

namespace {

// The dialogs open on a window, with the text edit each one searches.
QList<ZuFindReplaceDialog*> dialogs(QWidget* inWindow)
{
    return inWindow->findChildren<ZuFindReplaceDialog*>();
}

// Runs the dialog's search for inText and tells whether inEdit got the match selected.
bool searches(ZuFindReplaceDialog* inDialog, QTextEdit* inEdit, const QString& inText)
{
    inDialog->findChildren<QLineEdit*>().first()->setText(inText);
    QMetaObject::invokeMethod(inDialog, "findClicked");
    return inEdit->textCursor().selectedText() == inText;
}

} // namespace

class tst_TextEdit : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void contextMenuOffersFind();
    void shortcutOpensDialogOfFocusedEdit();
    void dialogGoesWithTextEdit();
};

void tst_TextEdit::contextMenuOffersFind()
{
    QWidget window;
    auto* edit = new ZuTextEdit(&window);
    new QVBoxLayout(&window);
    window.layout()->addWidget(edit);
    edit->setPlainText(QStringLiteral("one two"));
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));

    QStringList texts;
    for (int round = 0; round < 2; ++round) {
        QTimer::singleShot(0, [&texts] {
            auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
            QVERIFY(menu);
            QAction* last = menu->actions().last();
            texts = QStringList{last->text(), last->shortcut().toString()};
            last->trigger();
            menu->close();
        });
        QContextMenuEvent event(QContextMenuEvent::Mouse, QPoint(5, 5));
        QApplication::sendEvent(edit->viewport(), &event);
        QCOMPARE(texts, QStringList({"Find...", QKeySequence(QKeySequence::Find).toString()}));
        QVERIFY(edit->findChildren<QMenu*>().isEmpty()); // nothing left behind
    }
    QCOMPARE(dialogs(&window).size(), 1); // the same dialog both times
    QVERIFY(dialogs(&window).first()->isVisible());
    QVERIFY(searches(dialogs(&window).first(), edit, "two"));
}

void tst_TextEdit::shortcutOpensDialogOfFocusedEdit()
{
    QWidget window;
    auto* first = new ZuTextEdit(&window);
    auto* second = new ZuTextEdit(&window);
    new QVBoxLayout(&window);
    window.layout()->addWidget(first);
    window.layout()->addWidget(second);
    first->setPlainText(QStringLiteral("first"));
    second->setPlainText(QStringLiteral("second"));
    window.show();
    QApplication::setActiveWindow(&window);
    QVERIFY(QTest::qWaitForWindowActive(&window));

    second->setFocus();
    QTest::keyClick(second, Qt::Key_F, Qt::ControlModifier);
    QCOMPARE(dialogs(&window).size(), 1);
    ZuFindReplaceDialog* dialog = dialogs(&window).first();
    QVERIFY(dialog->isVisible());
    QVERIFY(searches(dialog, second, "second"));

    dialog->hide();
    QApplication::setActiveWindow(&window);
    QVERIFY(QTest::qWaitForWindowActive(&window));
    first->setFocus();
    QTest::keyClick(first, Qt::Key_F, Qt::ControlModifier);
    const QList<ZuFindReplaceDialog*> both = dialogs(&window);
    QCOMPARE(both.size(), 2);
    QVERIFY(!dialog->isVisible()); // the other text edit's dialog stays closed
    ZuFindReplaceDialog* other = both.at(both.at(0) == dialog ? 1 : 0);
    QVERIFY(searches(other, first, "first"));
}

void tst_TextEdit::dialogGoesWithTextEdit()
{
    QWidget window;
    auto* edit = new ZuTextEdit(&window);
    window.show();
    QVERIFY(QMetaObject::invokeMethod(edit, "slotFindDialog"));
    QPointer<ZuFindReplaceDialog> dialog = dialogs(&window).value(0);
    QVERIFY(dialog && dialog->isVisible());
    delete edit;
    QVERIFY(!dialog->isVisible());
    QTRY_VERIFY(dialog.isNull());
}

QTEST_MAIN(tst_TextEdit)
#include "tst_textedit.moc"
