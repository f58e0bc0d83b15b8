// The value types of the core runtime layer: handles, arrays, strings, versions, file names and
// its thread.
#include "rklib/RkDArray.h"
#include "rklib/RkFilename.h"
#include "rklib/RkHandle.h"
#include "rklib/RkString.h"
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

struct Looper : RkThread
{
    std::atomic<bool> stop{false};
    void run() override
    {
        while (!stop)
            msleep(1);
    }
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
        QVERIFY(b.isNull() && c.isNotNull());
        QCOMPARE(a->refCount(), 2);
        c.clear();
        a = a; // self-assignment keeps the object
        a = RkHandle<Counted>(new Counted(&deaths));
        QCOMPARE(deaths, 1);

        RkDArray<RkHandle<Counted>> array;
        for (int i = 0; i < 1000; ++i)
            array.append(RkHandle<Counted>(new Counted(&deaths)));
        QVERIFY(array.capacity() >= 1000 && array.capacity() < 2048); // doubling
        array.append(array[0]); // an element of the array itself, across a reallocation
        QCOMPARE(array[1000].get(), array[0].get());
        RkDArray<RkHandle<Counted>> copy = array;
        QCOMPARE(copy[5]->refCount(), 2);
        array.removeAt(5);
        QCOMPARE(array[5].get(), copy[6].get());
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
    QCOMPARE(order("2.0", "10.0"), QList<bool>({true, false, false}));
    QCOMPARE(order("3.1beta", "3.1"), QList<bool>({false, true, false}));
    QCOMPARE(RkVersion("7.4.12").majorVersion() * 10 + RkVersion("7.4.12").minorVersion(), 74);

    const auto dirname = [](const char* inPath) {
        RkString dir;
        RkFilename::dirname(inPath, dir);
        return QString::fromStdString(dir.str()) + (RkFilename(inPath).isRelative() ? " r" : "");
    };
    QCOMPARE(dirname("/a/b/c.txt"), "/a/b");
    QCOMPARE(dirname("file"), ". r");
    QCOMPARE(dirname("C:\\data\\x.ini"), "C:\\data");
    RkFilename joined("C:\\a\\");
    QCOMPARE(joined.appendFile("/b").fixSlashes(), RkString("C:/a/b"));
}

void TestRkTypes::threadWaitTimesOut()
{
    Looper looper;
    QVERIFY(looper.wait(0)); // never started
    looper.start();
    QVERIFY(!looper.wait(20) && looper.isRunning());
    looper.stop = true;
    QVERIFY(looper.wait(RkThread::Forever) && !looper.isRunning());
}

QTEST_GUILESS_MAIN(TestRkTypes)
#include "tst_rktypes.moc"
