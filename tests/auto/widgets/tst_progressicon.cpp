// ZuProgressIcon and ZuAnimatedProgressIcon: frames, their timing, registrations.
#include "zubase/ZuAnimatedProgressIcon.h"
#include "zubase/ZuProgressIcon.h"

#include <QAbstractEventDispatcher>
#include <QAccessible>
#include <QtTest>

#include <private/qhighdpiscaling_p.h>

#include <cmath>

namespace {

// The red channel tells the test frames apart: frame n is (20 n, 255 - 20 n, 7).
int frameOf(const QIcon& inIcon)
{
    if (inIcon.isNull())
        return -1;
    return qRed(inIcon.pixmap(4, 4).toImage().pixel(1, 1)) / 20;
}

// The colour of dot d of a frame, read at the dot's centre.
int greyOfDot(const QImage& inFrame, int inDot)
{
    const double angle = inDot * 3.14159 / 4;
    const qreal ratio = inFrame.devicePixelRatio();
    const QRgb pixel = inFrame.pixel(qRound((12 + 8 * std::cos(angle)) * ratio - 0.5),
                                     qRound((12 + 8 * std::sin(angle)) * ratio - 0.5));
    return qAlpha(pixel) > 100 ? qRed(pixel) : -1;
}

// Event-loop wake-ups in 350 ms: one or two of the loop's own, three or more of a 100 ms timer.
int wakeUps()
{
    int count = 0;
    auto connection = QObject::connect(QAbstractEventDispatcher::instance(),
                                       &QAbstractEventDispatcher::awake, [&count] { ++count; });
    QEventLoop loop;
    QTimer::singleShot(350, &loop, &QEventLoop::quit);
    loop.exec();
    QObject::disconnect(connection);
    return count;
}

struct Recorder
{
    QList<int> frames; // -1: the empty icon
    std::function<void(const QIcon&)> setter()
    {
        return [this](const QIcon& inIcon) {
            frames << frameOf(inIcon);
        };
    }
};

} // namespace

class TstProgressIcon : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    // The first frame after 100 ms is frame 1; eight later the sequence wraps to frame 0.
    void spinnerFrames()
    {
        ZuProgressIcon icon;
        QSignalSpy frames(&icon, &ZuProgressIcon::nextPixmap);
        QElapsedTimer clock;
        clock.start();
        icon.start();
        QTRY_COMPARE_WITH_TIMEOUT(frames.count(), 1, 2000);
        QVERIFY(clock.elapsed() >= 90);
        const QImage first = frames.at(0).at(0).value<QPixmap>().toImage();
        QCOMPARE(first.size(), QSize(24, 24));
        QCOMPARE(greyOfDot(first, 1), 60);
        QTRY_COMPARE_WITH_TIMEOUT(frames.count(), 8, 3000);
        const QImage frame0 = frames.at(7).at(0).value<QPixmap>().toImage();
        QList<int> greys;
        for (int dot = 0; dot < 8; ++dot)
            greys << greyOfDot(frame0, dot);
        QCOMPARE(greys, (QList<int>{60, 200, 200, 200, 200, 120, 100, 80}));

        // Busy while running; stopping keeps the place in the sequence.
        QAccessibleInterface* accessible = QAccessible::queryAccessibleInterface(&icon);
        QCOMPARE(accessible->role(), QAccessible::Animation);
        QVERIFY(accessible->state().busy);
        icon.stop();
        QVERIFY(!accessible->state().busy);
        QTest::qWait(250);
        QCOMPARE(frames.count(), 8);
        icon.start();
        QTRY_COMPARE_WITH_TIMEOUT(frames.count(), 9, 2000);
        QCOMPARE(frames.at(8).at(0).value<QPixmap>().toImage(), first);
    }

    void spinnerAtRatio2()
    {
        QImage frames[2];
        for (int ratio : {1, 2}) {
            QHighDpiScaling::setGlobalFactor(ratio);
            ZuProgressIcon icon;
            QSignalSpy spy(&icon, &ZuProgressIcon::nextPixmap);
            icon.start();
            QTRY_COMPARE_WITH_TIMEOUT(spy.count(), 1, 2000);
            const QPixmap pixmap = spy.at(0).at(0).value<QPixmap>();
            QCOMPARE(pixmap.devicePixelRatio(), qreal(ratio));
            frames[ratio - 1] = pixmap.toImage();
        }
        QHighDpiScaling::setGlobalFactor(1);
        QCOMPARE(frames[1].size(), QSize(48, 48));
        QCOMPARE(greyOfDot(frames[1], 1), 60);
        QVERIFY(frames[1] != frames[0].scaled(48, 48));
        QVERIFY(frames[1] !=
                frames[0].scaled(48, 48, Qt::IgnoreAspectRatio, Qt::SmoothTransformation));
    }

    // Without the host's images every place gets null icons, and nothing breaks.
    void animatorWithoutFrames()
    {
        Q_CLEANUP_RESOURCE(progressframes);
        Recorder place;
        ZuAnimatedProgressIcon::setIconTo(&place, place.setter());
        QTRY_COMPARE_WITH_TIMEOUT(place.frames.count(), 2, 2000);
        ZuAnimatedProgressIcon::removeIconFrom(&place);
        QCOMPARE(place.frames, (QList<int>{-1, -1, -1}));
        Q_INIT_RESOURCE(progressframes);
    }

    // Frames 1, 2, ... to every place in key order; the 13th is frame 1 again. Unknown keys,
    // replaced setters and the last removal behave.
    void animatorFrames()
    {
        Recorder places[2], replaced;
        QList<int> order;
        ZuAnimatedProgressIcon::setIconTo(&places[1], [&](const QIcon& inIcon) {
            order << 1;
            places[1].frames << frameOf(inIcon);
        });
        ZuAnimatedProgressIcon::setIconTo(&places[0], replaced.setter());
        ZuAnimatedProgressIcon::setIconTo(&places[0], [&](const QIcon& inIcon) {
            order << 0;
            places[0].frames << frameOf(inIcon);
        });
        QVERIFY(places[0].frames.isEmpty());            // not called at once
        ZuAnimatedProgressIcon::removeIconFrom(&order); // never registered
        QTRY_COMPARE_WITH_TIMEOUT(places[0].frames.count(), 13, 5000);
        QCOMPARE(places[0].frames, (QList<int>{1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 0, 1}));
        QCOMPARE(order.mid(0, 4), (QList<int>{0, 1, 0, 1}));
        QVERIFY(replaced.frames.isEmpty());
        const int busy = wakeUps();
        QVERIFY2(busy >= 4, qPrintable(QString::number(busy)));

        ZuAnimatedProgressIcon::removeIconFrom(&places[0]);
        ZuAnimatedProgressIcon::removeIconFrom(&places[1]);
        QCOMPARE(places[1].frames.last(), -1);
        const int calls = places[1].frames.count();
        const int idle = wakeUps();
        QVERIFY2(idle <= 2, qPrintable(QString::number(idle))); // the timer is stopped
        QCOMPARE(places[1].frames.count(), calls);
        ZuAnimatedProgressIcon::setIconTo(&places[1], places[1].setter());
        QTRY_COMPARE_WITH_TIMEOUT(places[1].frames.count(), calls + 1, 2000);
        QCOMPARE(places[1].frames.last(), 1); // a restart begins at frame 1
        ZuAnimatedProgressIcon::removeIconFrom(&places[1]);
    }

    // Setters that register or unregister keys while a frame is handed out.
    void setterChangesRegistrations()
    {
        Recorder places[4];
        int selfRemovals = 0;
        // places[0] removes itself and places[2], and adds places[3] (first called next frame).
        ZuAnimatedProgressIcon::setIconTo(&places[0], [&](const QIcon& inIcon) {
            places[0].frames << frameOf(inIcon);
            if (inIcon.isNull())
                ++selfRemovals;
            else {
                ZuAnimatedProgressIcon::removeIconFrom(&places[2]);
                ZuAnimatedProgressIcon::setIconTo(&places[3], places[3].setter());
                ZuAnimatedProgressIcon::removeIconFrom(&places[0]);
            }
        });
        for (int i : {1, 2})
            ZuAnimatedProgressIcon::setIconTo(&places[i], places[i].setter());
        QTRY_COMPARE_WITH_TIMEOUT(places[1].frames.count(), 1, 2000);
        QCOMPARE(places[0].frames, (QList<int>{1, -1}));
        QCOMPARE(selfRemovals, 1);
        QCOMPARE(places[2].frames, (QList<int>{-1}));
        QVERIFY(places[3].frames.isEmpty());
        QTRY_COMPARE_WITH_TIMEOUT(places[3].frames.count(), 1, 2000);
        QCOMPARE(places[3].frames, (QList<int>{2}));
        for (int i : {1, 3})
            ZuAnimatedProgressIcon::removeIconFrom(&places[i]);
    }
};

QTEST_MAIN(TstProgressIcon)
#include "tst_progressicon.moc"
