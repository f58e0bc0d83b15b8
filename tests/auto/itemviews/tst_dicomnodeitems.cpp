// DICOM node items: new entries and the Space key, the filter, the checked names in name
// order, duplicates, and the transfer of check states.
#include "zubase/ZuDicomNodeItems.h"

#include <QTreeWidget>
#include <QtTest>

#include <memory>

class tst_DicomNodeItems : public QObject
{
    Q_OBJECT
private Q_SLOTS:
    // Entries are checkable, not selectable; Space checks the current one. A filter that
    // hides the current entry moves it to the first one visible.
    void keyboard()
    {
        QTreeWidget tree;
        ZuDicomNodeItems nodes;
        nodes.setTreeWidget(&tree);
        for (const char* name : {"CT1", "MR2", "US3"})
            nodes.addDicomNode(name);
        QTreeWidgetItem* item = tree.topLevelItem(1);
        QCOMPARE(item->data(0, Qt::CheckStateRole), QVariant(Qt::Unchecked)); // the box shows
        tree.show();
        QVERIFY(QTest::qWaitForWindowExposed(&tree));
        tree.setCurrentItem(tree.topLevelItem(0), 0, QItemSelectionModel::NoUpdate);
        QTest::keyClick(&tree, Qt::Key_Down);
        QTest::keyClick(&tree, Qt::Key_Space);
        QCOMPARE(nodes.selectedDicomNodes(), QStringList{"MR2"});
        QVERIFY(tree.selectedItems().isEmpty());

        tree.setCurrentItem(tree.topLevelItem(0), 0, QItemSelectionModel::NoUpdate);
        nodes.applyFilter("us");
        QCOMPARE(tree.currentItem(), item); // checked, so visible
        QTest::keyClick(&tree, Qt::Key_Down);
        QTest::keyClick(&tree, Qt::Key_Space);
        QCOMPARE(nodes.selectedDicomNodes(), QStringList({"MR2", "US3"}));
        nodes.applyFilter("zzz"); // the current entry is checked, so it stays
        QCOMPARE(tree.currentItem(), tree.topLevelItem(2));
        tree.topLevelItem(2)->setCheckState(0, Qt::Unchecked);
        item->setCheckState(0, Qt::Unchecked);
        nodes.applyFilter("zzz"); // nothing visible: no current entry
        QVERIFY(!tree.currentIndex().isValid());
    }

    // Any case; checked entries stay visible; entries in no tree are left alone.
    void filter_data()
    {
        QTest::addColumn<QString>("filter");
        QTest::addColumn<QStringList>("visible");
        QTest::newRow("any case") << "ct" << QStringList{"CT-1", "PACS", "ct-3"};
        QTest::newRow("no match") << "zzz" << QStringList{"PACS"};
        QTest::newRow("empty") << "" << QStringList{"CT-1", "PACS", "MR-2", "ct-3"};
    }
    void filter()
    {
        QTreeWidget tree;
        ZuDicomNodeItems nodes;
        nodes.setTreeWidget(&tree);
        for (const char* name : {"CT-1", "PACS", "MR-2", "ct-3"})
            nodes.addDicomNode(name);
        tree.topLevelItem(1)->setCheckState(0, Qt::Checked);
        nodes.applyFilter("zzz"); // undone by the next filter
        QFETCH(QString, filter);
        nodes.applyFilter(filter);
        QStringList visible;
        for (int row = 0; row < tree.topLevelItemCount(); ++row) {
            if (!tree.topLevelItem(row)->isHidden())
                visible << tree.topLevelItem(row)->text(0);
        }
        QTEST(visible, "visible");
        ZuDicomNodeItems treeless;
        std::unique_ptr<QTreeWidgetItem> orphan(treeless.addDicomNode("X"));
        treeless.applyFilter("zzz");
        QVERIFY(!orphan->isHidden());
    }

    // Names in name order, once; copies share the items; check states go by name.
    void namesDuplicatesAndCopies()
    {
        QTreeWidget tree;
        ZuDicomNodeItems nodes;
        nodes.setTreeWidget(&tree);
        for (const char* name : {"B", "a", "A", "B"})
            nodes.addDicomNode(name)->setCheckState(0, Qt::Checked);
        ZuDicomNodeItems copy = nodes;
        QCOMPARE(copy.selectedDicomNodes(), QStringList({"A", "B", "a"}));
        QCOMPARE(tree.topLevelItemCount(), 4);
        tree.topLevelItem(0)->setCheckState(0, Qt::Unchecked); // the first B is not managed
        QCOMPARE(nodes.selectedDicomNodes(), QStringList({"A", "B", "a"}));

        QTreeWidget otherTree;
        ZuDicomNodeItems other;
        other.setTreeWidget(&otherTree);
        other.addDicomNode("a");
        other.addDicomNode("c")->setCheckState(0, Qt::Checked);
        nodes.copySelectionFrom(other);
        QCOMPARE(nodes.selectedDicomNodes(), QStringList({"A", "B"}));
        QCOMPARE(other.selectedDicomNodes(), QStringList{"c"});
    }

    // The tree deletes its items: a list that outlives it must not read them.
    void destroyedTree()
    {
        ZuDicomNodeItems nodes;
        ZuDicomNodeItems survivor;
        auto* tree = new QTreeWidget;
        nodes.setTreeWidget(tree);
        nodes.addDicomNode("CT1")->setCheckState(0, Qt::Checked);
        QTreeWidget otherTree;
        survivor.setTreeWidget(&otherTree);
        survivor.addDicomNode("CT1");
        delete tree;
        QCOMPARE(nodes.selectedDicomNodes(), QStringList());
        nodes.applyFilter("MR");
        survivor.copySelectionFrom(nodes);
        QCOMPARE(survivor.selectedDicomNodes(), QStringList());
        nodes.copySelectionFrom(survivor);
    }
};

QTEST_MAIN(tst_DicomNodeItems)
#include "tst_dicomnodeitems.moc"
