// The demo host: registers its commands, parses the command line through ZuBase::Command and
// shows the main window. Without a display it renders the window offscreen to a PNG file.
#include "DemoCommands.h"
#include "DemoDialogsPage.h"
#include "DemoWindow.h"

#include "zubase/ZuApplication.h"

#include <QDir>
#include <QTabWidget>
#include <QTimer>

#include <cstdio>
#include <cstdlib>
#include <memory>

namespace {

bool hasDisplay()
{
    return !qEnvironmentVariableIsEmpty("DISPLAY") ||
           !qEnvironmentVariableIsEmpty("WAYLAND_DISPLAY");
}

template <typename T> bool hasCommand(const RkDArray<RkHandle<ZuBase::Command>>& inCommands)
{
    for (const auto& command : inCommands) {
        if (dynamic_cast<T*>(command.get()))
            return true;
    }
    return false;
}

// Parentless dialogs of the library go to the main window.
class MainWindowProvider : public ZuApplication::DefaultParentProvider
{
public:
    explicit MainWindowProvider(QWidget* inWindow) : mWindow(inWindow) {}
    QWidget* defaultParent() const override { return mWindow; }

private:
    QWidget* mWindow;
};

} // namespace

int main(int argc, char** argv, char** envp)
{
    const bool headless = !hasDisplay() && qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM");
    if (headless)
        qputenv("QT_QPA_PLATFORM", "offscreen");

    DemoCommands::registerAll();
    // Owned here so that it outlives the window and is destroyed at the end.
    const std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, envp));
    if (!app)
        return 1;

    RkDArray<RkHandle<ZuBase::Command>> commands;
    const RkResult parsed = ZuBase::Command::parseCommands(app->arguments().mid(1), commands);
    if (parsed.isBad()) {
        ZuBase::Command::usage(QString(), true);
        return 2;
    }
    for (const auto& command : commands) {
        if (auto* help = dynamic_cast<HelpCommand*>(command.get()))
            return help->execute().isOk() ? 0 : 2;
    }

    DemoWindow window;
    app->setDefaultParentProvider(new MainWindowProvider(&window));
    if (auto* tabs = qobject_cast<QTabWidget*>(window.centralWidget()))
        tabs->addTab(new DemoDialogsPage(tabs), QObject::tr("Dialogs"));
    QString screenshot;
    for (const auto& command : commands) {
        if (auto* shot = dynamic_cast<ScreenshotCommand*>(command.get())) {
            RkResult res;
            screenshot = shot->fileName(res);
            if (res.isBad())
                return 2;
        }
    }
    if (screenshot.isEmpty() && headless)
        screenshot = QDir::temp().filePath(QStringLiteral("zudemo.png"));

    if (!screenshot.isEmpty()) {
        if (!window.saveScreenshot(screenshot)) {
            std::fprintf(stderr, "zudemo: could not write %s\n", qPrintable(screenshot));
            return 1;
        }
        std::printf("zudemo: %swrote the main window to %s\n", headless ? "no display; " : "",
                    qPrintable(QDir::toNativeSeparators(screenshot)));
        return 0;
    }

    window.show();
    if (hasCommand<QuitCommand>(commands))
        QTimer::singleShot(0, app.get(), &QApplication::quit);
    return QApplication::exec();
}
