#include "zubase/ZuDicomNodeItems.h"

#include <QItemSelectionModel>
#include <QSet>
#include <QTreeWidget>

ZuDicomNodeItems::ZuDicomNodeItems() = default;

void ZuDicomNodeItems::setTreeWidget(QTreeWidget* inTree)
{
    mTreeWidget = inTree;
}

QTreeWidgetItem* ZuDicomNodeItems::addDicomNode(const QString& inName)
{
    auto* item = new QTreeWidgetItem(mTreeWidget.data());
    mItems[inName] = Node{item, mTreeWidget, !mTreeWidget.isNull()};
    item->setText(0, inName);
    item->setFlags((item->flags() & ~Qt::ItemIsSelectable) | Qt::ItemIsUserCheckable);
    // Set twice: a check state must be set once for the check box to show at all.
    item->setCheckState(0, Qt::Checked);
    item->setCheckState(0, Qt::Unchecked);
    return item;
}

QList<QPair<QString, QTreeWidgetItem*>> ZuDicomNodeItems::liveItems() const
{
    QList<QPair<QString, QTreeWidgetItem*>> items;
    for (auto it = mItems.cbegin(); it != mItems.cend(); ++it) {
        if (!it->inTree || it->tree)
            items.append(qMakePair(it.key(), it->item));
    }
    return items;
}

void ZuDicomNodeItems::applyFilter(const QString& inFilter)
{
    QSet<QTreeWidget*> trees;
    QTreeWidget* lastTree = nullptr;
    for (const auto& entry : liveItems()) {
        QTreeWidgetItem* item = entry.second;
        QTreeWidget* tree = item->treeWidget();
        if (!tree)
            continue;
        const bool visible = item->checkState(0) == Qt::Checked ||
                             entry.first.contains(inFilter, Qt::CaseInsensitive);
        item->setHidden(!visible);
        if (tree != lastTree) {
            trees.insert(tree);
            lastTree = tree;
        }
    }

    // Space in the tree toggles the current entry; it must not be one the user cannot see.
    for (QTreeWidget* tree : qAsConst(trees)) {
        QTreeWidgetItem* current = tree->currentItem();
        if (!current || !current->isHidden())
            continue;
        QTreeWidgetItem* firstVisible = nullptr;
        for (int row = 0; row < tree->topLevelItemCount() && !firstVisible; ++row) {
            if (!tree->topLevelItem(row)->isHidden())
                firstVisible = tree->topLevelItem(row);
        }
        if (firstVisible)
            tree->setCurrentItem(firstVisible, 0, QItemSelectionModel::NoUpdate);
        else
            tree->selectionModel()->setCurrentIndex(QModelIndex(), QItemSelectionModel::NoUpdate);
    }
}

QStringList ZuDicomNodeItems::selectedDicomNodes()
{
    QStringList names;
    for (const auto& entry : liveItems()) {
        if (entry.second->checkState(0) == Qt::Checked)
            names << entry.first;
    }
    return names;
}

void ZuDicomNodeItems::copySelectionFrom(const ZuDicomNodeItems& inOther)
{
    // Both lists are in name order: one pass over each.
    const auto mine = liveItems();
    int i = 0;
    for (const auto& theirs : inOther.liveItems()) {
        while (i < mine.size() && mine.at(i).first < theirs.first)
            ++i;
        if (i < mine.size() && mine.at(i).first == theirs.first)
            mine.at(i).second->setCheckState(0, theirs.second->checkState(0));
    }
}
