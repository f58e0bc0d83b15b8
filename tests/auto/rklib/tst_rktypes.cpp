// The value types of the core runtime layer that the library builds on: handles in arrays,
// versions, file names and its thread.
#include "rklib/RkDArray.h"
#include "rklib/RkFilename.h"
#include "rklib/RkHandle.h"
#include "rklib/RkThread.h"
#include "rklib/RkVersion.h"

#include <QtTest>

#include <atomic>

namespace {

struct Counted : RkHandable
{
    explicit Counted(int* inDeaths) : mDeaths(inDeaths) {}
    ~Counted() override { ++*mDeaths; }
    int* mDeaths;
};

} // namespace

class TestRkTypes : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void handlesAndArrays();
    void versionsAndFilenames();
    void threadWaitTimesOut();
};

void TestRkTypes::handlesAndArrays()
{
    int deaths = 0;
    {
        RkHandle<Counted> a(new Counted(&deaths));
        RkHandle<Counted> b = a;
        RkHandle<Counted> c(std::move(b));
        QVERIFY(b.isNull() && c.isNotNull() && a->refCount() == 2);
        a = a; // self-assignment keeps the object
        a = RkHandle<Counted>(new Counted(&deaths));
        c.clear();
        QCOMPARE(deaths, 1);

        RkDArray<RkHandle<Counted>> array;
        for (int i = 0; i < 1000; ++i)
            array.append(RkHandle<Counted>(new Counted(&deaths)));
        QVERIFY(array.capacity() >= 1000 && array.capacity() < 2048); // doubling
        array.append(array[0]); // an element of the array itself, across a reallocation
        RkDArray<RkHandle<Counted>> copy = array;
        array.removeAt(5);
        QVERIFY(array[999].get() == copy[0].get() && array[5].get() == copy[6].get());
        QCOMPARE(copy[6]->refCount(), 2);
        copy.clear();
        QCOMPARE(deaths, 2);
    }
    QCOMPARE(deaths, 1002);
}

void TestRkTypes::versionsAndFilenames()
{
    // Components compare as numbers; missing ones count as 0, text after the digits not at all.
    const auto order = [](const char* inLeft, const char* inRight) {
        const RkVersion left(inLeft), right(inRight);
        return QList<bool>({left < right, left == right, right < left});
    };
    QCOMPARE(order("1.10", "1.9"), QList<bool>({false, false, true}));
    QCOMPARE(order("1.2", "1.2.0"), QList<bool>({false, true, false}));
    QCOMPARE(order("3.1beta", "3.1"), QList<bool>({false, true, false}));
    QCOMPARE(RkVersion("7.4.12").majorVersion() * 10 + RkVersion("7.4.12").minorVersion(), 74);

    RkString dir;
    RkFilename::dirname("C:\\data\\x.ini", dir);
    QCOMPARE(dir, RkString("C:\\data"));
    RkFilename::dirname("file", dir);
    QVERIFY(dir == RkString(".") && RkFilename("file").isRelative() &&
            !RkFilename("/x").isRelative());
    RkFilename joined("C:\\a\\");
    QCOMPARE(joined.appendFile("/b").fixSlashes(), RkString("C:/a/b"));
}

void TestRkTypes::threadWaitTimesOut()
{
    struct Looper : RkThread
    {
        std::atomic<bool> stop{false};
        void run() override
        {
            while (!stop)
                msleep(1);
        }
    } looper;
    QVERIFY(looper.wait(0)); // never started
    looper.start();
    QVERIFY(!looper.wait(20) && looper.isRunning());
    looper.stop = true;
    QVERIFY(looper.wait(RkThread::Forever) && !looper.isRunning());
}

QTEST_GUILESS_MAIN(TestRkTypes)
#include "tst_rktypes.moc"
