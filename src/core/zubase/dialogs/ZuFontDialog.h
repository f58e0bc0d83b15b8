#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

// The font dialog with the library's dialog behaviour; getFont() replaces
// QFontDialog::getFont().
class ZUBASE_EXPORT ZuFontDialog : public ZuTopLevelWidgetWrapper<QFontDialog>
{
    Q_OBJECT
public:
    explicit ZuFontDialog(QWidget* inParent = nullptr);
    ~ZuFontDialog() override;

    // The selected font when accepted (or with NoButtons), else inInitial.
    static QFont getFont(bool* outOk, const QFont& inInitial, QWidget* inParent = nullptr,
                         const QString& inTitle = QString(),
                         QFontDialog::FontDialogOptions inOptions = {});
};
