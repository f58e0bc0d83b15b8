#pragma once

#include "zubase/zubase_export.h"

#include <QList>
#include <QToolBar>

#include <memory>

class QAction;
class QDropEvent;

// A tool bar whose tool buttons the user can reorder by dragging them within the same tool bar
// (once enabled). It keeps no order itself: the host reads actions() after
// toolButtonOrderChanged() and hands a stored order back through changeActionOrder().
class ZUBASE_EXPORT ZuToolBarDnD : public QToolBar
{
    Q_OBJECT
public:
    explicit ZuToolBarDnD(QWidget* inParent = nullptr);
    ~ZuToolBarDnD() override;

    // Off by default; also sets whether the tool bar accepts drops.
    void setDragAndDropEnabled(bool inEnabled);
    bool dragAndDropEnabled() const;
    // Puts back an order of exactly this tool bar's actions; any other list changes nothing.
    void changeActionOrder(const QList<QAction*>& inActions);
    // Removes every action, the last first.
    void removeActions();
    // The two lists hold the same actions, each as often, in any order.
    static bool compareActionsOrderIndepend(const QList<QAction*>& inFirst,
                                            const QList<QAction*>& inSecond);

Q_SIGNALS:
    // The order of the actions changed through a drop or changeActionOrder().
    void toolButtonOrderChanged();

protected:
    // Accepts, as a move, a button dragged from this same tool bar onto inTarget.
    bool checkDropSupported(QDropEvent* inEvent, QObject* inTarget);
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;
    void actionEvent(QActionEvent* inEvent) override;
    void dragEnterEvent(QDragEnterEvent* inEvent) override;
    // A drop between the buttons changes nothing.
    void dropEvent(QDropEvent* inEvent) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
