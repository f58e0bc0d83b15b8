#include "zubase/ZuActionWithContextMenu.h"

ZuActionWithContextMenu::ZuActionWithContextMenu(const QString& inText, QObject* inParent)
    : QAction(inText, inParent)
{}

ZuActionWithContextMenu::ZuActionWithContextMenu(QObject* inParent) : QAction(inParent) {}

ZuActionWithContextMenu::~ZuActionWithContextMenu() = default;

void ZuActionWithContextMenu::showToolsContextMenu(const QPoint& inGlobalPos)
{
    Q_EMIT customContextMenuRequested(inGlobalPos);
}
