#include "zubase/ZuInputDialog.h"

#include "zubase/ZuDialog.h"

#include <QDialogButtonBox>
#include <QLabel>
#include <QVBoxLayout>

namespace {

void setOk(bool* outOk, int inResult)
{
    if (outOk)
        *outOk = inResult != 0;
}

} // namespace

ZuInputDialog::ZuInputDialog(QWidget* inParent) : ZuTopLevelWidgetWrapper<QInputDialog>(inParent) {}

ZuInputDialog::~ZuInputDialog() = default;

int ZuInputDialog::getInt(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                          int inValue, int inMinimum, int inMaximum, int inStep, bool* outOk,
                          Qt::WindowFlags inFlags)
{
    ZuInputDialog dialog(inParent);
    dialog.setWindowFlags(dialog.windowFlags() | inFlags);
    dialog.setWindowTitle(inTitle);
    dialog.setLabelText(inLabel);
    dialog.setIntRange(inMinimum, inMaximum);
    dialog.setIntValue(inValue);
    dialog.setIntStep(inStep);
    const int result = dialog.exec();
    setOk(outOk, result);
    return result ? dialog.intValue() : inValue;
}

double ZuInputDialog::getDouble(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                                double inValue, double inMinimum, double inMaximum, int inDecimals,
                                bool* outOk, Qt::WindowFlags inFlags)
{
    ZuInputDialog dialog(inParent);
    dialog.setWindowFlags(dialog.windowFlags() | inFlags);
    dialog.setWindowTitle(inTitle);
    dialog.setLabelText(inLabel);
    dialog.setDoubleDecimals(inDecimals);
    dialog.setDoubleRange(inMinimum, inMaximum);
    dialog.setDoubleValue(inValue);
    const int result = dialog.exec();
    setOk(outOk, result);
    return result ? dialog.doubleValue() : inValue;
}

QString ZuInputDialog::getItem(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                               const QStringList& inItems, int inCurrent, bool inEditable,
                               bool* outOk, Qt::WindowFlags inFlags, Qt::InputMethodHints inHints)
{
    const QString initial =
        (inCurrent >= 0 && inCurrent < inItems.size()) ? inItems.at(inCurrent) : QString();
    ZuInputDialog dialog(inParent);
    dialog.setWindowFlags(dialog.windowFlags() | inFlags);
    dialog.setWindowTitle(inTitle);
    dialog.setLabelText(inLabel);
    dialog.setComboBoxItems(inItems);
    dialog.setTextValue(initial);
    dialog.setComboBoxEditable(inEditable);
    dialog.setInputMethodHints(inHints);
    const int result = dialog.exec();
    setOk(outOk, result);
    return result ? dialog.textValue() : initial;
}

QString ZuInputDialog::getMultiLineText(QWidget* inParent, const QString& inTitle,
                                        const QString& inLabel, const QString& inText, bool* outOk,
                                        Qt::WindowFlags inFlags, Qt::InputMethodHints inHints)
{
    ZuInputDialog dialog(inParent);
    dialog.setWindowFlags(dialog.windowFlags() | inFlags);
    dialog.setOptions(QInputDialog::UsePlainTextEditForTextInput);
    dialog.setWindowTitle(inTitle);
    dialog.setLabelText(inLabel);
    dialog.setTextValue(inText);
    dialog.setInputMethodHints(inHints);
    const int result = dialog.exec();
    setOk(outOk, result);
    return result ? dialog.textValue() : QString();
}

QString ZuInputDialog::getText(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                               QLineEdit::EchoMode inMode, const QString& inText, bool* outOk,
                               Qt::WindowFlags inFlags, Qt::InputMethodHints inHints,
                               const QValidator* inValidator)
{
    ZuDialog dialog(inParent);
    dialog.setWindowFlags(dialog.windowFlags() | inFlags);
    dialog.setWindowTitle(inTitle);
    dialog.setInputMethodHints(inHints);

    auto* layout = new QVBoxLayout(&dialog);
    layout->setSizeConstraint(QLayout::SetMinAndMaxSize);
    auto* label = new QLabel(inLabel, &dialog);
    label->setSizePolicy(QSizePolicy::Minimum, QSizePolicy::Fixed);
    layout->addWidget(label);
    auto* edit = new QLineEdit(inText, &dialog);
    edit->setEchoMode(inMode);
    // The hints matter where the text is typed.
    edit->setInputMethodHints(inHints);
    if (inValidator)
        edit->setValidator(inValidator);
    edit->setFocus(Qt::OtherFocusReason);
    edit->selectAll();
    label->setBuddy(edit);
    layout->addWidget(edit);
    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel,
                                         Qt::Horizontal, &dialog);
    QObject::connect(buttons, &QDialogButtonBox::accepted, &dialog, &QDialog::accept);
    QObject::connect(buttons, &QDialogButtonBox::rejected, &dialog, &QDialog::reject);
    layout->addWidget(buttons);

    const int result = dialog.exec();
    setOk(outOk, result);
    return result ? edit->text() : QString();
}
