#include "DemoPages.h"

#include "DemoCommands.h"
#include "DemoDialogsPage.h"
#include "DemoSchemePage.h"
// Widgets I
#include "DemoWidgetsPanelsPage.h"

// Widgets II
#include "DemoWidgetsFieldsPage.h"

// Widgets III
#include "DemoWidgetsViewsPage.h"

// Widgets IV
#include "DemoWidgetsTextPage.h"

#include <QLabel>
#include <QPlainTextEdit>
#include <QVBoxLayout>

namespace {

template <typename T> QWidget* make(QWidget* inParent)
{
    return new T(inParent);
}

// The host's own command line, built from the texts of its commands. The general usage text
// would also log the library's record for the empty command name, which a user would take for
// an error at every start.
QWidget* createCommandsPage(QWidget* inParent)
{
    auto* page = new QWidget(inParent);
    auto* layout = new QVBoxLayout(page);
    layout->addWidget(new QLabel(QObject::tr("Command line of this host:"), page));
    auto* usage = new QPlainTextEdit(page);
    usage->setReadOnly(true);
    QString text;
    for (const QString& name : DemoCommands::names())
        text += ZuBase::Command::usage(name, false);
    usage->setPlainText(text);
    layout->addWidget(usage);
    return page;
}

} // namespace

const std::vector<DemoPage>& demoPages()
{
    static const std::vector<DemoPage> pages = {
        {"scheme", "Colour schemes", &make<DemoSchemePage>},
        {"dialogs", "Dialogs", &make<DemoDialogsPage>},
        {"commands", "Commands", &createCommandsPage},
        // Widgets I
        {"widgets-panels", "Panels", &make<DemoWidgetsPanelsPage>},

        // Widgets II
        {"widgets-fields", "Fields and buttons", &make<DemoWidgetsFieldsPage>},

        // Widgets III
        {"widgets-views", "Tabs, views, dates", &make<DemoWidgetsViewsPage>},

        // Widgets IV
        {"widgets-text", "Text and input", &make<DemoWidgetsTextPage>},

    };
    return pages;
}
