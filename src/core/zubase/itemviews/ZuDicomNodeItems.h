#pragma once

#include "zubase/zubase_export.h"

#include <QList>
#include <QMap>
#include <QPair>
#include <QPointer>
#include <QString>
#include <QStringList>

class QTreeWidget;
class QTreeWidgetItem;

// The checkable DICOM node entries of a host's tree widget: one top-level item per node name,
// a text filter that hides entries, and the names the user checked. A plain value: copies
// refer to the same items. The tree and its items stay the host's: entries of a tree that has
// been destroyed are left out, but a host that deletes single items (or clears a tree it
// keeps) must drop this list with them.
class ZUBASE_EXPORT ZuDicomNodeItems
{
public:
    ZuDicomNodeItems();

    // The tree that addDicomNode() adds to; null adds items to no tree.
    void setTreeWidget(QTreeWidget* inTree);
    // A new unchecked entry with a check box, not selectable; an earlier entry of that name
    // stays in the tree but is no longer managed here.
    QTreeWidgetItem* addDicomNode(const QString& inName);
    // Hides the unchecked entries whose names do not contain inFilter (any letter case);
    // checked entries always stay visible. A hidden current entry hands the keyboard focus
    // on to the first visible one.
    void applyFilter(const QString& inFilter);
    // The names of the checked entries, in name order (by code unit).
    QStringList selectedDicomNodes();
    // Takes over the check states of inOther for the names both lists have.
    void copySelectionFrom(const ZuDicomNodeItems& inOther);

private:
    struct Node
    {
        QTreeWidgetItem* item = nullptr; // not owned
        QPointer<QTreeWidget> tree;      // the tree that deletes the item
        bool inTree = false;
    };
    // The entries whose items still exist: those of a destroyed tree went with it.
    QList<QPair<QString, QTreeWidgetItem*>> liveItems() const;

    QMap<QString, Node> mItems;
    QPointer<QTreeWidget> mTreeWidget;
};
