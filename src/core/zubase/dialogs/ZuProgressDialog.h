#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

// A progress dialog with the library's dialog behaviour.
class ZUBASE_EXPORT ZuProgressDialog : public ZuTopLevelWidgetWrapper<QProgressDialog>
{
    Q_OBJECT
public:
    explicit ZuProgressDialog(QWidget* inParent = nullptr);
    ZuProgressDialog(const QString& inLabelText, const QString& inCancelButtonText, int inMinimum,
                     int inMaximum, QWidget* inParent = nullptr);
    ~ZuProgressDialog() override;
};
