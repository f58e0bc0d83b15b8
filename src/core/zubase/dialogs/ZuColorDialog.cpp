#include "zubase/ZuColorDialog.h"

#include "zubase/dialogs/ZuTopLevelWidgetWrapper_p.h"

ZuColorDialog::ZuColorDialog(QWidget* inParent) : ZuTopLevelWidgetWrapper<QColorDialog>(inParent) {}

ZuColorDialog::~ZuColorDialog() = default;

QColor ZuColorDialog::getColor(const QColor& inInitial, QWidget* inParent, const QString& inTitle,
                               QColorDialog::ColorDialogOptions inOptions)
{
    ZuDialogHolder<ZuColorDialog> dialog(new ZuColorDialog(inParent));
    // Passed on as QColorDialog::getColor() does (alpha channel, no native dialog ...).
    dialog->setOptions(inOptions);
    dialog->setCurrentColor(inInitial);
    if (!inTitle.isEmpty())
        dialog->setWindowTitle(inTitle);
    const int result = dialog->exec();
    return (result == 1 && dialog.alive()) ? dialog->selectedColor() : QColor();
}
