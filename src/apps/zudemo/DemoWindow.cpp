#include "DemoWindow.h"

#include "DemoPages.h"

#include <QTabWidget>

DemoWindow::DemoWindow(QWidget* inParent) : QMainWindow(inParent)
{
    setWindowTitle(tr("zubase demo"));
    auto* tabs = new QTabWidget(this);
    for (const DemoPage& page : demoPages())
        tabs->addTab(page.create(tabs), tr(page.title));
    setCentralWidget(tabs);
    resize(960, 640);
}

bool DemoWindow::saveScreenshot(const QString& inPath)
{
    ensurePolished();
    return grab().save(inPath, "PNG");
}
