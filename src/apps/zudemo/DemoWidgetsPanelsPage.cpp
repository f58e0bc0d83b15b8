#include "DemoWidgetsPanelsPage.h"

#include "zubase/ZuCheckBox.h"
#include "zubase/ZuCheckBoxGroup.h"
#include "zubase/ZuCollapsibleWidget.h"
#include "zubase/ZuFlowLayout.h"
#include "zubase/ZuNewLayoutAction.h"

#include <QCheckBox>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QMenu>
#include <QPushButton>
#include <QVBoxLayout>

namespace {

// Series to show, tied to one "All series" box.
QWidget* seriesPanel(QWidget* inParent)
{
    auto* panel = new ZuCollapsibleWidget(QObject::tr("Series"), inParent);
    auto* content = new QWidget;
    auto* layout = new QVBoxLayout(content);
    layout->setContentsMargins(panel->expanderButtonIndent(), 0, 0, 6);
    auto* group = new ZuCheckBoxGroup(panel);
    auto* all = new ZuCheckBox(QObject::tr("<b>All series</b>"), content);
    layout->addWidget(all);
    const QString series[] = {QObject::tr("Axial T1, 3 mm"),
                              QObject::tr("Sagittal T2 with fat suppression, a description long "
                                          "enough to wrap onto a second line"),
                              QObject::tr("Coronal STIR")};
    QList<ZuCheckBox*> boxes;
    for (const QString& text : series) {
        auto* box = new ZuCheckBox(text, content);
        boxes << box;
        box->label()->setWordWrap(true);
        box->layout()->setContentsMargins(20, 0, 0, 0);
        layout->addWidget(box);
        group->addCheckBox(box->checkBox());
    }
    group->setParentCheckBox(all->checkBox());
    boxes.at(1)->checkBox()->setChecked(true); // a mix: the parent shows it partially checked
    auto* count = new QLabel(QObject::tr("  (3 series)"));
    count->setEnabled(false);
    panel->setHeaderWidget(count);
    panel->setContentWidget(content);
    panel->setResizeContentDynamically(true); // the long text wraps after the width
    panel->setExpanded(true);
    return panel;
}

// Tags in a flow: the panel measures them again whenever its width changes.
QWidget* tagsPanel(QWidget* inParent)
{
    auto* panel = new ZuCollapsibleWidget(QObject::tr("Tags"), inParent);
    auto* content = new QWidget;
    auto* flow = new ZuFlowLayout(content, -1, 4, 4);
    flow->setContentsMargins(panel->expanderButtonIndent(), 0, 0, 6);
    const char* tags[] = {"CT",       "MR",      "Contrast", "Follow-up",      "Head",
                          "Thorax",   "Abdomen", "Priority", "Second opinion", "Teaching file",
                          "Research", "Archived"};
    for (const char* tag : tags) {
        auto* button = new QPushButton(QString::fromLatin1(tag), content);
        button->setCheckable(true);
        flow->addWidget(button);
    }
    panel->setContentWidget(content);
    panel->setResizeContentDynamically(true);
    panel->setExpanded(true);
    return panel;
}

QWidget* notesPanel(QWidget* inParent)
{
    auto* panel = new ZuCollapsibleWidget(QObject::tr("Notes (collapsed)"), inParent);
    auto* notes = new QLabel(QObject::tr("No notes for this study."));
    panel->setContentWidget(notes);
    panel->setExpanded(false);
    return panel;
}

QWidget* layoutBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("New layout"), inParent);
    auto* layout = new QVBoxLayout(box);
    auto* chosen = new QLabel(QObject::tr("Point into the grid and click."), box);
    // The grid in place, and a menu whose column counts go in steps of two.
    auto* inPlace = new ZuNewLayoutAction(box, 1);
    QWidget* grid = inPlace->requestWidget(box);
    grid->show(); // an action's widget starts hidden
    layout->addWidget(grid);
    auto* menuButton = new QPushButton(QObject::tr("New layout, even columns"), box);
    auto* menu = new QMenu(menuButton);
    auto* inMenu = new ZuNewLayoutAction(menu, 2);
    menu->addAction(inMenu);
    menuButton->setMenu(menu);
    layout->addWidget(menuButton);
    layout->addWidget(chosen);
    layout->addStretch(1);
    const auto show = [chosen](int inColumns, int inRows) {
        chosen->setText(QObject::tr("Chosen: %1 columns, %2 rows").arg(inColumns).arg(inRows));
    };
    QObject::connect(inPlace, &ZuNewLayoutAction::layoutSelected, chosen, show);
    QObject::connect(inMenu, &ZuNewLayoutAction::layoutSelected, chosen, show);
    QObject::connect(inMenu, &ZuNewLayoutAction::layoutSelected, menu, &QMenu::close);
    return box;
}

} // namespace

DemoWidgetsPanelsPage::DemoWidgetsPanelsPage(QWidget* inParent) : QWidget(inParent)
{
    // The expander images are the host's; they live in this static library.
    Q_INIT_RESOURCE(zudemo_expander);
    auto* layout = new QHBoxLayout(this);
    auto* panels = new QVBoxLayout;
    panels->addWidget(seriesPanel(this));
    panels->addWidget(tagsPanel(this));
    panels->addWidget(notesPanel(this));
    panels->addStretch(1);
    layout->addLayout(panels, 1);
    layout->addWidget(layoutBox(this), 0, Qt::AlignTop);
}
