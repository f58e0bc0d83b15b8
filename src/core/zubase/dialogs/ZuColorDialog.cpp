#include "zubase/ZuColorDialog.h"

ZuColorDialog::ZuColorDialog(QWidget* inParent) : ZuTopLevelWidgetWrapper<QColorDialog>(inParent) {}

ZuColorDialog::~ZuColorDialog() = default;

QColor ZuColorDialog::getColor(const QColor& inInitial, QWidget* inParent, const QString& inTitle,
                               QColorDialog::ColorDialogOptions inOptions)
{
    ZuColorDialog dialog(inParent);
    // Passed on as QColorDialog::getColor() does (alpha channel, no native dialog ...).
    dialog.setOptions(inOptions);
    dialog.setCurrentColor(inInitial);
    if (!inTitle.isEmpty())
        dialog.setWindowTitle(inTitle);
    return dialog.exec() == 1 ? dialog.selectedColor() : QColor();
}
