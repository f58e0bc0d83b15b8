// Reordering a tool bar's buttons by dragging them, and putting a stored order back. Offscreen
// windows take no drops (a drag ends at once), so the drags run on the Xvfb only.
#include "TestSupport.h"
#include "WidgetTest.h"
#include "zubase/ZuToolBarDnD.h"

#include <QDrag>
#include <QMimeData>
#include <QToolButton>

static QString order(const QToolBar* inBar)
{
    QString names;
    for (const QAction* action : inBar->actions())
        names += action->text();
    return names;
}

static QToolButton* button(QToolBar* inBar, const QString& inText)
{
    for (QAction* action : inBar->actions()) {
        if (action->text() == inText)
            return qobject_cast<QToolButton*>(inBar->widgetForAction(action));
    }
    return nullptr;
}

static void sendMouse(QWidget* inTo, QEvent::Type inType, const QPoint& inPos,
                      Qt::MouseButtons inButtons)
{
    const Qt::MouseButton button = inType == QEvent::MouseMove   ? Qt::NoButton
                                   : inButtons & Qt::RightButton ? Qt::RightButton
                                                                 : Qt::LeftButton;
    QMouseEvent event(inType, inPos, inTo->mapToGlobal(inPos), button,
                      inType == QEvent::MouseButtonRelease ? Qt::NoButton : inButtons, {});
    QApplication::sendEvent(inTo, &event);
}

// Presses inSource and moves it by inMove with inButtons held; if that starts a drag, moves the
// pointer to inTarget (global) and drops there. Returns whether a drag of its picture started.
static bool drag(QToolButton* inSource, const QPoint& inMove, const QPoint& inTarget,
                 Qt::MouseButtons inButtons = Qt::LeftButton)
{
    const QPoint start = inSource->rect().center();
    QCursor::setPos(inSource->mapToGlobal(start));
    sendMouse(inSource, QEvent::MouseButtonPress, start, inButtons);
    QWidget* window = inSource->window();
    bool started = false;
    QTimer::singleShot(0, window, [&] {
        QDrag* running = window->findChild<QDrag*>();
        if (!running)
            return;
        // The picture is the button alone: its icon on a transparent ground.
        const QImage picture = running->pixmap().toImage();
        started = picture.size() == inSource->size() && picture.pixelColor(0, 0).alpha() == 0 &&
                  picture.pixelColor(start) == QColor(Qt::darkCyan);
        QCursor::setPos(inTarget);
        sendMouse(window, QEvent::MouseMove, window->mapFromGlobal(inTarget), inButtons);
        sendMouse(window, QEvent::MouseButtonRelease, window->mapFromGlobal(inTarget), inButtons);
    });
    QPointer<QToolButton> source = inSource; // rebuilt by a drop
    sendMouse(inSource, QEvent::MouseMove, start + inMove, inButtons);
    QCoreApplication::processEvents(); // runs the timer if no drag did
    if (source)
        sendMouse(source, QEvent::MouseButtonRelease, start + inMove, inButtons);
    return started;
}

class tst_ToolBarDnD : public QObject
{
    Q_OBJECT
private slots:
    void init();
    void cleanup() { delete mWindow; }
    void dropReorders_data();
    void dropReorders();
    void changeActionOrder();
    void foreignDropRefused();

private:
    QWidget* mWindow = nullptr;
    ZuToolBarDnD* mBar = nullptr;
};

void tst_ToolBarDnD::init()
{
    mWindow = new QWidget;
    mWindow->resize(400, 300);
    mBar = new ZuToolBarDnD(mWindow);
    mBar->setIconSize(QSize(40, 40)); // room for a move of twice the drag distance
    QPixmap icon(40, 40);
    icon.fill(Qt::darkCyan);
    for (const char* text : {"A", "B", "C", "D"})
        mBar->addAction(icon, QLatin1String(text));
    mBar->resize(mBar->sizeHint());
    mBar->actions().at(0)->setToolTip(QStringLiteral("changed once added, still watched"));
    mBar->setDragAndDropEnabled(true);
    mWindow->show();
    QVERIFY(QTest::qWaitForWindowExposed(mWindow));
    if (QGuiApplication::platformName() == QLatin1String("offscreen") &&
        QByteArray(QTest::currentTestFunction()).startsWith("d"))
        QSKIP("drags need a window system; the Xvfb run covers them");
}

void tst_ToolBarDnD::dropReorders_data()
{
    QTest::addColumn<QString>("spot"); // dragged button, target button, half (l r u d)
    QTest::addColumn<QString>("expected");
    QTest::addColumn<int>("emitted");
    QTest::addColumn<QPoint>("move"); // what starts the drag
    QTest::addColumn<int>("buttons");
    const int distance = QApplication::startDragDistance();
    auto row = [distance](const char* inName, const char* inSpot, const char* inExpected,
                          int inEmitted, QPoint inMove = {}, int inButtons = Qt::LeftButton) {
        QTest::newRow(inName) << QString(inSpot) << QString(inExpected) << inEmitted
                              << (inMove.isNull() ? QPoint(distance, 0) : inMove) << inButtons;
    };
    row("A onto D's right half", "ADr", "BCDA", 1);
    row("A onto C's left half", "ACl", "BACD", 1);
    row("D onto B's right half", "DBr", "ABDC", 1);
    row("B onto A's right half", "BAr", "ABCD", 0);
    row("A onto B's left half, rebuilt", "ABl", "ABCD", 1);
    row("vertical, C onto B's upper half", "CBu", "ACBD", 1);
    // Where B's button, hidden, still is (left of C's middle) is no destination.
    row("B hidden, D onto C's left half", "DCl", "ABDC", 1);
    row("moved just the drag distance", "ADr", "BCDA", 1, QPoint(distance - 3, 3));
    row("no drag: one short of the distance", "ADr", "ABCD", 0, QPoint(3 - distance, 2));
    row("no drag: right button", "ADr", "ABCD", 0, QPoint(distance, 0), Qt::RightButton);
    row("no drag: disabled", "ADr", "ABCD", 0);
}

void tst_ToolBarDnD::dropReorders()
{
    QFETCH(QString, spot);
    QFETCH(QString, expected);
    QFETCH(int, emitted);
    QFETCH(QPoint, move);
    QFETCH(int, buttons);

    const QByteArray tag = QTest::currentDataTag();
    mBar->setDragAndDropEnabled(!tag.endsWith("disabled"));
    if (tag.startsWith("vertical")) {
        mBar->setOrientation(Qt::Vertical);
        mBar->resize(mBar->sizeHint());
        QTRY_VERIFY(button(mBar, "D")->y() > button(mBar, "C")->y());
    }
    if (tag.startsWith("B hidden")) {
        const int whereBWas = button(mBar, "B")->x();
        mBar->actions().at(1)->setVisible(false);
        QTRY_COMPARE(button(mBar, "C")->x(), whereBWas);
    }
    RkLogCapture log;
    QSignalSpy spy(mBar, &ZuToolBarDnD::toolButtonOrderChanged);
    QPointer<QToolButton> first = button(mBar, "A");
    QToolButton* target = button(mBar, spot.mid(1, 1));
    const QPoint at = spot[2] == 'l' || spot[2] == 'u'
                          ? QPoint(2, 2)
                          : target->rect().bottomRight() - QPoint(2, 2);
    QCOMPARE(
        drag(button(mBar, spot.left(1)), move, target->mapToGlobal(at), Qt::MouseButtons(buttons)),
        !tag.startsWith("no drag"));
    QCOMPARE(order(mBar), expected);
    QCOMPARE(spy.count(), emitted);
    // A rebuild makes new buttons; the old go once the drag is over, none while still busy.
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QCOMPARE(first.isNull(), emitted > 0);
    QCOMPARE(TestSupport::logLines(log, "DeferredDelete"), QStringList());
}

void tst_ToolBarDnD::changeActionOrder()
{
    QAction stranger(QStringLiteral("X"));
    const QList<QAction*> own = mBar->actions();
    QSignalSpy spy(mBar, &ZuToolBarDnD::toolButtonOrderChanged);
    for (const QList<QAction*>& wrong :
         {own.mid(1), own.mid(0, 3) << &stranger, own.mid(0, 3) << own.at(0), QList<QAction*>()}) {
        mBar->changeActionOrder(wrong);
        QCOMPARE(order(mBar), QStringLiteral("ABCD"));
    }
    QCOMPARE(spy.count(), 0);
    mBar->changeActionOrder(own);
    mBar->changeActionOrder({own.at(3), own.at(2), own.at(1), own.at(0)});
    QCOMPARE(order(mBar), QStringLiteral("DCBA"));
    QCOMPARE(spy.count(), 2);                                     // also for an unchanged order
    QTRY_VERIFY(button(mBar, "A")->x() > button(mBar, "D")->x()); // laid out
    if (QGuiApplication::platformName() != QLatin1String("offscreen")) // new buttons, watched
        QVERIFY(drag(button(mBar, "D"), QPoint(20, 0), button(mBar, "A")->mapToGlobal({40, 5})));

    mBar->removeActions();
    QVERIFY(mBar->actions().isEmpty());
    QAction a, b;
    QVERIFY(ZuToolBarDnD::compareActionsOrderIndepend({}, {}));
    QVERIFY(ZuToolBarDnD::compareActionsOrderIndepend({&a, &b, &a}, {&a, &a, &b}));
    QVERIFY(!ZuToolBarDnD::compareActionsOrderIndepend({&a, &a, &b}, {&a, &b, &b}));
    QVERIFY(!ZuToolBarDnD::compareActionsOrderIndepend({&a, &b}, {&a, &b, &b}));
}

void tst_ToolBarDnD::foreignDropRefused()
{
    // Button data that no drag of this tool bar carries (another process, a forged address).
    struct Probe : ZuToolBarDnD
    {
        using ZuToolBarDnD::checkDropSupported;
    } probe;
    QMimeData data;
    data.setData(QStringLiteral("ZuToolBarDnD/drag-button"), QByteArray::number(1));
    QDropEvent drop(QPointF(1, 1), Qt::MoveAction, &data, Qt::LeftButton, {});
    QVERIFY(!probe.checkDropSupported(&drop, &probe));
    QCOMPARE(drop.dropAction(), Qt::IgnoreAction);
}

ZU_WIDGET_TEST_MAIN(tst_ToolBarDnD)
#include "tst_toolbardnd.moc"
