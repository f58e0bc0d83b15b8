#pragma once

#include "zubase/ZuTopLevelWidgetWrapper.h"

// The file dialogs of the product: only the static functions are public. Each switches on the
// core library's probe for a crashing shell extension while the dialog runs, uses the
// application's default parent when given none and resets the C runtime locale afterwards
// (native dialogs may change it). They answer as QFileDialog's static functions do, and as
// cancelled when the parent window is deleted while the dialog runs.
class ZUBASE_EXPORT ZuFileDialog : private ZuTopLevelWidgetWrapper<QFileDialog>
{
public:
    ~ZuFileDialog() override;

    static QString
    getOpenFileName(QWidget* inParent = nullptr, const QString& inCaption = QString(),
                    const QString& inDirectory = QString(), const QString& inFilter = QString(),
                    QString* outSelectedFilter = nullptr, QFileDialog::Options inOptions = {});
    static QStringList
    getOpenFileNames(QWidget* inParent = nullptr, const QString& inCaption = QString(),
                     const QString& inDirectory = QString(), const QString& inFilter = QString(),
                     QString* outSelectedFilter = nullptr, QFileDialog::Options inOptions = {});
    static QString
    getSaveFileName(QWidget* inParent = nullptr, const QString& inCaption = QString(),
                    const QString& inDirectory = QString(), const QString& inFilter = QString(),
                    QString* outSelectedFilter = nullptr, QFileDialog::Options inOptions = {});
    static QString getExistingDirectory(QWidget* inParent = nullptr,
                                        const QString& inCaption = QString(),
                                        const QString& inDirectory = QString(),
                                        QFileDialog::Options inOptions = QFileDialog::ShowDirsOnly);

private:
    ZuFileDialog(QWidget* inParent, const QString& inCaption, const QString& inDirectory,
                 const QString& inFilter);
    int exec() override;
    // One run of a dialog in inMode; the selected files, or none when cancelled.
    static QStringList run(QWidget* inParent, const QString& inCaption, const QString& inDirectory,
                           const QString& inFilter, QString* ioSelectedFilter,
                           QFileDialog::Options inOptions, QFileDialog::FileMode inMode,
                           QFileDialog::AcceptMode inAcceptMode);
    using ZuTopLevelWidgetWrapper<QFileDialog>::selectedFiles;
    using ZuTopLevelWidgetWrapper<QFileDialog>::setDirectory;
    using ZuTopLevelWidgetWrapper<QFileDialog>::setFileMode;
    using ZuTopLevelWidgetWrapper<QFileDialog>::setModal;
    using ZuTopLevelWidgetWrapper<QFileDialog>::setWindowTitle;
};
