// The shared connection handle and sizing a widget to a scroll area's viewport.
#include "zubase/ZuConvert.h"
#include "zubase/ZuScopedConnection.h"

#include <QScrollArea>
#include <QVBoxLayout>
#include <QtTest>

namespace {

class FixedHintWidget : public QWidget
{
public:
    QSize sizeHint() const override { return QSize(420, 260); }
};

} // namespace

class TestScopedConnection : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void lastShareDisconnects();
    void resizeWidgetToViewport();
};

void TestScopedConnection::lastShareDisconnects()
{
    QObject sender;
    int calls = 0;
    auto connect = [&] {
        return ZuScopedConnection(
            QObject::connect(&sender, &QObject::objectNameChanged, [&calls] { ++calls; }));
    };
    auto fire = [&] { // the number of connected slots
        const int before = calls;
        sender.setObjectName(sender.objectName() + QLatin1Char('x'));
        return calls - before;
    };
    connect(); // the only share goes away at once
    QCOMPARE(fire(), 0);

    ZuScopedConnection first = connect();
    {
        ZuScopedConnection second = first;
        QCOMPARE(fire(), 1);
    }
    QCOMPARE(fire(), 1); // one copy gone, the other holds it
    ZuScopedConnection third = first;
    first.disconnect();
    QCOMPARE(fire(), 1); // disconnect() drops a share only
    third.disconnect();
    QCOMPARE(fire(), 0);
    third.disconnect(); // nothing left to drop
    QCOMPARE(fire(), 0);
}

void TestScopedConnection::resizeWidgetToViewport()
{
    QWidget window;
    auto* area = new QScrollArea;
    (new QVBoxLayout(&window))->addWidget(area);
    auto* content = new FixedHintWidget;
    area->setWidget(content);
    window.resize(200, 120);
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    QVERIFY(area->maximumViewportSize() != content->sizeHint());

    Zu::resizeWidgetToViewport(&window, area);
    QTRY_COMPARE(area->maximumViewportSize(), content->sizeHint());

    // Null pointers and an area without content leave the widget alone.
    const QSize before = window.size();
    Zu::resizeWidgetToViewport(nullptr, area);
    Zu::resizeWidgetToViewport(&window, nullptr);
    QScrollArea empty;
    Zu::resizeWidgetToViewport(&window, &empty);
    QCOMPARE(window.size(), before);
}

QTEST_MAIN(TestScopedConnection)
#include "tst_scopedconnection.moc"
