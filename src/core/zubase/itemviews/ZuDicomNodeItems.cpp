#include "zubase/ZuDicomNodeItems.h"

#include <QItemSelectionModel>
#include <QSet>
#include <QTreeWidget>

template class QMap<QString, QTreeWidgetItem*>;

ZuDicomNodeItems::ZuDicomNodeItems() = default;

void ZuDicomNodeItems::setTreeWidget(QTreeWidget* inTree)
{
    mTreeWidget = inTree;
}

QTreeWidgetItem* ZuDicomNodeItems::addDicomNode(const QString& inName)
{
    auto* item = new QTreeWidgetItem(mTreeWidget.data());
    mItems[inName] = item;
    item->setText(0, inName);
    item->setFlags((item->flags() & ~Qt::ItemIsSelectable) | Qt::ItemIsUserCheckable);
    // Set twice: a check state must be set once for the check box to show at all.
    item->setCheckState(0, Qt::Checked);
    item->setCheckState(0, Qt::Unchecked);
    return item;
}

void ZuDicomNodeItems::applyFilter(const QString& inFilter)
{
    QSet<QTreeWidget*> trees;
    QTreeWidget* lastTree = nullptr;
    for (auto it = mItems.cbegin(); it != mItems.cend(); ++it) {
        QTreeWidgetItem* item = it.value();
        QTreeWidget* tree = item->treeWidget();
        if (!tree)
            continue;
        const bool visible =
            item->checkState(0) == Qt::Checked || it.key().contains(inFilter, Qt::CaseInsensitive);
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
    for (auto it = mItems.cbegin(); it != mItems.cend(); ++it) {
        if (it.value()->checkState(0) == Qt::Checked)
            names << it.key();
    }
    return names;
}

void ZuDicomNodeItems::copySelectionFrom(const ZuDicomNodeItems& inOther)
{
    for (auto it = inOther.mItems.cbegin(); it != inOther.mItems.cend(); ++it) {
        const auto mine = mItems.constFind(it.key());
        if (mine != mItems.cend())
            mine.value()->setCheckState(0, it.value()->checkState(0));
    }
}
