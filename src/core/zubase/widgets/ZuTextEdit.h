#pragma once

#include "zubase/zubase_export.h"

#include <QTextEdit>

#include <memory>

// A text edit whose context menu and find shortcut (QKeySequence::Find, while it has the
// focus) offer "Find...": a ZuFindReplaceDialog on this text edit, made on first use, reused
// afterwards and closed and destroyed with the text edit.
class ZUBASE_EXPORT ZuTextEdit : public QTextEdit
{
    Q_OBJECT
public:
    explicit ZuTextEdit(QWidget* inParent);
    ~ZuTextEdit() override;

protected Q_SLOTS:
    // The standard context menu plus "Find...", at the mouse cursor.
    void slotContextMenu(const QPoint& inPoint);
    // Shows the find dialog on this text edit.
    void slotFindDialog();

private:
    class Private;
    std::unique_ptr<Private> const d;
};
