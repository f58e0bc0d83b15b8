// Find/replace dialog and the text edit that opens it: keys, enabling, find and replace in
// both directions with the options, the green marks, and the text edit's side.
#include "zubase/ZuFindReplaceDialog.h"
#include "zubase/ZuTextEdit.h"

#include <QAccessible>
#include <QLabel>
#include <QLineEdit>
#include <QMenu>
#include <QPushButton>
#include <QVBoxLayout>
#include <QtTest>

namespace {

template <class T = QWidget> T* child(QWidget* inParent, const char* inText)
{
    for (T* widget : inParent->findChildren<T*>()) {
        if (widget->property("text").toString() == QLatin1String(inText))
            return widget;
    }
    return nullptr;
}

// A window with a text edit whose dialog was opened by its find shortcut.
struct Fixture
{
    explicit Fixture(const QString& inText, int inFrom = 0, int inTo = 0)
    {
        new QVBoxLayout(&window);
        window.layout()->addWidget(edit);
        edit->setPlainText(inText);
        QTextCursor cursor(edit->document());
        cursor.setPosition(inFrom);
        cursor.setPosition(inTo, QTextCursor::KeepAnchor);
        edit->setTextCursor(cursor);
        window.show();
        QApplication::setActiveWindow(&window);
        QVERIFY(QTest::qWaitForWindowActive(&window));
        edit->setFocus();
        QTest::keyClick(edit, Qt::Key_F, Qt::ControlModifier);
        dialog = window.findChild<ZuFindReplaceDialog*>();
        find = qobject_cast<QLineEdit*>(child<QLabel>(dialog, "Fi&nd what:")->buddy());
        replace = qobject_cast<QLineEdit*>(child<QLabel>(dialog, "Re&place with:")->buddy());
        QApplication::setActiveWindow(dialog);
        QVERIFY(QTest::qWaitForWindowActive(dialog));
    }
    // Ticks check boxes by their keys (c match case, w whole words, b backward), then types.
    void type(const QString& inOptions, const QString& inFind, const QString& inReplace = {})
    {
        for (QChar key : inOptions) {
            QTest::keyClick(dialog, key.toLatin1(), Qt::AltModifier);
            QTRY_VERIFY(QApplication::focusWidget()->property("checked").toBool());
        }
        QTest::keyClicks(find, inFind);
        QTest::keyClicks(replace, inReplace);
    }
    // The selection, with "!" when the last search was announced as failed.
    QString result() const
    {
        const QTextCursor cursor = edit->textCursor();
        const bool failed =
            !QAccessible::queryAccessibleInterface(find)->text(QAccessible::Description).isEmpty();
        return QString("%1-%2%3")
            .arg(cursor.selectionStart())
            .arg(cursor.selectionEnd())
            .arg(failed ? "!" : "");
    }

    QWidget window;
    ZuTextEdit* edit = new ZuTextEdit(&window);
    ZuFindReplaceDialog* dialog = nullptr;
    QLineEdit* find = nullptr;
    QLineEdit* replace = nullptr;
};

const char* const kButtons[] = {"&Find", "&Replace", "Replace A&ll"};

} // namespace

class tst_FindReplace : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    // The parts side by side. Enter in either field finds, F3 and Shift+F3 find on in the dialog
    // and in the text edit, Escape closes; with nothing to find F3 opens the dialog.
    void keys()
    {
        Fixture f("a b a b");
        QCOMPARE(f.dialog->windowTitle(), "Find and Replace");
        const auto parts = f.dialog->findChildren<QWidget*>(QString(), Qt::FindDirectChildrenOnly);
        QCOMPARE(parts.size(), 2 + 2 + 3 + 4);
        for (QWidget* part : parts) {
            for (QWidget* other : parts)
                QVERIFY(part == other || !part->geometry().intersects(other->geometry()));
        }
        QTest::keyClick(f.dialog, Qt::Key_P, Qt::AltModifier);
        QCOMPARE(QApplication::focusWidget(), f.replace);
        QTest::keyClick(f.replace, Qt::Key_Return); // nothing to find yet
        QTest::keyClicks(f.find, "b");
        QTest::keyClick(f.find, Qt::Key_Return);
        QStringList results{f.result()};
        QTest::keyClick(f.replace, Qt::Key_Enter, Qt::KeypadModifier);
        QTest::keyClick(f.find, Qt::Key_F3);
        results << f.result();
        QTest::keyClick(f.find, Qt::Key_F3, Qt::ShiftModifier);
        results << f.result();
        QTest::keyClick(f.find, Qt::Key_Escape);
        QVERIFY(!f.dialog->isVisible());
        QApplication::setActiveWindow(&f.window);
        QVERIFY(QTest::qWaitForWindowActive(&f.window));
        QTest::keyClick(f.edit, Qt::Key_F3);
        results << f.result();
        QTest::keyClick(f.edit, Qt::Key_F3, Qt::ShiftModifier);
        results << f.result();
        QCOMPARE(results, QStringList({"2-3", "6-7!", "2-3", "6-7", "2-3"}));
        QTest::keyClick(f.edit, Qt::Key_Return); // the text edit's own keys stay its own
        QCOMPARE(f.edit->toPlainText(), "a \n a b");
        QVERIFY(!f.dialog->isVisible());
        f.find->clear();
        QTest::keyClick(f.edit, Qt::Key_F3);
        QVERIFY(f.dialog->isVisible());
    }

    void enabling_data()
    {
        QTest::addColumn<QString>("findText");
        QTest::addColumn<QString>("replaceText");
        QTest::addColumn<QString>("enabled"); // Find, Replace, Replace All, field, its label
        const auto row = [](const char* inTag, const char* inFind, const char* inReplace,
                            const char* inEnabled) {
            QTest::newRow(inTag) << QString(inFind) << QString(inReplace) << QString(inEnabled);
        };
        row("no document", "a", "b", "00000");
        row("find only", "a", "", "10011");
        row("both", "a", "b", "11111");
        row("read-only", "a", "b", "10000");
    }
    void enabling()
    {
        QFETCH(QString, findText);
        QFETCH(QString, replaceText);
        Fixture f("a");
        const QLatin1String tag(QTest::currentDataTag());
        f.edit->setReadOnly(tag == QLatin1String("read-only"));
        f.dialog->setDocument(tag == QLatin1String("no document") ? nullptr : f.edit);
        f.type(QString(), findText, replaceText);
        QString enabled;
        for (QWidget* part : {child(f.dialog, kButtons[0]), child(f.dialog, kButtons[1]),
                              child(f.dialog, kButtons[2]), static_cast<QWidget*>(f.replace),
                              child(f.dialog, "Re&place with:")})
            enabled += part->isEnabled() ? '1' : '0';
        QTEST(enabled, "enabled");
        QVERIFY(!child<QPushButton>(f.dialog, "&Find")->isDefault());
    }

    void findAndReplace_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<int>("from"); // the selection before the first step
        QTest::addColumn<int>("to");
        QTest::addColumn<QString>("options");
        QTest::addColumn<QString>("findText"); // replaced by "pp"
        // Steps: f Find, r Replace, a Replace All, u undo; each followed by its result.
        QTest::addColumn<QStringList>("steps");
        QTest::addColumn<QString>("finalText");
        const auto row = [](const char* inTag, const char* inText, int inFrom, int inTo,
                            const char* inOptions, const char* inFind, const QStringList& inSteps,
                            const char* inEnd) {
            QTest::newRow(inTag) << inText << inFrom << inTo << inOptions << inFind << inSteps
                                 << inEnd;
        };
        row("forward", "a b a", 0, 0, "", "a", {"f 0-1", "f 4-5", "f 4-5!"}, "a b a");
        row("backward from the end", "a b a", 5, 5, "b", "a", {"f 4-5", "f 0-1", "f 0-1!"},
            "a b a");
        row("backward over words", "a b x a b", 9, 9, "b", "a b", {"f 6-9", "f 0-3"}, "a b x a b");
        row("match case", "A a", 0, 0, "c", "a", {"f 2-3", "f 2-3!"}, "A a");
        row("any case", "A a", 0, 0, "", "a", {"f 0-1", "f 2-3"}, "A a");
        row("whole words", "aa a", 0, 0, "w", "a", {"f 3-4"}, "aa a");
        row("replace other case", "A a", 0, 1, "", "a", {"r 3-4"}, "pp a");
        row("match case keeps it", "A a", 0, 1, "c", "a", {"r 2-3"}, "A a");
        row("unselected only finds", "a a", 0, 0, "", "a", {"r 0-1", "r 3-4", "r 5-5!"}, "pp pp");
        row("replace backward", "a a", 2, 3, "b", "a", {"r 0-1"}, "a pp");
        row("replace all, undo one", "a A a", 0, 0, "", "a", {"a 2-2", "u 7-7"}, "pp pp a");
        row("all, whole words", "a aa a", 0, 0, "w", "a", {"a 2-2"}, "pp aa pp");
    }
    void findAndReplace()
    {
        QFETCH(QString, text);
        QFETCH(int, from);
        QFETCH(int, to);
        QFETCH(QString, options);
        QFETCH(QString, findText);
        QFETCH(QStringList, steps);
        Fixture f(text, from, to);
        f.type(options, findText, "pp");
        QStringList results;
        for (const QString& step : steps) {
            const int button = QString("fra").indexOf(step.at(0));
            if (button < 0)
                f.edit->undo();
            else
                QTest::mouseClick(child<QPushButton>(f.dialog, kButtons[button]), Qt::LeftButton);
            results << step.left(2) + f.result();
        }
        QCOMPARE(results, steps);
        QTEST(f.edit->toPlainText(), "finalText");
    }

    // Marks are green extra selections beside the host's own: the document, its formatting
    // and undo steps stay as they are. Their text follows the palette; Replace All and the
    // dialog's end take them off.
    void marks()
    {
        Fixture f(QString{});
        f.edit->setHtml("<b>word</b> and word");
        f.edit->document()->setModified(false);
        f.edit->setExtraSelections({{QTextCursor(f.edit->document()), {}}}); // the host's own
        const auto markAll = [&f](const char* inText) {
            f.find->setText(inText);
            QMetaObject::invokeMethod(f.dialog, "findAllClicked");
            QStringList marked;
            for (const QTextEdit::ExtraSelection& mark : f.edit->extraSelections())
                marked << mark.cursor.selectedText() + mark.format.background().color().name();
            return marked;
        };
        markAll("word");
        QCOMPARE(markAll("word"), QStringList({"#000000", "word#00ff00", "word#00ff00"}));
        QVERIFY(!f.edit->document()->isModified());
        QCOMPARE(f.edit->document()->availableUndoSteps(), 0);
        QVERIFY(f.edit->document()->find("word").charFormat().font().bold());

        QPalette dark = f.edit->palette(); // the darker of text and base, also after a switch
        dark.setColor(QPalette::Text, Qt::white);
        dark.setColor(QPalette::Base, QColor(20, 20, 20));
        f.edit->setPalette(dark);
        QCOMPARE(f.edit->extraSelections().last().format.foreground().color(), QColor(20, 20, 20));
        f.dialog->replaceAll("and", "plus", Qt::CaseSensitive, false, false);
        QCOMPARE(f.edit->extraSelections().size(), 1);
        QCOMPARE(markAll("plus"), QStringList({"#000000", "plus#00ff00"}));
        delete f.dialog;
        QCOMPARE(f.edit->extraSelections().size(), 1);
    }

    // The context menu offers Find... after a separator and is deleted after use; the same
    // dialog comes forward again. The find shortcut opens the dialog of the focused one of
    // two text edits. A text edit that goes takes its dialog with it, safe meanwhile.
    void textEdit()
    {
        Fixture f("one");
        f.dialog->hide();
        for (int round = 0; round < 2; ++round) {
            QApplication::setActiveWindow(&f.window);
            QTimer::singleShot(0, [] {
                auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
                const QList<QAction*> actions = menu->actions();
                QVERIFY(actions.at(actions.size() - 2)->isSeparator());
                QCOMPARE(actions.last()->text(), "Find...");
                actions.last()->trigger();
                menu->close();
            });
            QContextMenuEvent event(QContextMenuEvent::Mouse, QPoint(5, 5));
            QApplication::sendEvent(f.edit->viewport(), &event);
            QVERIFY(f.edit->findChildren<QMenu*>().isEmpty());
        }
        QCOMPARE(f.window.findChildren<ZuFindReplaceDialog*>(), {f.dialog});
        QTRY_COMPARE(QApplication::activeWindow(), f.dialog);

        auto* second = new ZuTextEdit(&f.window);
        f.window.layout()->addWidget(second);
        second->setPlainText("two");
        second->show();
        QApplication::setActiveWindow(&f.window);
        QVERIFY(QTest::qWaitForWindowActive(&f.window));
        second->setFocus();
        QTest::keyClick(second, Qt::Key_F, Qt::ControlModifier);
        QPointer<ZuFindReplaceDialog> other = f.window.findChildren<ZuFindReplaceDialog*>().last();
        QVERIFY(other != f.dialog);
        other->findChildren<QLineEdit*>().first()->setText("two");
        QTest::mouseClick(child<QPushButton>(other, "&Find"), Qt::LeftButton);
        QCOMPARE(second->textCursor().selectedText(), "two");

        delete second;
        QVERIFY(!other->isVisible() && !child(other, "&Find")->isEnabled());
        for (const char* slot : {"findClicked", "findAllClicked", "replaceClicked"})
            QVERIFY(QMetaObject::invokeMethod(other, slot));
        other->replaceAll("a", "b", Qt::CaseSensitive, false, false);
        QTRY_VERIFY(other.isNull());
    }
};

QTEST_MAIN(tst_FindReplace)
#include "tst_findreplace.moc"
