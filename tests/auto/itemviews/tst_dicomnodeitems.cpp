// DICOM node items: new entries, the filter, the checked names in name order, duplicates,
// the transfer of check states, and the keyboard in the host's tree.
#include "zubase/ZuDicomNodeItems.h"

#include <QAccessible>
#include <QTreeWidget>
#include <QtTest>

namespace {

QStringList visibleNames(const QTreeWidget& inTree)
{
    QStringList names;
    for (int row = 0; row < inTree.topLevelItemCount(); ++row) {
        if (!inTree.topLevelItem(row)->isHidden())
            names << inTree.topLevelItem(row)->text(0);
    }
    return names;
}

} // namespace

class tst_DicomNodeItems : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    void newNodeAndSpaceKey();
    void filter_data();
    void filter();
    void checkedNamesAndDuplicates();
    void copySelection();
};

void tst_DicomNodeItems::newNodeAndSpaceKey()
{
    QTreeWidget tree;
    ZuDicomNodeItems nodes;
    nodes.setTreeWidget(&tree);
    for (const char* name : {"CT1", "MR2", "US3"})
        nodes.addDicomNode(QString::fromLatin1(name));
    QTreeWidgetItem* item = tree.topLevelItem(1);
    QCOMPARE(item->text(0), QStringLiteral("MR2"));
    QCOMPARE(item->flags() & (Qt::ItemIsSelectable | Qt::ItemIsUserCheckable),
             Qt::ItemIsUserCheckable);
    QCOMPARE(item->data(0, Qt::CheckStateRole), QVariant(Qt::Unchecked)); // the box shows

    tree.show();
    QVERIFY(QTest::qWaitForWindowExposed(&tree));
    tree.setCurrentItem(item, 0, QItemSelectionModel::NoUpdate);
    QTest::keyClick(&tree, Qt::Key_Space);
    QCOMPARE(nodes.selectedDicomNodes(), QStringList{"MR2"});
    QVERIFY(tree.selectedItems().isEmpty());
    QAccessibleInterface* cell =
        QAccessible::queryAccessibleInterface(&tree)->tableInterface()->cellAt(1, 0);
    QVERIFY(cell);
    QCOMPARE(cell->text(QAccessible::Name), QStringLiteral("MR2"));
    QVERIFY(cell->state().checkable && cell->state().checked);

    // Filtering hides the current entry: the keyboard moves on to the one left visible.
    nodes.applyFilter(QStringLiteral("us"));
    QCOMPARE(tree.currentItem(), tree.topLevelItem(1)); // checked, so still there
    tree.setCurrentItem(tree.topLevelItem(0), 0, QItemSelectionModel::NoUpdate);
    nodes.applyFilter(QStringLiteral("us"));
    QCOMPARE(tree.currentItem(), tree.topLevelItem(1));
    QTest::keyClick(&tree, Qt::Key_Down);
    QTest::keyClick(&tree, Qt::Key_Space);
    QCOMPARE(nodes.selectedDicomNodes(), QStringList({"MR2", "US3"}));
}

void tst_DicomNodeItems::filter_data()
{
    QTest::addColumn<QString>("filter");
    QTest::addColumn<QStringList>("visible");
    QTest::newRow("any case") << "ct" << QStringList{"CT-1", "PACS", "ct-3"};
    QTest::newRow("no match") << "zzz" << QStringList{"PACS"};
    QTest::newRow("empty") << "" << QStringList{"CT-1", "PACS", "MR-2", "ct-3"};
}

void tst_DicomNodeItems::filter()
{
    QTreeWidget tree;
    ZuDicomNodeItems nodes;
    nodes.setTreeWidget(&tree);
    for (const char* name : {"CT-1", "PACS", "MR-2", "ct-3"})
        nodes.addDicomNode(QString::fromLatin1(name));
    tree.topLevelItem(1)->setCheckState(0, Qt::Checked);
    nodes.applyFilter(QStringLiteral("zzz")); // a filter before is undone by the next
    QFETCH(QString, filter);
    nodes.applyFilter(filter);
    QTEST(visibleNames(tree), "visible");

    ZuDicomNodeItems treeless; // items in no tree are left alone
    std::unique_ptr<QTreeWidgetItem> orphan(treeless.addDicomNode(QStringLiteral("X")));
    treeless.applyFilter(QStringLiteral("zzz"));
    QVERIFY(!orphan->treeWidget());
}

void tst_DicomNodeItems::checkedNamesAndDuplicates()
{
    QTreeWidget tree;
    ZuDicomNodeItems nodes;
    nodes.setTreeWidget(&tree);
    for (const char* name : {"B", "a", "A", "B"})
        nodes.addDicomNode(QString::fromLatin1(name))->setCheckState(0, Qt::Checked);
    ZuDicomNodeItems copy = nodes; // the same items
    QCOMPARE(copy.selectedDicomNodes(), QStringList({"A", "B", "a"}));

    // The first B is no longer managed: unchecking it changes nothing, the filter skips it.
    QCOMPARE(tree.topLevelItemCount(), 4);
    tree.topLevelItem(0)->setCheckState(0, Qt::Unchecked);
    QCOMPARE(nodes.selectedDicomNodes(), QStringList({"A", "B", "a"}));
    tree.topLevelItem(3)->setCheckState(0, Qt::Unchecked);
    nodes.applyFilter(QStringLiteral("zzz"));
    QCOMPARE(visibleNames(tree), QStringList({"B", "a", "A"}));
    QCOMPARE(nodes.selectedDicomNodes(), QStringList({"A", "a"}));
}

void tst_DicomNodeItems::copySelection()
{
    QTreeWidget first;
    QTreeWidget second;
    ZuDicomNodeItems mine;
    ZuDicomNodeItems theirs;
    mine.setTreeWidget(&first);
    theirs.setTreeWidget(&second);
    mine.addDicomNode(QStringLiteral("only mine"))->setCheckState(0, Qt::Checked);
    mine.addDicomNode(QStringLiteral("both"))->setCheckState(0, Qt::Checked);
    mine.addDicomNode(QStringLiteral("both too"));
    theirs.addDicomNode(QStringLiteral("both"));
    theirs.addDicomNode(QStringLiteral("both too"))->setCheckState(0, Qt::Checked);
    theirs.addDicomNode(QStringLiteral("only theirs"))->setCheckState(0, Qt::Checked);

    mine.copySelectionFrom(theirs);
    QCOMPARE(mine.selectedDicomNodes(), QStringList({"both too", "only mine"}));
    QCOMPARE(theirs.selectedDicomNodes(), QStringList({"both too", "only theirs"}));
    QCOMPARE(first.topLevelItemCount(), 3);
}

QTEST_MAIN(tst_DicomNodeItems)
#include "tst_dicomnodeitems.moc"
