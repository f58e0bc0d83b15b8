#pragma once

#include "zubase/ZuDialog.h"

#include <QString>

#include <memory>

class QTextCharFormat;
class QTextEdit;

// A small modeless tool window that searches the document of one text edit: find the next or
// previous match (match case, whole words, direction), replace the current match or all of
// them. Enter runs Find, Escape closes, F3 and Shift+F3 find the next and previous match
// while the dialog or the text edit has the focus. A failed search is told through the find
// field's accessible description, never by a message box.
class ZUBASE_EXPORT ZuFindReplaceDialog : public ZuDialog
{
    Q_OBJECT
public:
    explicit ZuFindReplaceDialog(QWidget* inParent);
    ~ZuFindReplaceDialog() override;

    // The text edit to search; not owned. When it is destroyed the dialog searches nothing.
    void setDocument(QTextEdit* inEdit);
    // Replaces every match from the start of the document, each replacement one undo step,
    // as HTML when inAsHtml. Nothing happens without a document or when it is read-only.
    void replaceAll(const QString& inFind, const QString& inReplace, Qt::CaseSensitivity inCase,
                    bool inWholeWords, bool inAsHtml);

private Q_SLOTS:
    void findClicked();
    // Marks every match green without touching the document (no button; for the host).
    void findAllClicked();
    void replaceClicked();
    void replaceAllClicked();
    void enableFindButton(const QString& text);
    void enableReplaceButton(const QString& text);

private:
    void findPrevNext(const QString& inFind, const QString& inReplace, Qt::CaseSensitivity inCase,
                      bool inWholeWords, bool inBackward);
    void findAll(const QString& inFind, Qt::CaseSensitivity inCase, bool inWholeWords);
    // Merges inFormat into every match and returns their number (this changes the document).
    int markSelection(const QString& inFind, Qt::CaseSensitivity inCase, bool inWholeWords,
                      const QTextCharFormat& inFormat);

    class Private;
    std::unique_ptr<Private> const d;
};
