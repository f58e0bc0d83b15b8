#include "zubase/ZuProgressDialog.h"

ZuProgressDialog::ZuProgressDialog(QWidget* inParent)
    : ZuTopLevelWidgetWrapper<QProgressDialog>(inParent)
{}

ZuProgressDialog::ZuProgressDialog(const QString& inLabelText, const QString& inCancelButtonText,
                                   int inMinimum, int inMaximum, QWidget* inParent)
    : ZuTopLevelWidgetWrapper<QProgressDialog>(inParent)
{
    setLabelText(inLabelText);
    setCancelButtonText(inCancelButtonText);
    setMinimum(inMinimum);
    setMaximum(inMaximum);
}

ZuProgressDialog::~ZuProgressDialog() = default;
