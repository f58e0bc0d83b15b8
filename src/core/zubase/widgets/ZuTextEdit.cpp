#include "zubase/ZuTextEdit.h"

#include "zubase/ZuFindReplaceDialog.h"

#include <QAction>
#include <QCursor>
#include <QMenu>
#include <QPointer>

class ZuTextEdit::Private
{
public:
    QAction* findAction = nullptr;
    QPointer<ZuFindReplaceDialog> dialog;
};

ZuTextEdit::ZuTextEdit(QWidget* inParent) : QTextEdit(inParent), d(new Private)
{
    connect(this, SIGNAL(customContextMenuRequested(const QPoint&)), this,
            SLOT(slotContextMenu(const QPoint&)));
    setContextMenuPolicy(Qt::CustomContextMenu);
    d->findAction = new QAction(tr("Find..."), this);
    d->findAction->setShortcut(QKeySequence::Find);
    // Scoped to this text edit: with a window-wide shortcut two text edits in one window
    // would make it ambiguous, and it would open nothing.
    d->findAction->setShortcutContext(Qt::WidgetWithChildrenShortcut);
    connect(d->findAction, SIGNAL(triggered()), this, SLOT(slotFindDialog()));
    addAction(d->findAction);
}

ZuTextEdit::~ZuTextEdit()
{
    // The dialog belongs to the window, but it has nothing left to search. Deferred, in case
    // this text edit goes away from inside one of the dialog's own slots.
    if (d->dialog) {
        d->dialog->hide();
        d->dialog->deleteLater();
    }
}

void ZuTextEdit::slotContextMenu(const QPoint&)
{
    QPointer<QMenu> menu = createStandardContextMenu();
    menu->addSeparator();
    menu->addAction(d->findAction);
    menu->exec(QCursor::pos());
    // A child of this text edit: without this every right-click would leave one behind.
    delete menu;
}

void ZuTextEdit::slotFindDialog()
{
    if (!d->dialog)
        d->dialog = new ZuFindReplaceDialog(window());
    d->dialog->setDocument(this);
    d->dialog->show();
    // A second request brings the open dialog forward again.
    d->dialog->raise();
    d->dialog->activateWindow();
}
