#include "zubase/ZuFileDialog.h"

#include "rklib/RkDbC.h"

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

QString ZuFileDialog::getOpenFileName(QWidget* inParent, const QString& inCaption,
                                      const QString& inDirectory, const QString& inFilter,
                                      QString* outSelectedFilter, QFileDialog::Options inOptions)
{
    ProbeScope probe;
    return QFileDialog::getOpenFileName(ZuTopLevelWidgetWrapperHelper::parentOrDefault(inParent),
                                        inCaption, inDirectory, inFilter, outSelectedFilter,
                                        inOptions);
}

QStringList ZuFileDialog::getOpenFileNames(QWidget* inParent, const QString& inCaption,
                                           const QString& inDirectory, const QString& inFilter,
                                           QString* outSelectedFilter,
                                           QFileDialog::Options inOptions)
{
    ProbeScope probe;
    return QFileDialog::getOpenFileNames(ZuTopLevelWidgetWrapperHelper::parentOrDefault(inParent),
                                         inCaption, inDirectory, inFilter, outSelectedFilter,
                                         inOptions);
}

QString ZuFileDialog::getSaveFileName(QWidget* inParent, const QString& inCaption,
                                      const QString& inDirectory, const QString& inFilter,
                                      QString* outSelectedFilter, QFileDialog::Options inOptions)
{
    ProbeScope probe;
    return QFileDialog::getSaveFileName(ZuTopLevelWidgetWrapperHelper::parentOrDefault(inParent),
                                        inCaption, inDirectory, inFilter, outSelectedFilter,
                                        inOptions);
}

QString ZuFileDialog::getExistingDirectory(QWidget* inParent, const QString& inCaption,
                                           const QString& inDirectory,
                                           QFileDialog::Options inOptions)
{
    ProbeScope probe;
    return QFileDialog::getExistingDirectory(
        ZuTopLevelWidgetWrapperHelper::parentOrDefault(inParent), inCaption, inDirectory,
        inOptions);
}
