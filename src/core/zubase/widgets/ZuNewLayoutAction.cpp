#include "zubase/ZuNewLayoutAction.h"

#include "zubase/widgets/ZuGridSelector_p.h"

ZuNewLayoutAction::ZuNewLayoutAction(QWidget* inParent, int inColumnStep) : QWidgetAction(inParent)
{
    auto* grid = new ZuGridSelector(inParent, inColumnStep);
    connect(grid, &ZuGridSelector::cellSelected, this, &ZuNewLayoutAction::gridSelected);
    setDefaultWidget(grid);
}

ZuNewLayoutAction::~ZuNewLayoutAction() = default;

void ZuNewLayoutAction::gridSelected(int inColumn, int inRow)
{
    Q_EMIT layoutSelected(inColumn + 1, inRow + 1);
}
