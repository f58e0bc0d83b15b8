#include "DemoDialogsPage.h"

#include "zubase/ZuColorDialog.h"
#include "zubase/ZuFileDialog.h"
#include "zubase/ZuInputDialog.h"
#include "zubase/ZuMessageBox.h"

#include <QFileInfo>
#include <QIntValidator>
#include <QLabel>
#include <QPushButton>
#include <QVBoxLayout>

#include <functional>

DemoDialogsPage::DemoDialogsPage(QWidget* inParent) : QWidget(inParent)
{
    auto* layout = new QVBoxLayout(this);
    auto* result = new QLabel(tr("Dialogs open without a parent: they are parented to and "
                                 "centred over the main window."),
                              this);
    result->setWordWrap(true);
    auto add = [this, layout](const QString& inText, std::function<void()> inAction) {
        auto* button = new QPushButton(inText, this);
        connect(button, &QPushButton::clicked, this, inAction);
        layout->addWidget(button);
    };
    add(tr("Question"), [result] {
        const auto answer = ZuMessageBox::question(nullptr, tr("Question"), tr("Carry on?"));
        result->setText(answer == QMessageBox::Yes ? tr("Yes") : tr("No"));
    });
    add(tr("Number (0 to 999)"), [result] {
        QIntValidator validator(0, 999);
        bool ok = false;
        const QString text =
            ZuInputDialog::getText(nullptr, tr("Number"), tr("Number:"), QLineEdit::Normal,
                                   QStringLiteral("42"), &ok, {}, Qt::ImhDigitsOnly, &validator);
        result->setText(ok ? text : tr("Cancelled"));
    });
    add(tr("Colour"), [result] {
        const QColor color = ZuColorDialog::getColor(Qt::darkCyan, nullptr, tr("Colour"));
        result->setText(color.isValid() ? color.name() : tr("Cancelled"));
    });
    add(tr("Save as"), [result] {
        const QString file = ZuFileDialog::getSaveFileName(nullptr, tr("Save as"));
        if (file.isEmpty())
            result->setText(tr("Cancelled"));
        else if (QFileInfo::exists(file) && !ZuMessageBox::overwrite(nullptr, file))
            result->setText(tr("Not overwritten"));
        else
            result->setText(file);
    });
    layout->addWidget(result);
    layout->addStretch(1);
}
