#include "DemoWindow.h"

#include "DemoDialogsPage.h"
#include "DemoSchemePage.h"

#include "zubase/Command.h"

#include <QLabel>
#include <QPixmap>
#include <QPlainTextEdit>
#include <QTabWidget>
#include <QVBoxLayout>

DemoWindow::DemoWindow(QWidget* inParent) : QMainWindow(inParent)
{
    setWindowTitle(tr("zubase demo"));
    auto* tabs = new QTabWidget(this);

    tabs->addTab(new DemoSchemePage(tabs), tr("Colour schemes"));
    tabs->addTab(new DemoDialogsPage(tabs), tr("Dialogs"));

    auto* usagePage = new QWidget(tabs);
    auto* usageLayout = new QVBoxLayout(usagePage);
    usageLayout->addWidget(new QLabel(tr("Command line of this host:"), usagePage));
    auto* usage = new QPlainTextEdit(usagePage);
    usage->setReadOnly(true);
    usage->setPlainText(ZuBase::Command::usage(QString(), false));
    usageLayout->addWidget(usage);
    tabs->addTab(usagePage, tr("Commands"));

    setCentralWidget(tabs);
    resize(960, 640);
}

bool DemoWindow::saveScreenshot(const QString& inPath)
{
    ensurePolished();
    return grab().save(inPath, "PNG");
}
