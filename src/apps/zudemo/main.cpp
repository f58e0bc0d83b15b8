// The demo host: registers its commands, parses the command line through ZuBase::Command, applies
// a colour scheme and shows the main window. Without a display it renders the window offscreen
// to a PNG file and says where it wrote it.
#include "DemoCommands.h"
#include "DemoSchemePage.h"
#include "DemoWindow.h"

#include "zubase/ZuApplication.h"
#include "zubase/ZuStyleFactory.h"

#include <QDir>
#include <QTimer>

#include <cstdio>
#include <memory>

namespace {

bool hasDisplay()
{
    return !qEnvironmentVariableIsEmpty("DISPLAY") ||
           !qEnvironmentVariableIsEmpty("WAYLAND_DISPLAY");
}

// Platforms that show nothing to a person.
bool isHeadlessPlatform()
{
    const QString platform = QGuiApplication::platformName();
    return platform == QLatin1String("offscreen") || platform == QLatin1String("minimal");
}

template <typename T> T* findCommand(const RkDArray<RkHandle<ZuBase::Command>>& inCommands)
{
    for (const auto& command : inCommands) {
        if (auto* found = dynamic_cast<T*>(command.get()))
            return found;
    }
    return nullptr;
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
    if (!hasDisplay() && qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");

    DemoCommands::registerAll();
    // Owned here so that it outlives the window and is destroyed at the end.
    const std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, envp));
    if (!app)
        return 1;
    const bool headless = isHeadlessPlatform();

    RkDArray<RkHandle<ZuBase::Command>> commands;
    if (ZuBase::Command::parseCommands(app->arguments().mid(1), commands).isBad()) {
        ZuBase::Command::usage(QString(), true);
        return 2;
    }
    if (HelpCommand* help = findCommand<HelpCommand>(commands))
        return help->execute().isOk() ? 0 : 2;

    QString scheme = QStringLiteral("Tessel Light");
    if (const SchemeCommand* chosen = findCommand<SchemeCommand>(commands)) {
        RkResult res;
        scheme = chosen->schemeName(res);
        if (res.isBad())
            return 2;
    }
    DemoSchemePage::loadSchemes();
    ZuStyleFactory::instance().setCurrentStyle(scheme);
    if (ZuStyleFactory::instance().currentStyle() != scheme) {
        std::fprintf(stderr, "zudemo: no colour scheme \"%s\" in %s\n", qPrintable(scheme),
                     qPrintable(QDir::toNativeSeparators(DemoSchemePage::schemeFolder())));
        return 2;
    }

    DemoWindow window;
    app->setDefaultParentProvider(new MainWindowProvider(&window));

    QString screenshot;
    if (const ScreenshotCommand* shot = findCommand<ScreenshotCommand>(commands)) {
        RkResult res;
        screenshot = shot->fileName(res);
        if (res.isBad())
            return 2;
    }
    if (screenshot.isEmpty() && headless)
        screenshot = QDir::temp().filePath(QStringLiteral("zudemo.png"));

    if (!screenshot.isEmpty()) {
        if (!window.saveScreenshot(screenshot)) {
            std::fprintf(stderr, "zudemo: could not write %s\n", qPrintable(screenshot));
            return 1;
        }
        std::printf("zudemo: %swrote the main window in the scheme \"%s\" to %s\n",
                    headless ? "no display; " : "", qPrintable(scheme),
                    qPrintable(QDir::toNativeSeparators(screenshot)));
        return 0;
    }

    window.show();
    if (findCommand<QuitCommand>(commands))
        QTimer::singleShot(0, app.get(), &QApplication::quit);
    return QApplication::exec();
}
