#pragma once

#include "zubase/zubase_export.h"

#include <QAction>
#include <QPoint>

// An action that can ask, by a signal, for a context menu of its own, e.g. when its tool button
// is right-clicked; the host connects the signal and shows the menu.
class ZUBASE_EXPORT ZuActionWithContextMenu : public QAction
{
    Q_OBJECT
public:
    ZuActionWithContextMenu(const QString& inText, QObject* inParent);
    explicit ZuActionWithContextMenu(QObject* inParent = nullptr);
    ~ZuActionWithContextMenu() override;

    // Emits customContextMenuRequested(inGlobalPos).
    void showToolsContextMenu(const QPoint& inGlobalPos);

Q_SIGNALS:
    void customContextMenuRequested(const QPoint& globalpos);
};
