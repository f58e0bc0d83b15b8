#include "zubase/ZuFindReplaceDialog.h"

#include <QAction>
#include <QCheckBox>
#include <QEvent>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QPushButton>
#include <QTextDocument>
#include <QTextEdit>
#include <QVBoxLayout>

#include <algorithm>

namespace {

// Tags the extra selections that are this dialog's marks, so that a host's own extra
// selections (a current-line highlight, say) survive when the marks are taken off.
constexpr int kMarkProperty = QTextFormat::UserProperty + 0x4d4b;

QTextDocument::FindFlags findFlags(Qt::CaseSensitivity inCase, bool inWholeWords, bool inBackward)
{
    QTextDocument::FindFlags flags;
    if (inCase == Qt::CaseSensitive)
        flags |= QTextDocument::FindCaseSensitively;
    if (inWholeWords)
        flags |= QTextDocument::FindWholeWords;
    if (inBackward)
        flags |= QTextDocument::FindBackward;
    return flags;
}

// Calls inVisit with every forward match from the start of the document, one after the
// other; the cursor handed in may be changed (a replacement) before the search goes on.
template <typename Visit>
void forEachMatch(QTextDocument* inDocument, const QString& inFind,
                  QTextDocument::FindFlags inFlags, Visit inVisit)
{
    QTextCursor cursor(inDocument);
    while (!cursor.atEnd()) {
        cursor = inDocument->find(inFind, cursor, inFlags);
        if (cursor.isNull() || !cursor.hasSelection())
            break;
        inVisit(cursor);
    }
}

} // namespace

class ZuFindReplaceDialog::Private : public QObject
{
public:
    explicit Private(ZuFindReplaceDialog* inQ) : q(inQ) {}

    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;

    // The mark's green is fixed; its text takes the darker of the edit's text and base colours,
    // which is the one that reads on green in a light and in a dark scheme alike.
    QTextCharFormat markFormat() const;
    void removeMarks();
    void recolourMarks();
    void announce(bool inFound);
    void findFromKeyboard(bool inBackward);

    ZuFindReplaceDialog* const q;
    QPointer<QTextEdit> document;
    QLabel* findLabel = nullptr;
    QLabel* replaceLabel = nullptr;
    QLineEdit* findField = nullptr;
    QLineEdit* replaceField = nullptr;
    QCheckBox* matchCase = nullptr;
    QCheckBox* searchBackward = nullptr;
    QCheckBox* wholeWords = nullptr;
    QPushButton* findButton = nullptr;
    QPushButton* replaceButton = nullptr;
    QPushButton* replaceAllButton = nullptr;
    QPushButton* closeButton = nullptr;
    int marks = 0;
    int lastFoundPosition = -1;
    QAction* findNextAction = nullptr;
    QAction* findPreviousAction = nullptr;
    QMetaObject::Connection documentGone;
};

bool ZuFindReplaceDialog::Private::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    // The type first: a text edit in its destructor still sends events, and the guarded
    // pointer may not be read as a QTextEdit then.
    if (inEvent->type() == QEvent::PaletteChange && inWatched == document.data()) {
        recolourMarks();
    } else if (inEvent->type() == QEvent::KeyPress &&
               (inWatched == findField || inWatched == replaceField)) {
        // Enter in a field runs Find; QDialog would press whichever button is default now.
        const int key = static_cast<QKeyEvent*>(inEvent)->key();
        if (key == Qt::Key_Return || key == Qt::Key_Enter) {
            if (findButton->isEnabled())
                findButton->click();
            return true;
        }
    }
    return QObject::eventFilter(inWatched, inEvent);
}

QTextCharFormat ZuFindReplaceDialog::Private::markFormat() const
{
    QTextCharFormat format;
    format.setBackground(QBrush(QColor(0, 255, 0, 255), Qt::SolidPattern));
    if (document) {
        const QColor text = document->palette().color(QPalette::Text);
        const QColor base = document->palette().color(QPalette::Base);
        format.setForeground(qGray(text.rgb()) <= qGray(base.rgb()) ? text : base);
    }
    format.setProperty(kMarkProperty, true);
    return format;
}

void ZuFindReplaceDialog::Private::removeMarks()
{
    if (!document)
        return;
    QList<QTextEdit::ExtraSelection> kept = document->extraSelections();
    const int before = kept.size();
    kept.erase(std::remove_if(kept.begin(), kept.end(),
                              [](const QTextEdit::ExtraSelection& inSelection) {
                                  return inSelection.format.hasProperty(kMarkProperty);
                              }),
               kept.end());
    if (kept.size() != before)
        document->setExtraSelections(kept);
}

void ZuFindReplaceDialog::Private::recolourMarks()
{
    if (!document)
        return;
    QList<QTextEdit::ExtraSelection> selections = document->extraSelections();
    bool changed = false;
    const QTextCharFormat format = markFormat();
    for (QTextEdit::ExtraSelection& selection : selections) {
        if (selection.format.hasProperty(kMarkProperty) && selection.format != format) {
            selection.format = format;
            changed = true;
        }
    }
    if (changed)
        document->setExtraSelections(selections);
}

void ZuFindReplaceDialog::Private::announce(bool inFound)
{
    // Screen readers pick the description up; a sighted user sees the selection move or not.
    findField->setAccessibleDescription(
        inFound ? QString() : ZuFindReplaceDialog::tr("Not found: %1").arg(findField->text()));
}

void ZuFindReplaceDialog::Private::findFromKeyboard(bool inBackward)
{
    if (!findButton->isEnabled()) {
        q->show();
        q->activateWindow();
        findField->setFocus(Qt::ShortcutFocusReason);
        return;
    }
    q->findPrevNext(findField->text(), replaceField->text(),
                    matchCase->isChecked() ? Qt::CaseSensitive : Qt::CaseInsensitive,
                    wholeWords->isChecked(), inBackward);
}

ZuFindReplaceDialog::ZuFindReplaceDialog(QWidget* inParent)
    : ZuDialog(inParent), d(new Private(this))
{
    setWindowFlags(windowFlags() | Qt::Tool);

    d->findLabel = new QLabel(tr("Fi&nd what:"), this);
    d->replaceLabel = new QLabel(tr("Re&place with:"), this);
    d->findField = new QLineEdit(this);
    d->replaceField = new QLineEdit(this);
    d->findLabel->setBuddy(d->findField);
    d->replaceLabel->setBuddy(d->replaceField);
    d->findField->installEventFilter(d.get());
    d->replaceField->installEventFilter(d.get());

    d->matchCase = new QCheckBox(tr("Match &case"), this);
    d->searchBackward = new QCheckBox(tr("Search &backward"), this);
    d->wholeWords = new QCheckBox(tr("Whole &words"), this);
    d->findButton = new QPushButton(tr("&Find"), this);
    d->replaceButton = new QPushButton(tr("&Replace"), this);
    d->replaceAllButton = new QPushButton(tr("Replace A&ll"), this);
    d->closeButton = new QPushButton(tr("Close"), this);
    for (QPushButton* button : {d->findButton, d->replaceButton, d->replaceAllButton}) {
        button->setDefault(false);
        button->setEnabled(false);
    }

    auto* fields = new QGridLayout;
    fields->addWidget(d->findLabel, 0, 0, Qt::AlignLeft);
    fields->addWidget(d->findField, 0, 1, Qt::AlignJustify);
    fields->addWidget(d->replaceLabel, 1, 0, Qt::AlignLeft);
    fields->addWidget(d->replaceField, 1, 1, Qt::AlignJustify);
    auto* left = new QVBoxLayout;
    left->addLayout(fields);
    left->addWidget(d->matchCase);
    left->addWidget(d->searchBackward);
    left->addWidget(d->wholeWords);
    auto* buttons = new QVBoxLayout;
    buttons->addWidget(d->findButton);
    buttons->addWidget(d->replaceButton);
    buttons->addWidget(d->replaceAllButton);
    buttons->addWidget(d->closeButton);
    buttons->addStretch();
    auto* main = new QHBoxLayout;
    main->addLayout(left);
    main->addLayout(buttons);
    main->setSizeConstraint(QLayout::SetFixedSize);
    setLayout(main);

    connect(d->findField, SIGNAL(textChanged(const QString&)), this,
            SLOT(enableFindButton(const QString&)));
    connect(d->replaceField, SIGNAL(textChanged(const QString&)), this,
            SLOT(enableReplaceButton(const QString&)));
    connect(d->findButton, SIGNAL(clicked()), this, SLOT(findClicked()));
    connect(d->replaceButton, SIGNAL(clicked()), this, SLOT(replaceClicked()));
    connect(d->replaceAllButton, SIGNAL(clicked()), this, SLOT(replaceAllClicked()));
    connect(d->closeButton, SIGNAL(clicked()), this, SLOT(close()));

    // Also added to the text edit in setDocument(), so they work from there as well.
    d->findNextAction = new QAction(this);
    d->findNextAction->setShortcut(QKeySequence(Qt::Key_F3));
    d->findPreviousAction = new QAction(this);
    d->findPreviousAction->setShortcut(QKeySequence(Qt::SHIFT + Qt::Key_F3));
    for (QAction* action : {d->findNextAction, d->findPreviousAction}) {
        action->setShortcutContext(Qt::WidgetWithChildrenShortcut);
        addAction(action);
    }
    connect(d->findNextAction, &QAction::triggered, d.get(),
            [this] { d->findFromKeyboard(false); });
    connect(d->findPreviousAction, &QAction::triggered, d.get(),
            [this] { d->findFromKeyboard(true); });

    setWindowTitle(tr("Find and Replace"));
}

ZuFindReplaceDialog::~ZuFindReplaceDialog()
{
    // The marks cannot be taken off without the dialog.
    d->removeMarks();
    disconnect(d->documentGone);
}

void ZuFindReplaceDialog::setDocument(QTextEdit* inEdit)
{
    if (d->document != inEdit) {
        if (d->document) {
            d->removeMarks();
            d->document->removeEventFilter(d.get());
            d->document->removeAction(d->findNextAction);
            d->document->removeAction(d->findPreviousAction);
        }
        disconnect(d->documentGone);
        d->document = inEdit;
        d->marks = 0;
        if (inEdit) {
            inEdit->installEventFilter(d.get());
            inEdit->addAction(d->findNextAction);
            inEdit->addAction(d->findPreviousAction);
            // A text edit that goes leaves nothing to search: grey the buttons out. A widget
            // says so before its guards are cleared, so drop the pointer here.
            d->documentGone = connect(inEdit, &QObject::destroyed, this, [this] {
                d->document = nullptr;
                enableFindButton(d->findField->text());
            });
        }
    }
    if (inEdit)
        d->lastFoundPosition = inEdit->textCursor().position();
    enableFindButton(d->findField->text());
}

void ZuFindReplaceDialog::replaceAll(const QString& inFind, const QString& inReplace,
                                     Qt::CaseSensitivity inCase, bool inWholeWords, bool inAsHtml)
{
    if (!d->document || d->document->isReadOnly())
        return;
    // The marks are on the matches that go now; and every mark is a cursor the document would
    // move along at each replacement, which made this quadratic.
    d->removeMarks();
    d->marks = 0;
    forEachMatch(d->document->document(), inFind, findFlags(inCase, inWholeWords, false),
                 [&](QTextCursor& ioMatch) {
                     // One undo step per replacement, never a removal on its own.
                     ioMatch.beginEditBlock();
                     ioMatch.removeSelectedText();
                     if (inAsHtml)
                         ioMatch.insertHtml(inReplace);
                     else
                         ioMatch.insertText(inReplace);
                     ioMatch.endEditBlock();
                 });
}

void ZuFindReplaceDialog::findClicked()
{
    findPrevNext(d->findField->text(), d->replaceField->text(),
                 d->matchCase->isChecked() ? Qt::CaseSensitive : Qt::CaseInsensitive,
                 d->wholeWords->isChecked(), d->searchBackward->isChecked());
}

void ZuFindReplaceDialog::findAllClicked()
{
    findAll(d->findField->text(),
            d->matchCase->isChecked() ? Qt::CaseSensitive : Qt::CaseInsensitive,
            d->wholeWords->isChecked());
}

void ZuFindReplaceDialog::replaceClicked()
{
    QTextEdit* edit = d->document;
    if (!edit || edit->isReadOnly())
        return;
    const QString find = d->findField->text();
    const QString replacement = d->replaceField->text();
    const Qt::CaseSensitivity sensitivity =
        d->matchCase->isChecked() ? Qt::CaseSensitive : Qt::CaseInsensitive;
    const bool backward = d->searchBackward->isChecked();

    QTextCursor cursor = edit->textCursor();
    if (cursor.hasSelection() && QString::compare(cursor.selectedText(), find, sensitivity) == 0) {
        const int start = cursor.selectionStart();
        cursor.insertText(replacement);
        if (backward) {
            // Back to the start of the replacement, so the backward search skips it.
            cursor.setPosition(start);
            edit->setTextCursor(cursor);
        }
    }
    findPrevNext(find, replacement, sensitivity, d->wholeWords->isChecked(), backward);
}

void ZuFindReplaceDialog::replaceAllClicked()
{
    replaceAll(d->findField->text(), d->replaceField->text(),
               d->matchCase->isChecked() ? Qt::CaseSensitive : Qt::CaseInsensitive,
               d->wholeWords->isChecked(), false);
}

void ZuFindReplaceDialog::enableFindButton(const QString& text)
{
    d->findButton->setEnabled(d->document && !text.isEmpty());
    d->findButton->setDefault(false);
    enableReplaceButton(d->replaceField->text());
}

void ZuFindReplaceDialog::enableReplaceButton(const QString&)
{
    const bool editable = d->document && !d->document->isReadOnly();
    const bool both = !d->findField->text().isEmpty() && !d->replaceField->text().isEmpty();
    d->replaceLabel->setEnabled(editable);
    d->replaceField->setEnabled(editable);
    d->replaceButton->setEnabled(editable && both);
    d->replaceAllButton->setEnabled(editable && both);
}

void ZuFindReplaceDialog::findPrevNext(const QString& inFind, const QString&,
                                       Qt::CaseSensitivity inCase, bool inWholeWords,
                                       bool inBackward)
{
    QTextEdit* edit = d->document;
    if (!edit)
        return;
    const QTextCursor current = edit->textCursor();
    QTextCursor start = current;
    if (d->lastFoundPosition != -1) {
        const int position = current.position();
        // Backward right after a match starts before that match, so it is not found again
        // (also when the match spans several words).
        start.setPosition(
            position != d->lastFoundPosition || !inBackward ? position : current.selectionStart());
    }
    bool found = false;
    // At the end of the document only a forward search has nothing left to look at.
    if (!start.isNull() && (inBackward || !start.atEnd())) {
        const QTextCursor match =
            edit->document()->find(inFind, start, findFlags(inCase, inWholeWords, inBackward));
        if (!match.isNull()) {
            d->lastFoundPosition = match.position();
            edit->setTextCursor(match);
            found = true;
        } else {
            d->lastFoundPosition = -1;
        }
    }
    d->marks = 1;
    d->announce(found);
}

void ZuFindReplaceDialog::findAll(const QString& inFind, Qt::CaseSensitivity inCase,
                                  bool inWholeWords)
{
    QTextEdit* edit = d->document;
    if (!edit)
        return;
    // Marks are extra selections: the document, its modified flag and its undo steps stay
    // as they are, and so does the text's own formatting when the marks go.
    d->removeMarks();
    d->marks = 0;
    QList<QTextEdit::ExtraSelection> selections = edit->extraSelections();
    const QTextCharFormat format = d->markFormat();
    int count = 0;
    forEachMatch(edit->document(), inFind, findFlags(inCase, inWholeWords, false),
                 [&](const QTextCursor& inMatch) {
                     selections.append({inMatch, format});
                     ++count;
                 });
    if (count > 0)
        edit->setExtraSelections(selections);
    d->marks = count;
}

int ZuFindReplaceDialog::markSelection(const QString& inFind, Qt::CaseSensitivity inCase,
                                       bool inWholeWords, const QTextCharFormat& inFormat)
{
    if (!d->document)
        return 0;
    int count = 0;
    forEachMatch(d->document->document(), inFind, findFlags(inCase, inWholeWords, false),
                 [&](QTextCursor& ioMatch) {
                     ioMatch.mergeCharFormat(inFormat);
                     ++count;
                 });
    return count;
}
