// Find/replace dialog: its texts and keys, enabling, find in both directions with the
// options, replace, replace all, the green marks, and a text edit that goes away.
#include "zubase/ZuFindReplaceDialog.h"

#include <QAccessible>
#include <QCheckBox>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QTextEdit>
#include <QVBoxLayout>
#include <QtTest>

namespace {

template <class T> T* child(QWidget* inParent, const QString& inText)
{
    for (T* widget : inParent->findChildren<T*>()) {
        if (widget->text() == inText)
            return widget;
    }
    return nullptr;
}

QString selection(const QTextEdit* inEdit)
{
    const QTextCursor cursor = inEdit->textCursor();
    return cursor.hasSelection()
               ? QStringLiteral("%1-%2").arg(cursor.selectionStart()).arg(cursor.selectionEnd())
               : QStringLiteral("at %1").arg(cursor.position());
}

// A window with a text edit and its dialog, shown and active, with the dialog's parts.
struct Fixture
{
    explicit Fixture(const QString& inText)
    {
        edit = new QTextEdit(&window);
        new QVBoxLayout(&window);
        window.layout()->addWidget(edit);
        edit->setPlainText(inText);
        window.show();
        dialog = new ZuFindReplaceDialog(&window);
        dialog->setDocument(edit);
        dialog->show();
        QApplication::setActiveWindow(dialog);
        find = qobject_cast<QLineEdit*>(child<QLabel>(dialog, "Fi&nd what:")->buddy());
        replace = qobject_cast<QLineEdit*>(child<QLabel>(dialog, "Re&place with:")->buddy());
        findButton = child<QPushButton>(dialog, "&Find");
        replaceButton = child<QPushButton>(dialog, "&Replace");
        replaceAllButton = child<QPushButton>(dialog, "Replace A&ll");
    }
    // Ticks the check boxes by their keys: c match case, w whole words, b backward.
    void setOptions(const QString& inOptions)
    {
        const QHash<QChar, QString> boxes = {
            {'c', "Match &case"}, {'w', "Whole &words"}, {'b', "Search &backward"}};
        for (QChar option : inOptions) {
            QCheckBox* box = child<QCheckBox>(dialog, boxes.value(option));
            QTest::keyClick(dialog, option.toLatin1(), Qt::AltModifier);
            QTRY_VERIFY(box->isChecked()); // a mnemonic clicks after a short animation
        }
    }
    QString description() const
    {
        return QAccessible::queryAccessibleInterface(find)->text(QAccessible::Description);
    }

    QWidget window;
    QTextEdit* edit = nullptr;
    ZuFindReplaceDialog* dialog = nullptr;
    QLineEdit* find = nullptr;
    QLineEdit* replace = nullptr;
    QPushButton* findButton = nullptr;
    QPushButton* replaceButton = nullptr;
    QPushButton* replaceAllButton = nullptr;
};

} // namespace

class tst_FindReplaceDialog : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void textsKeysAndSlots();
    void enabling_data();
    void enabling();
    void find_data();
    void find();
    void replace_data();
    void replace();
    void replaceAll_data();
    void replaceAll();
    void marksLeaveDocumentAlone();
    void keyboard();
    void documentDestroyed();
};

void tst_FindReplaceDialog::textsKeysAndSlots()
{
    Fixture f(QString{});
    QCOMPARE(f.dialog->windowTitle(), QStringLiteral("Find and Replace"));
    QVERIFY(f.dialog->windowFlags() & Qt::Tool);
    QVERIFY(f.find && f.replace && f.findButton && f.replaceButton && f.replaceAllButton);
    for (const char* box : {"Match &case", "Search &backward", "Whole &words"})
        QVERIFY2(child<QCheckBox>(f.dialog, box), box);
    QVERIFY(child<QPushButton>(f.dialog, "Close")->isEnabled());
    QVERIFY(!f.findButton->isEnabled() && !f.replaceButton->isEnabled());
    QVERIFY(!f.replaceAllButton->isEnabled());

    // Screen readers name the fields by their labels; Alt+N and Alt+P reach them.
    QCOMPARE(QAccessible::queryAccessibleInterface(f.find)->text(QAccessible::Name),
             QStringLiteral("Find what:"));
    QVERIFY(QTest::qWaitForWindowActive(f.dialog));
    QTest::keyClick(f.dialog, Qt::Key_P, Qt::AltModifier);
    QCOMPARE(QApplication::focusWidget(), f.replace);
    QTest::keyClick(f.dialog, Qt::Key_N, Qt::AltModifier);
    QCOMPARE(QApplication::focusWidget(), f.find);

    // Hosts reach the slots by name; the dialog has no signals of its own.
    const QMetaObject* meta = f.dialog->metaObject();
    QStringList methods;
    for (int i = meta->methodOffset(); i < meta->methodCount(); ++i)
        methods << QString::fromLatin1(meta->method(i).methodSignature());
    QCOMPARE(methods, QStringList({"findClicked()", "findAllClicked()", "replaceClicked()",
                                   "replaceAllClicked()", "enableFindButton(QString)",
                                   "enableReplaceButton(QString)"}));
}

void tst_FindReplaceDialog::enabling_data()
{
    QTest::addColumn<bool>("document");
    QTest::addColumn<bool>("readOnly");
    QTest::addColumn<QString>("findText");
    QTest::addColumn<QString>("replaceText");
    QTest::addColumn<bool>("findEnabled");
    QTest::addColumn<bool>("replaceEnabled");
    QTest::addColumn<bool>("fieldEnabled");
    QTest::newRow("no document") << false << false << "a"
                                 << "b" << false << false << false;
    QTest::newRow("nothing typed") << true << false << ""
                                   << "" << false << false << true;
    QTest::newRow("find only") << true << false << "a"
                               << "" << true << false << true;
    QTest::newRow("replace only") << true << false << ""
                                  << "b" << false << false << true;
    QTest::newRow("both") << true << false << "a"
                          << "b" << true << true << true;
    QTest::newRow("read-only") << true << true << "a"
                               << "b" << true << false << false;
}

void tst_FindReplaceDialog::enabling()
{
    QFETCH(bool, document);
    QFETCH(bool, readOnly);
    QFETCH(QString, findText);
    QFETCH(QString, replaceText);
    Fixture f(QStringLiteral("a"));
    f.edit->setReadOnly(readOnly);
    f.dialog->setDocument(document ? f.edit : nullptr);
    QTest::keyClicks(f.replace, replaceText);
    QTest::keyClicks(f.find, findText);
    QTEST(f.findButton->isEnabled(), "findEnabled");
    QTEST(f.replaceButton->isEnabled(), "replaceEnabled");
    QTEST(f.replaceAllButton->isEnabled(), "replaceEnabled");
    QTEST(f.replace->isEnabled(), "fieldEnabled");
    QTEST(child<QLabel>(f.dialog, "Re&place with:")->isEnabled(), "fieldEnabled");
    QVERIFY(!f.findButton->isDefault());
}

void tst_FindReplaceDialog::find_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("cursor");
    QTest::addColumn<QString>("findText");
    QTest::addColumn<QString>("options");
    // The selection after each press of Find; "!" when the press was announced as failed.
    QTest::addColumn<QStringList>("presses");
    QTest::newRow("forward") << "a b a" << 0 << "a"
                             << "" << QStringList{"0-1", "4-5", "4-5!"};
    QTest::newRow("backward from the end") << "a b a" << 5 << "a"
                                           << "b" << QStringList{"4-5", "0-1", "0-1!"};
    QTest::newRow("backward, several words") << "foo bar x foo bar" << 17 << "foo bar"
                                             << "b" << QStringList{"10-17", "0-7"};
    QTest::newRow("backward after forward") << "a a a" << 0 << "a"
                                            << "" << QStringList{"0-1", "2-3"};
    QTest::newRow("match case") << "A a" << 0 << "a"
                                << "c" << QStringList{"2-3", "2-3!"};
    QTest::newRow("any case") << "A a" << 0 << "a"
                              << "" << QStringList{"0-1", "2-3"};
    QTest::newRow("whole words") << "aa a" << 0 << "a"
                                 << "w" << QStringList{"3-4"};
}

void tst_FindReplaceDialog::find()
{
    QFETCH(QString, text);
    QFETCH(int, cursor);
    QFETCH(QString, findText);
    QFETCH(QString, options);
    QFETCH(QStringList, presses);
    Fixture f(text);
    QTextCursor start = f.edit->textCursor();
    start.setPosition(cursor);
    f.edit->setTextCursor(start);
    f.dialog->setDocument(f.edit);
    QVERIFY(QTest::qWaitForWindowActive(f.dialog));
    f.setOptions(options);
    QTest::keyClicks(f.find, findText);
    QStringList results;
    for (int press = 0; press < presses.size(); ++press) {
        QTest::mouseClick(f.findButton, Qt::LeftButton);
        results << selection(f.edit) + (f.description().isEmpty() ? "" : "!");
    }
    QCOMPARE(results, presses);
    QVERIFY(!f.edit->document()->isModified());
}

void tst_FindReplaceDialog::replace_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("from");
    QTest::addColumn<int>("to");
    QTest::addColumn<QString>("options");
    QTest::addColumn<QString>("result");
    QTest::addColumn<QString>("selected");
    QTest::newRow("case differs, any case") << "Apple apple" << 0 << 5 << ""
                                            << "pear apple"
                                            << "5-10";
    QTest::newRow("case differs, match case") << "Apple apple" << 0 << 5 << "c"
                                              << "Apple apple"
                                              << "6-11";
    QTest::newRow("no selection only finds") << "Apple apple" << 0 << 0 << ""
                                             << "Apple apple"
                                             << "0-5";
    QTest::newRow("backward") << "apple apple" << 6 << 11 << "b"
                              << "apple pear"
                              << "0-5";
}

void tst_FindReplaceDialog::replace()
{
    QFETCH(QString, text);
    QFETCH(int, from);
    QFETCH(int, to);
    QFETCH(QString, options);
    Fixture f(text);
    QVERIFY(QTest::qWaitForWindowActive(f.dialog));
    f.setOptions(options);
    QTest::keyClicks(f.find, "apple");
    QTest::keyClicks(f.replace, "pear");
    QTextCursor selected = f.edit->textCursor();
    selected.setPosition(from);
    selected.setPosition(to, QTextCursor::KeepAnchor);
    f.edit->setTextCursor(selected);
    QTest::mouseClick(f.replaceButton, Qt::LeftButton);
    QTEST(f.edit->toPlainText(), "result");
    QTEST(selection(f.edit), "selected");
}

void tst_FindReplaceDialog::replaceAll_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("findText");
    QTest::addColumn<QString>("replacement");
    QTest::addColumn<bool>("wholeWords");
    QTest::addColumn<bool>("html");
    QTest::addColumn<QString>("result");
    QTest::addColumn<QString>("afterOneUndo");
    QTest::newRow("plain") << "aaa"
                           << "a"
                           << "b" << false << false << "bbb"
                           << "bba";
    QTest::newRow("any case") << "A a"
                              << "a"
                              << "b" << false << false << "b b"
                              << "b a";
    QTest::newRow("whole words") << "a aa a"
                                 << "a"
                                 << "b" << true << false << "b aa b"
                                 << "b aa a";
    QTest::newRow("replacement holds the text") << "a a"
                                                << "a"
                                                << "aa" << false << false << "aa aa"
                                                << "aa a";
    QTest::newRow("html") << "x y"
                          << "x"
                          << "<b>z</b>" << false << true << "z y"
                          << "x y";
    QTest::newRow("no match") << "abc"
                              << "x"
                              << "y" << false << false << "abc"
                              << "abc";
}

void tst_FindReplaceDialog::replaceAll()
{
    QFETCH(QString, text);
    QFETCH(QString, findText);
    QFETCH(QString, replacement);
    QFETCH(bool, wholeWords);
    QFETCH(bool, html);
    Fixture f(text);
    f.dialog->replaceAll(findText, replacement, Qt::CaseInsensitive, wholeWords, html);
    QTEST(f.edit->toPlainText(), "result");
    if (html)
        QVERIFY(f.edit->document()->find("z").charFormat().font().bold());
    f.edit->undo(); // one replacement is one step
    QTEST(f.edit->toPlainText(), "afterOneUndo");

    // Through the button, the fields go in as plain text; read-only stays untouched.
    Fixture g(text);
    QTest::keyClicks(g.find, findText);
    QTest::keyClicks(g.replace, replacement);
    g.edit->setReadOnly(true);
    g.dialog->replaceAll(findText, replacement, Qt::CaseInsensitive, wholeWords, html);
    QCOMPARE(g.edit->toPlainText(), text);
    g.edit->setReadOnly(false);
    g.setOptions(wholeWords ? "w" : "");
    QTest::mouseClick(g.replaceAllButton, Qt::LeftButton);
    if (!html)
        QTEST(g.edit->toPlainText(), "result");
}

void tst_FindReplaceDialog::marksLeaveDocumentAlone()
{
    Fixture f(QString{});
    f.edit->setHtml(QStringLiteral("<b>word</b> and word"));
    f.edit->document()->setModified(false);
    QTextEdit::ExtraSelection own{QTextCursor(f.edit->document()), QTextCharFormat()};
    own.format.setUnderlineStyle(QTextCharFormat::SingleUnderline);
    f.edit->setExtraSelections({own});
    const auto marks = [&f] {
        QStringList found;
        for (const QTextEdit::ExtraSelection& mark : f.edit->extraSelections()) {
            if (mark.format.background().color() == QColor(0, 255, 0))
                found << mark.cursor.selectedText();
        }
        return found;
    };

    QTest::keyClicks(f.find, "word");
    QVERIFY(QMetaObject::invokeMethod(f.dialog, "findAllClicked"));
    QCOMPARE(marks(), QStringList({"word", "word"}));
    QVERIFY(QMetaObject::invokeMethod(f.dialog, "findAllClicked")); // cleared, marked again
    QCOMPARE(marks(), QStringList({"word", "word"}));
    f.find->setText(QStringLiteral("and"));
    QVERIFY(QMetaObject::invokeMethod(f.dialog, "findAllClicked"));
    QCOMPARE(marks(), QStringList{"and"});
    QCOMPARE(f.edit->extraSelections().size(), 2); // the host's own selection stays

    QVERIFY(!f.edit->document()->isModified());
    QCOMPARE(f.edit->document()->availableUndoSteps(), 0);
    QVERIFY(f.edit->document()->find("word").charFormat().font().bold());

    // The mark's text is the darker of text and base, also after a scheme switch.
    QPalette dark = f.edit->palette();
    dark.setColor(QPalette::Text, Qt::white);
    dark.setColor(QPalette::Base, QColor(20, 20, 20));
    f.edit->setPalette(dark);
    const QTextEdit::ExtraSelection mark = f.edit->extraSelections().last();
    QCOMPARE(mark.format.foreground().color(), QColor(20, 20, 20));

    delete f.dialog; // the marks go with the dialog
    QCOMPARE(marks(), QStringList());
    QCOMPARE(f.edit->extraSelections().size(), 1);
}

void tst_FindReplaceDialog::keyboard()
{
    Fixture f(QStringLiteral("a b a b"));
    QVERIFY(QTest::qWaitForWindowActive(f.dialog));
    QTest::keyClick(f.find, Qt::Key_Return); // nothing to find yet
    QCOMPARE(selection(f.edit), QStringLiteral("at 0"));
    QTest::keyClicks(f.find, "b");
    QTest::keyClick(f.find, Qt::Key_Return);
    QCOMPARE(selection(f.edit), QStringLiteral("2-3"));
    QTest::keyClick(f.replace, Qt::Key_Enter, Qt::KeypadModifier);
    QCOMPARE(selection(f.edit), QStringLiteral("6-7"));
    QTest::keyClick(f.find, Qt::Key_F3, Qt::ShiftModifier);
    QCOMPARE(selection(f.edit), QStringLiteral("2-3"));
    QVERIFY(f.dialog->isVisible());
    QTest::keyClick(f.find, Qt::Key_Escape);
    QVERIFY(!f.dialog->isVisible());

    // F3 and Shift+F3 in the text edit search on without the dialog.
    QApplication::setActiveWindow(&f.window);
    QVERIFY(QTest::qWaitForWindowActive(&f.window));
    f.edit->setFocus();
    QTest::keyClick(f.edit, Qt::Key_F3);
    QCOMPARE(selection(f.edit), QStringLiteral("6-7"));
    QTest::keyClick(f.edit, Qt::Key_F3, Qt::ShiftModifier);
    QCOMPARE(selection(f.edit), QStringLiteral("2-3"));
    QVERIFY(!f.dialog->isVisible());
    f.find->clear(); // with nothing to search for, F3 brings the dialog up
    QTest::keyClick(f.edit, Qt::Key_F3);
    QVERIFY(f.dialog->isVisible());
}

void tst_FindReplaceDialog::documentDestroyed()
{
    Fixture f(QStringLiteral("a"));
    QTest::keyClicks(f.find, "a");
    QTest::keyClicks(f.replace, "b");
    QVERIFY(f.replaceAllButton->isEnabled());
    delete f.edit;
    QVERIFY(!f.findButton->isEnabled());
    QVERIFY(!f.replaceAllButton->isEnabled());
    for (const char* slot : {"findClicked", "findAllClicked", "replaceClicked"})
        QVERIFY(QMetaObject::invokeMethod(f.dialog, slot));
    f.dialog->replaceAll("a", "b", Qt::CaseSensitive, false, false);
}

QTEST_MAIN(tst_FindReplaceDialog)
#include "tst_findreplacedialog.moc"
