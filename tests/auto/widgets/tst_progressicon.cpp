// ZuProgressIcon and ZuAnimatedProgressIcon: frames, their timing, registrations.
#include "zubase/ZuAnimatedProgressIcon.h"
#include "zubase/ZuProgressIcon.h"

#include <QAbstractEventDispatcher>
#include <QAccessible>
#include <QtTest>

#include <private/qhighdpiscaling_p.h>

#include <cmath>

namespace {

// The greys of the dots of a spinner frame, read at their centres (-1: not a grey).
QList<int> greys(const QSignalSpy& inFrames, int inIndex)
{
    const QImage frame = inFrames.at(inIndex).at(0).value<QPixmap>().toImage();
    QList<int> list;
    for (int dot = 0; dot < 8; ++dot) {
        const double angle = dot * 3.14159 / 4, ratio = frame.devicePixelRatio();
        const QRgb pixel = frame.pixel(qRound((12 + 8 * std::cos(angle)) * ratio - 0.5),
                                       qRound((12 + 8 * std::sin(angle)) * ratio - 0.5));
        list << (qRed(pixel) == qGreen(pixel) && qGreen(pixel) == qBlue(pixel) ? qRed(pixel) : -1);
    }
    return list;
}

// Event-loop wake-ups in 350 ms: one or two of the loop's own, three more of a 100 ms timer.
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

char sKeys[4]; // places of icons
QString sLog;  // "<place>:<frame> " per setter call; the test frame n has red 20
               // n, -1: empty

std::function<void(const QIcon&)> logger(int inPlace)
{
    return [inPlace](const QIcon& inIcon) {
        const int frame =
            inIcon.isNull() ? -1 : qRed(inIcon.pixmap(4, 4).toImage().pixel(1, 1)) / 20;
        sLog += QString("%1:%2 ").arg(inPlace).arg(frame);
    };
}

} // namespace

class TstProgressIcon : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init() { sLog.clear(); }
    void cleanup() { QHighDpiScaling::setGlobalFactor(1); }

    // After 100 ms frame 1, after eight frame 0, drawn at the screens' ratio as it is then;
    // stopping keeps the place in the sequence. Busy while running.
    void spinner()
    {
        for (int ratio : {2, 1}) {
            QHighDpiScaling::setGlobalFactor(ratio);
            ZuProgressIcon icon;
            QSignalSpy frames(&icon, &ZuProgressIcon::nextPixmap);
            QElapsedTimer clock;
            clock.start();
            icon.start();
            QTRY_COMPARE_WITH_TIMEOUT(frames.count(), 1, 2000);
            QVERIFY(clock.elapsed() >= 90);
            QTRY_COMPARE_WITH_TIMEOUT(frames.count(), 8, 3000);
            QCOMPARE(frames.at(0).at(0).value<QPixmap>().size(), QSize(24, 24) * ratio);
            QCOMPARE(greys(frames, 0), (QList<int>{80, 60, 200, 200, 200, 200, 120, 100}));
            QCOMPARE(greys(frames, 7), (QList<int>{60, 200, 200, 200, 200, 120, 100, 80}));
            if (ratio == 2) { // drawn anew, not enlarged
                const QImage first = frames.at(0).at(0).value<QPixmap>().toImage();
                const QImage small = first.scaled(24, 24);
                QVERIFY(first != small.scaled(48, 48));
                QVERIFY(first !=
                        small.scaled(48, 48, Qt::IgnoreAspectRatio, Qt::SmoothTransformation));
            }
            QAccessibleInterface* accessible = QAccessible::queryAccessibleInterface(&icon);
            QVERIFY(accessible->role() == QAccessible::Animation && accessible->state().busy);
            icon.stop();
            QVERIFY(!accessible->state().busy);
            QTest::qWait(250);
            QHighDpiScaling::setGlobalFactor(3 - ratio);
            icon.start();
            QTRY_COMPARE_WITH_TIMEOUT(frames.count(), 9, 2000);
            QCOMPARE(frames.at(8).at(0).value<QPixmap>().devicePixelRatio(), qreal(3 - ratio));
            QCOMPARE(greys(frames, 8), greys(frames, 0));
        }
    }

    // Without the host's images every place gets null icons, and nothing breaks.
    void animatorWithoutFrames()
    {
        Q_CLEANUP_RESOURCE(progressframes);
        ZuAnimatedProgressIcon::setIconTo(sKeys, logger(0));
        QTRY_COMPARE_WITH_TIMEOUT(sLog, "0:-1 0:-1 ", 2000);
        ZuAnimatedProgressIcon::removeIconFrom(sKeys);
        Q_INIT_RESOURCE(progressframes);
    }

    // Frames 1, 2, ... to every place in key order, the 13th is frame 1 again; unknown keys and
    // replaced setters change nothing; the last removal stops the timer.
    void animatorFrames()
    {
        ZuAnimatedProgressIcon::setIconTo(sKeys + 1, logger(1));
        ZuAnimatedProgressIcon::setIconTo(sKeys, logger(9));
        ZuAnimatedProgressIcon::setIconTo(sKeys, logger(0)); // replaces 9
        QCOMPARE(sLog, "");                                  // not called at once
        ZuAnimatedProgressIcon::removeIconFrom(sKeys + 3);
        QTRY_COMPARE_WITH_TIMEOUT(sLog.count(' '), 26, 5000);
        QCOMPARE(sLog, "0:1 1:1 0:2 1:2 0:3 1:3 0:4 1:4 0:5 1:5 0:6 1:6 0:7 1:7 "
                       "0:8 1:8 0:9 1:9 "
                       "0:10 1:10 0:11 1:11 0:0 1:0 0:1 1:1 ");
        const int busy = wakeUps();
        QVERIFY2(busy >= 4, qPrintable(QString::number(busy)));
        sLog.clear();
        ZuAnimatedProgressIcon::removeIconFrom(sKeys);
        ZuAnimatedProgressIcon::removeIconFrom(sKeys + 1);
        const int idle = wakeUps();
        QVERIFY2(idle <= 2,
                 qPrintable(QString::number(idle))); // the timer is stopped
        ZuAnimatedProgressIcon::setIconTo(sKeys + 1, logger(1));
        QTRY_COMPARE_WITH_TIMEOUT(sLog, "0:-1 1:-1 1:1 ",
                                  2000); // a restart begins at frame 1
        ZuAnimatedProgressIcon::removeIconFrom(sKeys + 1);
    }

    // A setter that removes itself and another place and adds a third while it is called.
    void setterChangesRegistrations()
    {
        ZuAnimatedProgressIcon::setIconTo(sKeys, [](const QIcon& inIcon) {
            logger(0)(inIcon);
            if (!inIcon.isNull()) {
                ZuAnimatedProgressIcon::removeIconFrom(sKeys + 2);
                ZuAnimatedProgressIcon::setIconTo(sKeys + 3, logger(3));
                ZuAnimatedProgressIcon::removeIconFrom(sKeys);
            }
        });
        ZuAnimatedProgressIcon::setIconTo(sKeys + 1, logger(1));
        ZuAnimatedProgressIcon::setIconTo(sKeys + 2, logger(2));
        QTRY_COMPARE_WITH_TIMEOUT(sLog, "0:1 2:-1 0:-1 1:1 1:2 3:2 ", 2000);
        ZuAnimatedProgressIcon::removeIconFrom(sKeys + 1);
        ZuAnimatedProgressIcon::removeIconFrom(sKeys + 3);
    }
};

QTEST_MAIN(TstProgressIcon)
#include "tst_progressicon.moc"
