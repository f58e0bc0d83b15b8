#pragma once

#include <QMainWindow>

// The demo host's main window: a small gallery of what the library offers.
class DemoWindow : public QMainWindow
{
    Q_OBJECT
public:
    explicit DemoWindow(QWidget* inParent = nullptr);

    // Renders the window (also when it is not on a screen) and saves it as PNG.
    bool saveScreenshot(const QString& inPath);
};
