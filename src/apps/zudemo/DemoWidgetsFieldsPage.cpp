#include "DemoWidgetsFieldsPage.h"

#include "zubase/ZuActionWithContextMenu.h"
#include "zubase/ZuOptionsButton.h"
#include "zubase/ZuPopupMenuComboBox.h"
#include "zubase/ZuPushButton.h"
#include "zubase/ZuQuickSearchWidget.h"
#include "zubase/ZuToolBarDnD.h"

#include <QFormLayout>
#include <QGroupBox>
#include <QLabel>
#include <QListWidget>
#include <QMenu>
#include <QStyle>
#include <QVBoxLayout>

namespace {

QMenu* menuOf(const QStringList& inItems, QWidget* inParent)
{
    auto* menu = new QMenu(inParent);
    for (const QString& item : inItems)
        menu->addAction(item);
    return menu;
}

} // namespace

DemoWidgetsFieldsPage::DemoWidgetsFieldsPage(QWidget* inParent) : QWidget(inParent)
{
    auto* layout = new QVBoxLayout(this);

    // Fields: accepted on Return, Tab or leaving; the combo boxes drop their menu below.
    auto* fields = new QGroupBox(tr("Popup-menu fields"), this);
    auto* form = new QFormLayout(fields);
    auto* patient = new ZuPopupMenuLineEdit(fields);
    patient->setText(tr("Doe^Jane"));
    connect(patient, &ZuPopupMenuLineEdit::textAccepted, this,
            [this](const QString& inText) { report(tr("Name accepted: %1").arg(inText)); });
    form->addRow(tr("Patient name:"), patient);
    auto* layoutChoice = new ZuPopupMenuComboBox(fields);
    layoutChoice->setReadOnly(true);
    layoutChoice->setText(tr("2 x 2"));
    layoutChoice->setPopupMenu(menuOf({tr("1 x 1"), tr("1 x 2"), tr("2 x 2"), tr("3 x 3")}, this));
    connect(layoutChoice, &ZuPopupMenuComboBox::popupActivated, this,
            [layoutChoice](QAction* inAction) { layoutChoice->setText(inAction->text()); });
    form->addRow(tr("Layout (Alt+Down, F4):"), layoutChoice);
    auto* window = new ZuPopupMenuComboBox(fields);
    window->setText(tr("400 / 40"));
    // The menu is made when first asked for.
    connect(window, &ZuPopupMenuComboBox::popupAboutToShow, this, [this, window] {
        if (!window->popupMenu())
            window->setPopupMenu(
                menuOf({tr("Bone 2000 / 500"), tr("Lung 1500 / -600"), tr("Brain 80 / 40")}, this));
    });
    connect(window, &ZuPopupMenuComboBox::popupActivated, this, [window](QAction* inAction) {
        window->setText(inAction->text().section(QLatin1Char(' '), 1));
    });
    form->addRow(tr("Window / level:"), window);
    layout->addWidget(fields);

    // Buttons: hold for a menu instead of a click, or ask with the menu key.
    auto* buttons = new QGroupBox(tr("Buttons"), this);
    auto* row = new QHBoxLayout(buttons);
    auto* print = new ZuPushButton(buttons);
    print->setText(tr("Print (hold for options)"));
    QMenu* printMenu = menuOf({tr("Print all series"), tr("Print selection")}, this);
    connect(print, &QPushButton::clicked, this, [this] { report(tr("Printed")); });
    connect(print, &ZuPushButton::delayedPopupMenuRequested, printMenu,
            [printMenu](const QPoint& inAt) { printMenu->popup(inAt); });
    row->addWidget(print);
    auto* options = new ZuOptionsButton(buttons);
    options->setConstraintWidget(print);
    options->setMenu(menuOf({tr("Landscape"), tr("Portrait")}, this));
    options->setPopupMode(QToolButton::InstantPopup);
    row->addWidget(options);
    row->addStretch(1);
    layout->addWidget(buttons);

    // Tool bar: drag its buttons to reorder them; right-click "Layout" for its own menu.
    auto* tools = new QGroupBox(tr("Tool bar (drag the buttons)"), this);
    auto* toolsLayout = new QVBoxLayout(tools);
    auto* bar = new ZuToolBarDnD(tools);
    const QStyle::StandardPixmap icons[] = {
        QStyle::SP_DialogOpenButton, QStyle::SP_DialogSaveButton, QStyle::SP_FileDialogDetailedView,
        QStyle::SP_TrashIcon};
    const QStringList names = {tr("Open"), tr("Save"), tr("Layout"), tr("Delete")};
    for (int i = 0; i < names.size(); ++i) {
        auto* action = new ZuActionWithContextMenu(names.at(i), bar);
        action->setIcon(style()->standardIcon(icons[i]));
        bar->addAction(action);
    }
    auto* layoutAction = static_cast<ZuActionWithContextMenu*>(bar->actions().at(2));
    QMenu* layoutMenu = menuOf({tr("Reset layout"), tr("Save layout")}, this);
    connect(layoutAction, &ZuActionWithContextMenu::customContextMenuRequested, layoutMenu,
            [layoutMenu](const QPoint& inAt) { layoutMenu->popup(inAt); });
    // Asked through the tool bar, whose buttons a reorder replaces.
    bar->setContextMenuPolicy(Qt::CustomContextMenu);
    connect(bar, &QWidget::customContextMenuRequested, this, [bar](const QPoint& inAt) {
        if (auto* action = qobject_cast<ZuActionWithContextMenu*>(bar->actionAt(inAt)))
            action->showToolsContextMenu(bar->mapToGlobal(inAt));
    });
    bar->setDragAndDropEnabled(true);
    connect(bar, &ZuToolBarDnD::toolButtonOrderChanged, this, [this, bar] {
        QStringList order;
        for (const QAction* action : bar->actions())
            order << action->text();
        report(tr("Tool order: %1").arg(order.join(QStringLiteral(", "))));
    });
    toolsLayout->addWidget(bar);
    layout->addWidget(tools);

    // Quick search filtering a list.
    auto* search = new QGroupBox(tr("Quick search"), this);
    auto* searchLayout = new QVBoxLayout(search);
    auto* filter = new ZuQuickSearchWidget(search);
    auto* series = new QListWidget(search);
    series->addItems({tr("CT Thorax 1.0 mm"), tr("CT Thorax 5.0 mm"), tr("MR Head T1"),
                      tr("MR Head T2 FLAIR"), tr("US Abdomen")});
    connect(filter, &ZuQuickSearchWidget::searchStringChanged, series,
            [series](const QString& inText) {
                for (int i = 0; i < series->count(); ++i)
                    series->item(i)->setHidden(
                        !series->item(i)->text().contains(inText, Qt::CaseInsensitive));
            });
    searchLayout->addWidget(filter);
    searchLayout->addWidget(series);
    layout->addWidget(search, 1);

    mReport = new QLabel(tr("Hold \"Print\" for a second, drag a tool, type a filter."), this);
    layout->addWidget(mReport);
}

void DemoWidgetsFieldsPage::report(const QString& inText)
{
    mReport->setText(inText);
}
