#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

// The colour dialog with the library's dialog behaviour; getColor() replaces
// QColorDialog::getColor().
class ZUBASE_EXPORT ZuColorDialog : public ZuTopLevelWidgetWrapper<QColorDialog>
{
    Q_OBJECT
public:
    explicit ZuColorDialog(QWidget* inParent = nullptr);
    ~ZuColorDialog() override;

    // The chosen colour, or an invalid one when the dialog was cancelled. An empty title keeps
    // the dialog's own.
    static QColor getColor(const QColor& inInitial = Qt::white, QWidget* inParent = nullptr,
                           const QString& inTitle = QString(),
                           QColorDialog::ColorDialogOptions inOptions = {});
};
