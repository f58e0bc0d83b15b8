#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

// A plain dialog with the library's dialog behaviour (default parent, centring, trace,
// guarded exec()).
class ZUBASE_EXPORT ZuDialog : public ZuTopLevelWidgetWrapper<QDialog>
{
    Q_OBJECT
public:
    explicit ZuDialog(QWidget* inParent = nullptr);
    ~ZuDialog() override;
};
