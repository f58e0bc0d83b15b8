// ZuTabBar and ZuTabWidget driven by the mouse: the "+" tab, close requests, drags.
#include "zubase/ZuTabBar.h"
#include "zubase/ZuTabWidget.h"

#include <QAccessible>
#include <QToolButton>
#include <QtTest>

#include <memory>

class TstTabWidget : public QObject
{
    Q_OBJECT
    std::unique_ptr<ZuTabWidget> mTabs;
    QTabBar* bar() const { return mTabs->tabBar(); }
    QPoint centre(int inIndex) const { return bar()->tabRect(inIndex).center(); }
    QString texts() const
    {
        QString list;
        for (int i = 0; i < bar()->count(); ++i)
            list += bar()->tabText(i);
        return list;
    }
    void drag(QEvent::Type inType, const QPoint& inPos)
    {
        QMouseEvent event(inType, inPos, bar()->mapToGlobal(inPos), Qt::LeftButton,
                          inType == QEvent::MouseButtonRelease ? Qt::NoButton : Qt::LeftButton,
                          Qt::NoModifier);
        QApplication::sendEvent(bar(), &event);
    }

private Q_SLOTS:
    void init()
    {
        mTabs = std::make_unique<ZuTabWidget>();
        for (const char* text : {"A", "B", "C", "+"})
            mTabs->addTab(new QWidget, text);
        mTabs->setMovable(true);
        mTabs->resize(400, 200);
        mTabs->show();
        QVERIFY(QTest::qWaitForWindowExposed(mTabs.get()));
    }

    void metaObjects()
    {
        const auto methods = [](const QMetaObject& inMeta) {
            QStringList list;
            for (int i = inMeta.methodOffset(); i < inMeta.methodCount(); ++i) {
                const QMetaMethod method = inMeta.method(i);
                list << QString::number(method.methodType() + 4 * method.access()) + " " +
                            method.methodSignature();
            }
            return list.join(", "); // 6: protected slot, 9: signal
        };
        QCOMPARE(methods(ZuTabBar::staticMetaObject),
                 "9 newTabMenuRequested(), 6 handleTabMoved(int,int), 6 fixNewTabPosition()");
        QCOMPARE(methods(ZuTabWidget::staticMetaObject),
                 "9 newTabMenuRequested(), 9 tabMoved(int,int), 6 handleTabCloseRequested(int), "
                 "6 handleNewTabMenuRequested(), 6 closeTab()");
    }

    // A tab dragged over "+" swaps with it; "+" goes back to the end once the loop has run.
    void dragKeepsNewTabLast_data()
    {
        QTest::addColumn<int>("from");
        QTest::addColumn<int>("to");
        QTest::addColumn<QString>("result");
        QTest::addColumn<QString>("moves"); // tabMoved(from, to) of the widget
        QTest::newRow("C past +") << 2 << 3 << "ABC+"
                                  << "3>2 2>3 ";
        QTest::newRow("A past all") << 0 << 3 << "BCA+"
                                    << "1>0 2>1 3>2 2>3 ";
        QTest::newRow("A onto B") << 0 << 1 << "BAC+"
                                  << "1>0 ";
    }
    void dragKeepsNewTabLast()
    {
        QFETCH(int, from);
        QFETCH(int, to);
        QFETCH(QString, result);
        QFETCH(QString, moves);
        QString seen;
        connect(mTabs.get(), &ZuTabWidget::tabMoved,
                [&seen](int inFrom, int inTo) { seen += QString("%1>%2 ").arg(inFrom).arg(inTo); });
        const QPoint start = centre(from);
        const int end = bar()->tabRect(to).right() - 2;
        drag(QEvent::MouseButtonPress, start);
        for (int x = start.x(); x <= end; x += 4)
            drag(QEvent::MouseMove, QPoint(x, start.y()));
        drag(QEvent::MouseButtonRelease, QPoint(end, start.y()));
        QTRY_COMPARE(texts(), result);
        QTest::qWait(50); // and no late move
        QCOMPARE(seen, moves);
    }

    // "+" asks for the menu and is never selected; a middle click asks to close a tab that
    // has a close button, nothing else.
    void presses_data()
    {
        QTest::addColumn<int>("tab");
        QTest::addColumn<int>("button");
        QTest::addColumn<QString>("requests"); // m: new-tab menu, c: close
        QTest::addColumn<int>("current");
        QTest::newRow("left on +") << 3 << int(Qt::LeftButton) << "m" << 0;
        QTest::newRow("right on +") << 3 << int(Qt::RightButton) << "m" << 0;
        QTest::newRow("middle on +") << 3 << int(Qt::MiddleButton) << "" << 0;
        QTest::newRow("middle, no close button") << 2 << int(Qt::MiddleButton) << "" << 0;
        QTest::newRow("middle, close button") << 1 << int(Qt::MiddleButton) << "c1" << 0;
        QTest::newRow("left on a tab") << 1 << int(Qt::LeftButton) << "" << 1;
    }
    void presses()
    {
        QFETCH(int, tab);
        QFETCH(int, button);
        QFETCH(QString, requests);
        QFETCH(int, current);
        mTabs->setCloseButton(0, QIcon());
        mTabs->setCloseButton(1, QIcon());
        QString seen;
        connect(mTabs.get(), &ZuTabWidget::newTabMenuRequested, [&seen] { seen += "m"; });
        connect(mTabs.get(), &QTabWidget::tabCloseRequested,
                [&seen](int inIndex) { seen += "c" + QString::number(inIndex); });
        QSignalSpy clicked(bar(), &QTabBar::tabBarClicked); // only presses passed on to QTabBar
        QTest::mouseClick(bar(), Qt::MouseButton(button), Qt::NoModifier, centre(tab));
        QCOMPARE(seen, requests);
        QCOMPARE(clicked.count(), current);
        QCOMPARE(mTabs->currentIndex(), current);
    }

    // Close buttons ask for their tab as it is at click time, once even with Qt's own close
    // buttons on; screen readers hear "Close tab" and "New tab".
    void closeButtons()
    {
        for (int tab : {1, 2, 4, 2}) // 4 is out of range; the second button replaces the first
            mTabs->setCloseButton(tab, QIcon());
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        QCOMPARE(bar()->findChildren<QToolButton*>().count(), 2 + 2); // and two scroll buttons
        auto* button = qobject_cast<QToolButton*>(bar()->tabButton(2, QTabBar::RightSide));
        QCOMPARE(button->size(), QSize(18, 18));
        QCOMPARE(button->iconSize(), QSize(14, 14));
        QVERIFY(button->autoRaise());
        QCOMPARE(QAccessible::queryAccessibleInterface(button)->text(QAccessible::Name),
                 "Close tab");
        mTabs->removeTab(0);
        mTabs->setTabsClosable(true);
        QSignalSpy close(mTabs.get(), &QTabWidget::tabCloseRequested);
        QTest::mouseClick(button, Qt::LeftButton);
        QTest::mouseClick(bar(), Qt::MiddleButton, Qt::NoModifier, centre(0));
        QCOMPARE(close.count(), 2);
        QCOMPARE(close.at(0).first().toInt(), 1);
        QCOMPARE(close.at(1).first().toInt(), 0);
    }

    void accessibleNames()
    {
        bar()->setAccessibleTabName(1, "Series"); // the host's own name stays
        QAccessibleInterface* tabs = QAccessible::queryAccessibleInterface(bar());
        QCOMPARE(tabs->child(3)->text(QAccessible::Name), "New tab");
        QCOMPARE(tabs->child(0)->text(QAccessible::Name), "A");
        bar()->setTabText(3, "D");
        QTRY_COMPARE(tabs->child(3)->text(QAccessible::Name), "D");
        QCOMPARE(tabs->child(1)->text(QAccessible::Name), "Series");
    }

    // Many tabs scroll with their whole texts; a lone "+" still asks for the menu.
    void crowdedAndEmptyBar()
    {
        for (int i = 0; i < 12; ++i)
            mTabs->insertTab(0, new QWidget, "Examination " + QString::number(i));
        QVERIFY(bar()->tabRect(0).width() >
                bar()->fontMetrics().horizontalAdvance("Examination 11"));
        QVERIFY(bar()->findChild<QToolButton*>()->isVisible()); // a scroll button
        while (mTabs->count() > 1)
            mTabs->removeTab(0);
        QSignalSpy menu(mTabs.get(), &ZuTabWidget::newTabMenuRequested);
        QTest::mouseClick(bar(), Qt::LeftButton, Qt::NoModifier, centre(0));
        QCOMPARE(menu.count(), 1);
    }
};

QTEST_MAIN(TstTabWidget)
#include "tst_tabwidget.moc"
