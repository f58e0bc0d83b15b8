#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

#include <QLineEdit>

class QValidator;

// The input dialog with the library's dialog behaviour; its static functions replace those of
// QInputDialog. getText() builds its own dialog so that a validator can be attached.
class ZUBASE_EXPORT ZuInputDialog : public ZuTopLevelWidgetWrapper<QInputDialog>
{
    Q_OBJECT
public:
    explicit ZuInputDialog(QWidget* inParent = nullptr);
    ~ZuInputDialog() override;

    // The dialog's value when accepted, else inValue.
    static int getInt(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                      int inValue = 0, int inMinimum = -2147483647, int inMaximum = 2147483647,
                      int inStep = 1, bool* outOk = nullptr, Qt::WindowFlags inFlags = {});
    static double getDouble(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                            double inValue = 0, double inMinimum = -2147483647,
                            double inMaximum = 2147483647, int inDecimals = 1,
                            bool* outOk = nullptr, Qt::WindowFlags inFlags = {});
    // The text when accepted, else the initial text: inItems[inCurrent], empty when inCurrent
    // is out of range.
    static QString getItem(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                           const QStringList& inItems, int inCurrent = 0, bool inEditable = true,
                           bool* outOk = nullptr, Qt::WindowFlags inFlags = {},
                           Qt::InputMethodHints inHints = Qt::ImhNone);
    // The text when accepted, else a null string.
    static QString getMultiLineText(QWidget* inParent, const QString& inTitle,
                                    const QString& inLabel, const QString& inText = QString(),
                                    bool* outOk = nullptr, Qt::WindowFlags inFlags = {},
                                    Qt::InputMethodHints inHints = Qt::ImhNone);
    // A label, a line edit (with inValidator when not null) and Ok/Cancel. The line edit's text
    // when accepted, else a null string.
    static QString getText(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                           QLineEdit::EchoMode inMode = QLineEdit::Normal,
                           const QString& inText = QString(), bool* outOk = nullptr,
                           Qt::WindowFlags inFlags = {}, Qt::InputMethodHints inHints = Qt::ImhNone,
                           const QValidator* inValidator = nullptr);
};
