#include "zubase/ZuDialog.h"

ZuDialog::ZuDialog(QWidget* inParent) : ZuTopLevelWidgetWrapper<QDialog>(inParent) {}

ZuDialog::~ZuDialog() = default;
