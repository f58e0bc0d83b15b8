// Renders every page of the demo in the light and the dark scheme to PNG files, for the README:
// zudemo_schemeshots <folder> writes <page id>-light.png and <page id>-dark.png.
#include "DemoCommands.h"
#include "DemoPages.h"
#include "DemoSchemePage.h"

#include "zubase/ZuApplication.h"
#include "zubase/ZuStyleFactory.h"

#include <QDir>
#include <QWidget>

#include <cstdio>

int main(int argc, char** argv, char** envp)
{
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    ZuApplication* application = ZuApplication::createInstance(argc, argv, envp);
    if (!application || argc != 2) {
        std::fprintf(stderr, "usage: zudemo_schemeshots <folder>\n");
        return 2;
    }
    const QDir folder(QString::fromLocal8Bit(argv[1]));
    if (!folder.mkpath(QStringLiteral("."))) {
        std::fprintf(stderr, "zudemo_schemeshots: cannot create %s\n", argv[1]);
        return 1;
    }
    DemoCommands::registerAll(); // the commands page shows their texts
    DemoSchemePage::loadSchemes();
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    const struct
    {
        const char* scheme;
        const char* suffix;
    } shots[] = {{"Tessel Light", "light"}, {"Tessel Dark", "dark"}};
    int result = 0;
    for (const auto& shot : shots) {
        factory.setCurrentStyle(QString::fromLatin1(shot.scheme));
        if (factory.currentStyle() != QLatin1String(shot.scheme)) {
            std::fprintf(stderr, "zudemo_schemeshots: no scheme \"%s\" in %s\n", shot.scheme,
                         qPrintable(DemoSchemePage::schemeFolder()));
            result = 1;
            continue;
        }
        for (const DemoPage& page : demoPages()) {
            QWidget* window = page.create(nullptr);
            window->setWindowTitle(QStringLiteral("%1 (%2)").arg(QLatin1String(page.title),
                                                                 QLatin1String(shot.scheme)));
            window->resize(720, 560);
            window->ensurePolished();
            const QString path =
                folder.filePath(QStringLiteral("%1-%2.png").arg(page.id, shot.suffix));
            if (!window->grab().save(path, "PNG")) {
                std::fprintf(stderr, "zudemo_schemeshots: could not write %s\n", qPrintable(path));
                result = 1;
            } else {
                std::printf("zudemo_schemeshots: wrote %s\n", qPrintable(path));
            }
            delete window;
        }
    }
    delete application;
    return result;
}
