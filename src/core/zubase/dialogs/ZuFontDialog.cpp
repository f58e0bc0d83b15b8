#include "zubase/ZuFontDialog.h"

#include "zubase/dialogs/ZuTopLevelWidgetWrapper_p.h"

ZuFontDialog::ZuFontDialog(QWidget* inParent) : ZuTopLevelWidgetWrapper<QFontDialog>(inParent) {}

ZuFontDialog::~ZuFontDialog() = default;

QFont ZuFontDialog::getFont(bool* outOk, const QFont& inInitial, QWidget* inParent,
                            const QString& inTitle, QFontDialog::FontDialogOptions inOptions)
{
    ZuDialogHolder<ZuFontDialog> dialog(new ZuFontDialog(inParent));
    dialog->setOptions(inOptions);
    dialog->setCurrentFont(inInitial);
    if (!inTitle.isEmpty())
        dialog->setWindowTitle(inTitle);
    const int result = dialog->exec();
    const bool ok = dialog.alive() && (result != 0 || (inOptions & QFontDialog::NoButtons));
    if (outOk)
        *outOk = ok;
    if (!ok)
        return inInitial;
    // Without buttons the dialog can only be closed, which leaves no selected font: the font
    // shown last is the choice.
    return result != 0 ? dialog->selectedFont() : dialog->currentFont();
}
