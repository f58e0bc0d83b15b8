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

namespace {

// Runs one of QFileDialog's static functions with the probe on and the default parent.
template <typename Function, typename... Args>
auto runWithProbe(Function inFunction, QWidget* inParent, const Args&... inArgs)
{
    ProbeScope probe;
    return inFunction(ZuTopLevelWidgetWrapperHelper::parentOrDefault(inParent), inArgs...);
}

} // namespace

QString ZuFileDialog::getOpenFileName(QWidget* inParent, const QString& inCaption,
                                      const QString& inDirectory, const QString& inFilter,
                                      QString* outSelectedFilter, QFileDialog::Options inOptions)
{
    return runWithProbe(&QFileDialog::getOpenFileName, inParent, inCaption, inDirectory, inFilter,
                        outSelectedFilter, inOptions);
}

QStringList ZuFileDialog::getOpenFileNames(QWidget* inParent, const QString& inCaption,
                                           const QString& inDirectory, const QString& inFilter,
                                           QString* outSelectedFilter,
                                           QFileDialog::Options inOptions)
{
    return runWithProbe(&QFileDialog::getOpenFileNames, inParent, inCaption, inDirectory, inFilter,
                        outSelectedFilter, inOptions);
}

QString ZuFileDialog::getSaveFileName(QWidget* inParent, const QString& inCaption,
                                      const QString& inDirectory, const QString& inFilter,
                                      QString* outSelectedFilter, QFileDialog::Options inOptions)
{
    return runWithProbe(&QFileDialog::getSaveFileName, inParent, inCaption, inDirectory, inFilter,
                        outSelectedFilter, inOptions);
}

QString ZuFileDialog::getExistingDirectory(QWidget* inParent, const QString& inCaption,
                                           const QString& inDirectory,
                                           QFileDialog::Options inOptions)
{
    return runWithProbe(&QFileDialog::getExistingDirectory, inParent, inCaption, inDirectory,
                        inOptions);
}
