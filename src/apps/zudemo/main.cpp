// The demo host: registers its commands, parses the command line through ZuBase::Command and
// shows the main window. Without a display it renders the window offscreen to a PNG file.
#include "DemoCommands.h"
#include "DemoWindow.h"

#include <QApplication>
#include <QDir>
#include <QTimer>

#include <cstdio>
#include <cstdlib>

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

} // namespace

int main(int argc, char** argv)
{
    const bool headless = !hasDisplay() && qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM");
    if (headless)
        qputenv("QT_QPA_PLATFORM", "offscreen");

    DemoCommands::registerAll();
    QApplication app(argc, argv);

    RkDArray<RkHandle<ZuBase::Command>> commands;
    const RkResult parsed = ZuBase::Command::parseCommands(app.arguments().mid(1), commands);
    if (parsed.isBad()) {
        ZuBase::Command::usage(QString(), true);
        return 2;
    }
    for (const auto& command : commands) {
        if (auto* help = dynamic_cast<HelpCommand*>(command.get()))
            return help->execute().isOk() ? 0 : 2;
    }

    DemoWindow window;
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
        QTimer::singleShot(0, &app, &QApplication::quit);
    return app.exec();
}
