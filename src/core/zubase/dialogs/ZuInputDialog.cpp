#include "zubase/ZuInputDialog.h"

#include "zubase/ZuDialog.h"
#include "zubase/dialogs/ZuTopLevelWidgetWrapper_p.h"

#include <QDialogButtonBox>
#include <QLabel>
#include <QVBoxLayout>

namespace {

// Runs the dialog; true when it was accepted and is still there to be read.
template <class T> bool run(const ZuDialogHolder<T>& inDialog, bool* outOk)
{
    const bool accepted = inDialog->exec() != 0 && inDialog.alive();
    if (outOk)
        *outOk = accepted;
    return accepted;
}

} // namespace

ZuInputDialog::ZuInputDialog(QWidget* inParent) : ZuTopLevelWidgetWrapper<QInputDialog>(inParent) {}

ZuInputDialog::~ZuInputDialog() = default;

int ZuInputDialog::getInt(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                          int inValue, int inMinimum, int inMaximum, int inStep, bool* outOk,
                          Qt::WindowFlags inFlags)
{
    ZuDialogHolder<ZuInputDialog> dialog(new ZuInputDialog(inParent));
    dialog->setWindowFlags(dialog->windowFlags() | inFlags);
    dialog->setWindowTitle(inTitle);
    dialog->setLabelText(inLabel);
    dialog->setIntRange(inMinimum, inMaximum);
    dialog->setIntValue(inValue);
    dialog->setIntStep(inStep);
    return run(dialog, outOk) ? dialog->intValue() : inValue;
}

double ZuInputDialog::getDouble(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                                double inValue, double inMinimum, double inMaximum, int inDecimals,
                                bool* outOk, Qt::WindowFlags inFlags)
{
    ZuDialogHolder<ZuInputDialog> dialog(new ZuInputDialog(inParent));
    dialog->setWindowFlags(dialog->windowFlags() | inFlags);
    dialog->setWindowTitle(inTitle);
    dialog->setLabelText(inLabel);
    dialog->setDoubleDecimals(inDecimals);
    dialog->setDoubleRange(inMinimum, inMaximum);
    dialog->setDoubleValue(inValue);
    return run(dialog, outOk) ? dialog->doubleValue() : inValue;
}

QString ZuInputDialog::getItem(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                               const QStringList& inItems, int inCurrent, bool inEditable,
                               bool* outOk, Qt::WindowFlags inFlags, Qt::InputMethodHints inHints)
{
    const QString initial =
        (inCurrent >= 0 && inCurrent < inItems.size()) ? inItems.at(inCurrent) : QString();
    ZuDialogHolder<ZuInputDialog> dialog(new ZuInputDialog(inParent));
    dialog->setWindowFlags(dialog->windowFlags() | inFlags);
    dialog->setWindowTitle(inTitle);
    dialog->setLabelText(inLabel);
    dialog->setComboBoxItems(inItems);
    dialog->setTextValue(initial);
    dialog->setComboBoxEditable(inEditable);
    dialog->setInputMethodHints(inHints);
    return run(dialog, outOk) ? dialog->textValue() : initial;
}

QString ZuInputDialog::getMultiLineText(QWidget* inParent, const QString& inTitle,
                                        const QString& inLabel, const QString& inText, bool* outOk,
                                        Qt::WindowFlags inFlags, Qt::InputMethodHints inHints)
{
    ZuDialogHolder<ZuInputDialog> dialog(new ZuInputDialog(inParent));
    dialog->setWindowFlags(dialog->windowFlags() | inFlags);
    dialog->setOptions(QInputDialog::UsePlainTextEditForTextInput);
    dialog->setWindowTitle(inTitle);
    dialog->setLabelText(inLabel);
    dialog->setTextValue(inText);
    dialog->setInputMethodHints(inHints);
    return run(dialog, outOk) ? dialog->textValue() : QString();
}

QString ZuInputDialog::getText(QWidget* inParent, const QString& inTitle, const QString& inLabel,
                               QLineEdit::EchoMode inMode, const QString& inText, bool* outOk,
                               Qt::WindowFlags inFlags, Qt::InputMethodHints inHints,
                               const QValidator* inValidator)
{
    ZuDialogHolder<ZuDialog> dialog(new ZuDialog(inParent));
    dialog->setWindowFlags(dialog->windowFlags() | inFlags);
    dialog->setWindowTitle(inTitle);
    dialog->setInputMethodHints(inHints);

    auto* layout = new QVBoxLayout(dialog.get());
    layout->setSizeConstraint(QLayout::SetMinAndMaxSize);
    auto* label = new QLabel(inLabel, dialog.get());
    label->setSizePolicy(QSizePolicy::Minimum, QSizePolicy::Fixed);
    layout->addWidget(label);
    auto* edit = new QLineEdit(inText, dialog.get());
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
                                         Qt::Horizontal, dialog.get());
    QObject::connect(buttons, &QDialogButtonBox::accepted, dialog.get(), &QDialog::accept);
    QObject::connect(buttons, &QDialogButtonBox::rejected, dialog.get(), &QDialog::reject);
    layout->addWidget(buttons);

    return run(dialog, outOk) ? edit->text() : QString();
}
