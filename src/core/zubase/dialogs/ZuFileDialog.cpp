#include "zubase/ZuFileDialog.h"

#include "zubase/dialogs/ZuTopLevelWidgetWrapper_p.h"

#include "rklib/RkDbC.h"

#include <QFileInfo>

#include <clocale>

namespace {

// Switches the crash probe on for one dialog and puts it back, with the locale reset between.
class ProbeScope
{
public:
    ProbeScope() : mPrevious(rkEnableProbeDellBackupAndRecoveryCrash(true)) {}
    ~ProbeScope()
    {
        std::setlocale(LC_ALL, "C");
        rkEnableProbeDellBackupAndRecoveryCrash(mPrevious);
    }
    ProbeScope(const ProbeScope&) = delete;
    ProbeScope& operator=(const ProbeScope&) = delete;

private:
    bool mPrevious;
};

} // namespace

ZuFileDialog::ZuFileDialog(QWidget* inParent, const QString& inCaption, const QString& inDirectory,
                           const QString& inFilter)
    : ZuTopLevelWidgetWrapper<QFileDialog>(inParent)
{
    setWindowTitle(inCaption);
    std::setlocale(LC_ALL, "C");
    setDirectory(inDirectory);
    std::setlocale(LC_ALL, "C");
    setNameFilter(inFilter);
    std::setlocale(LC_ALL, "C");
}

ZuFileDialog::~ZuFileDialog() = default;

int ZuFileDialog::exec()
{
    const int result = ZuTopLevelWidgetWrapper<QFileDialog>::exec();
    std::setlocale(LC_ALL, "C");
    return result;
}

QStringList ZuFileDialog::run(QWidget* inParent, const QString& inCaption,
                              const QString& inDirectory, const QString& inFilter,
                              QString* ioSelectedFilter, QFileDialog::Options inOptions,
                              QFileDialog::FileMode inMode, QFileDialog::AcceptMode inAcceptMode)
{
    ProbeScope probe;
    // The start may name a file, existing or to be made, in an existing folder: the folder is
    // shown and the file preselected, as QFileDialog's static functions do.
    QString folder = inDirectory;
    QString file;
    const QFileInfo start(inDirectory);
    if (!inDirectory.isEmpty() && !start.isDir() && start.absoluteDir().exists()) {
        folder = start.absolutePath();
        file = start.fileName();
    }
    // Held through its QFileDialog base: the base class is private to everyone else.
    ZuDialogHolder<QFileDialog> dialog(
        static_cast<QFileDialog*>(new ZuFileDialog(inParent, inCaption, folder, inFilter)));
    dialog->setOptions(inOptions);
    dialog->setFileMode(inMode);
    dialog->setAcceptMode(inAcceptMode);
    if (!file.isEmpty())
        dialog->selectFile(file);
    if (ioSelectedFilter && !ioSelectedFilter->isEmpty())
        dialog->selectNameFilter(*ioSelectedFilter);
    if (dialog->exec() != QDialog::Accepted || !dialog.alive())
        return QStringList();
    if (ioSelectedFilter)
        *ioSelectedFilter = dialog->selectedNameFilter();
    return dialog->selectedFiles();
}

QString ZuFileDialog::getOpenFileName(QWidget* inParent, const QString& inCaption,
                                      const QString& inDirectory, const QString& inFilter,
                                      QString* outSelectedFilter, QFileDialog::Options inOptions)
{
    return run(inParent, inCaption, inDirectory, inFilter, outSelectedFilter, inOptions,
               QFileDialog::ExistingFile, QFileDialog::AcceptOpen)
        .value(0);
}

QStringList ZuFileDialog::getOpenFileNames(QWidget* inParent, const QString& inCaption,
                                           const QString& inDirectory, const QString& inFilter,
                                           QString* outSelectedFilter,
                                           QFileDialog::Options inOptions)
{
    return run(inParent, inCaption, inDirectory, inFilter, outSelectedFilter, inOptions,
               QFileDialog::ExistingFiles, QFileDialog::AcceptOpen);
}

QString ZuFileDialog::getSaveFileName(QWidget* inParent, const QString& inCaption,
                                      const QString& inDirectory, const QString& inFilter,
                                      QString* outSelectedFilter, QFileDialog::Options inOptions)
{
    return run(inParent, inCaption, inDirectory, inFilter, outSelectedFilter, inOptions,
               QFileDialog::AnyFile, QFileDialog::AcceptSave)
        .value(0);
}

QString ZuFileDialog::getExistingDirectory(QWidget* inParent, const QString& inCaption,
                                           const QString& inDirectory,
                                           QFileDialog::Options inOptions)
{
    return run(inParent, inCaption, inDirectory, QString(), nullptr, inOptions,
               QFileDialog::Directory, QFileDialog::AcceptOpen)
        .value(0);
}
