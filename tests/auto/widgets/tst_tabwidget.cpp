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
    QStringList texts() const
    {
        QStringList list;
        for (int i = 0; i < bar()->count(); ++i)
            list << bar()->tabText(i);
        return list;
    }
    void mouse(QEvent::Type inType, const QPoint& inPos, Qt::MouseButton inButton = Qt::LeftButton)
    {
        QMouseEvent event(inType, inPos, bar()->mapToGlobal(inPos), inButton,
                          inType == QEvent::MouseButtonRelease ? Qt::NoButton : Qt::LeftButton,
                          Qt::NoModifier);
        QApplication::sendEvent(bar(), &event);
    }

private Q_SLOTS:
    void init()
    {
        mTabs = std::make_unique<ZuTabWidget>();
        for (const char* text : {"A", "B", "C", "+"})
            mTabs->addTab(new QWidget, QString::fromLatin1(text));
        mTabs->setMovable(true);
        mTabs->resize(400, 200);
        mTabs->show();
        QVERIFY(QTest::qWaitForWindowExposed(mTabs.get()));
    }

    void metaObject_data()
    {
        QTest::addColumn<QString>("className");
        QTest::addColumn<QStringList>("methods");
        QTest::newRow("bar") << "ZuTabBar"
                             << QStringList{"S newTabMenuRequested()", "P handleTabMoved(int,int)",
                                            "P fixNewTabPosition()"};
        QTest::newRow("widget") << "ZuTabWidget"
                                << QStringList{"S newTabMenuRequested()", "S tabMoved(int,int)",
                                               "P handleTabCloseRequested(int)",
                                               "P handleNewTabMenuRequested()", "P closeTab()"};
    }
    void metaObject()
    {
        QFETCH(QString, className);
        QFETCH(QStringList, methods);
        const QMetaObject* meta =
            className == "ZuTabBar" ? &ZuTabBar::staticMetaObject : &ZuTabWidget::staticMetaObject;
        QStringList seen;
        for (int i = meta->methodOffset(); i < meta->methodCount(); ++i) {
            const QMetaMethod method = meta->method(i);
            const bool protectedSlot = method.methodType() == QMetaMethod::Slot &&
                                       method.access() == QMetaMethod::Protected;
            seen << (method.methodType() == QMetaMethod::Signal ? "S "
                     : protectedSlot                            ? "P "
                                                                : "? ") +
                        QString::fromLatin1(method.methodSignature());
        }
        QCOMPARE(seen, methods);
    }

    // Dragging a tab over the "+" tab swaps them; the bar puts "+" back at the end afterwards.
    void dragKeepsNewTabLast_data()
    {
        QTest::addColumn<int>("from");
        QTest::addColumn<int>("to");
        QTest::addColumn<QStringList>("result");
        QTest::addColumn<QStringList>("moves"); // tabMoved(from, to), the fix last
        QTest::newRow("C past +") << 2 << 3 << QStringList{"A", "B", "C", "+"}
                                  << QStringList{"3>2", "2>3"};
        QTest::newRow("A past all")
            << 0 << 3 << QStringList{"B", "C", "A", "+"} << QStringList{"1>0", "2>1", "3>2", "2>3"};
        QTest::newRow("A onto B") << 0 << 1 << QStringList{"B", "A", "C", "+"}
                                  << QStringList{"1>0"};
    }
    void dragKeepsNewTabLast()
    {
        QFETCH(int, from);
        QFETCH(int, to);
        QFETCH(QStringList, result);
        QFETCH(QStringList, moves);
        QSignalSpy moved(mTabs.get(), &ZuTabWidget::tabMoved);
        const QPoint start = centre(from);
        mouse(QEvent::MouseButtonPress, start);
        for (int x = start.x(); x <= bar()->tabRect(to).right() - 2; x += 4)
            mouse(QEvent::MouseMove, QPoint(x, start.y()));
        mouse(QEvent::MouseButtonRelease, QPoint(bar()->tabRect(to).right() - 2, start.y()));
        QTRY_COMPARE(texts(), result);
        QTest::qWait(50); // no late move
        QCOMPARE(texts(), result);
        QStringList seen;
        for (const QList<QVariant>& move : moved)
            seen << QString("%1>%2").arg(move.at(0).toInt()).arg(move.at(1).toInt());
        QCOMPARE(seen, moves);
    }

    // A press on "+" asks for the menu and never selects the tab; a middle click asks to close
    // a tab only when it has a close button.
    void presses_data()
    {
        QTest::addColumn<int>("tab");
        QTest::addColumn<int>("button");
        QTest::addColumn<bool>("closeButton");
        QTest::addColumn<int>("menuRequests");
        QTest::addColumn<int>("closeRequests");
        QTest::addColumn<int>("current");
        QTest::newRow("left on +") << 3 << int(Qt::LeftButton) << false << 1 << 0 << 0;
        QTest::newRow("right on +") << 3 << int(Qt::RightButton) << false << 1 << 0 << 0;
        QTest::newRow("middle on +") << 3 << int(Qt::MiddleButton) << false << 0 << 0 << 0;
        QTest::newRow("middle, no button") << 1 << int(Qt::MiddleButton) << false << 0 << 0 << 0;
        QTest::newRow("middle, close button") << 1 << int(Qt::MiddleButton) << true << 0 << 1 << 0;
        QTest::newRow("left on a tab") << 2 << int(Qt::LeftButton) << true << 0 << 0 << 2;
    }
    void presses()
    {
        QFETCH(int, tab);
        QFETCH(int, button);
        QFETCH(bool, closeButton);
        QFETCH(int, menuRequests);
        QFETCH(int, closeRequests);
        QFETCH(int, current);
        if (closeButton)
            mTabs->setCloseButton(tab, QIcon());
        QSignalSpy menu(mTabs.get(), &ZuTabWidget::newTabMenuRequested);
        QSignalSpy barMenu(bar(), &QTabBar::tabBarClicked);
        QSignalSpy close(mTabs.get(), &QTabWidget::tabCloseRequested);
        QTest::mouseClick(bar(), Qt::MouseButton(button), Qt::NoModifier, centre(tab));
        QCOMPARE(menu.count(), menuRequests);
        QCOMPARE(close.count(), closeRequests);
        if (closeRequests)
            QCOMPARE(close.first().first().toInt(), tab);
        QCOMPARE(barMenu.count(), current ? 1 : 0); // only presses passed on reach QTabBar
        QCOMPARE(mTabs->currentIndex(), current);
    }

    // A close button asks for the tab it sits on at click time.
    void closeButtons()
    {
        for (int tab = 0; tab < 3; ++tab)
            mTabs->setCloseButton(tab, QIcon());
        mTabs->setCloseButton(7, QIcon()); // out of range: no button made
        mTabs->setCloseButton(2, QIcon()); // replaces the first button of tab 2
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        QCOMPARE(bar()->findChildren<QToolButton*>(QString(), Qt::FindDirectChildrenOnly).count(),
                 3 + 2); // and the two scroll buttons
        auto* button = qobject_cast<QToolButton*>(bar()->tabButton(2, QTabBar::RightSide));
        QVERIFY(button);
        QCOMPARE(button->size(), QSize(18, 18));
        QCOMPARE(button->iconSize(), QSize(14, 14));
        QVERIFY(button->autoRaise());
        mTabs->removeTab(0);
        QSignalSpy close(mTabs.get(), &QTabWidget::tabCloseRequested);
        QTest::mouseClick(button, Qt::LeftButton);
        QCOMPARE(close.count(), 1);
        QCOMPARE(close.first().first().toInt(), 1);
    }

    // With Qt's own close buttons on, each request still reaches the host once.
    void tabsClosableRequestsOnce()
    {
        mTabs->setTabsClosable(true);
        QSignalSpy close(mTabs.get(), &QTabWidget::tabCloseRequested);
        QTest::mouseClick(bar(), Qt::MiddleButton, Qt::NoModifier, centre(1));
        QTest::mouseClick(bar()->tabButton(2, QTabBar::RightSide), Qt::LeftButton);
        QCOMPARE(close.count(), 2);
        QCOMPARE(close.at(0).first().toInt(), 1);
        QCOMPARE(close.at(1).first().toInt(), 2);
    }

    void accessibleNames()
    {
        mTabs->setCloseButton(0, QIcon());
        QAccessibleInterface* tabs = QAccessible::queryAccessibleInterface(bar());
        QVERIFY(tabs);
        QCOMPARE(tabs->child(3)->text(QAccessible::Name), QString("New tab"));
        QCOMPARE(tabs->child(1)->text(QAccessible::Name), QString("B"));
        bar()->setTabText(3, "D"); // no longer the new-tab tab
        QTRY_COMPARE(tabs->child(3)->text(QAccessible::Name), QString("D"));
        QCOMPARE(QAccessible::queryAccessibleInterface(bar()->tabButton(0, QTabBar::RightSide))
                     ->text(QAccessible::Name),
                 QString("Close tab"));
    }
};

QTEST_MAIN(TstTabWidget)
#include "tst_tabwidget.moc"
