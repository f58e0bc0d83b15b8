// The value types of the core runtime layer: handles, arrays, strings, versions, file names and
// its thread.
#include "rklib/RkDArray.h"
#include "rklib/RkFilename.h"
#include "rklib/RkHandle.h"
#include "rklib/RkString.h"
#include "rklib/RkThread.h"
#include "rklib/RkVersion.h"

#include <QTemporaryDir>
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
    std::atomic<int> passes{0};
    void run() override
    {
        while (!stop) {
            ++passes;
            msleep(1);
        }
    }
};

} // namespace

class TestRkTypes : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void handlesAndArrays();
    void strings_data();
    void strings();
    void versionOrdering_data();
    void versionOrdering();
    void filenames_data();
    void filenames();
    void filenameOnDisk();
    void threadWaitTimesOut();
};

void TestRkTypes::handlesAndArrays()
{
    int deaths = 0;
    {
        RkHandle<Counted> a(new Counted(&deaths));
        RkHandle<Counted> b = a;
        QCOMPARE(a->refCount(), 2);
        RkHandle<Counted> c(std::move(b));
        QVERIFY(b.isNull() && c.isNotNull());
        c.clear();
        QCOMPARE(a->refCount(), 1);
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

void TestRkTypes::strings_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("from");
    QTest::addColumn<QString>("to");
    QTest::addColumn<QString>("replaced");
    QTest::newRow("several") << "a.b.c"
                             << "."
                             << "::"
                             << "a::b::c";
    QTest::newRow("not rescanned") << "aa"
                                   << "a"
                                   << "aa"
                                   << "aaaa";
    QTest::newRow("empty needle") << "abc"
                                  << ""
                                  << "y"
                                  << "abc";
}

void TestRkTypes::strings()
{
    QFETCH(QString, text);
    QFETCH(QString, from);
    QFETCH(QString, to);
    QFETCH(QString, replaced);
    RkString s(text.toStdString());
    s.replaceSubStr(from.toUtf8().constData(), to.toUtf8().constData());
    QCOMPARE(QString::fromStdString(s.str()), replaced);

    QCOMPARE(RkString(0, "%s-%03d", "x", 7), RkString("x-007"));
    QCOMPARE(RkString::fromInt64(-9000000000LL), RkString("-9000000000"));
    QCOMPARE(RkString("abcabc").index("c", 3), 5);
    QCOMPARE(RkString("abc").index("a", 9), -1);
    RkString sum = RkString("a") + "b";
    sum += "c";
    QCOMPARE(sum.replace('b', '/'), RkString("a/c"));
    QVERIFY(rk_hash("help") != rk_hash("Help"));
    RkStringTokenizer tokens(RkString("  one two\tthree  "));
    QStringList found;
    while (tokens.hasMoreTokens())
        found << QString::fromStdString(tokens.nextToken().str());
    QCOMPARE(found, QStringList({"one", "two", "three"}));
}

void TestRkTypes::versionOrdering_data()
{
    QTest::addColumn<QString>("left");
    QTest::addColumn<QString>("right");
    QTest::addColumn<int>("order");
    QTest::newRow("numeric not text") << "1.10"
                                      << "1.9" << 1;
    QTest::newRow("equal with zero") << "1.2"
                                     << "1.2.0" << 0;
    QTest::newRow("major wins") << "2.0"
                                << "10.0" << -1;
    QTest::newRow("suffix ignored") << "3.1beta"
                                    << "3.1" << 0;
}

void TestRkTypes::versionOrdering()
{
    QFETCH(QString, left);
    QFETCH(QString, right);
    QFETCH(int, order);
    const RkVersion l(left.toStdString());
    const RkVersion r(right.toStdString());
    QCOMPARE(l < r, order < 0);
    QCOMPARE(l == r, order == 0);
    QCOMPARE(r<l, order> 0);
    QCOMPARE(RkVersion("7.4.12").majorVersion(), 7);
    QCOMPARE(RkVersion("7.4.12").minorVersion(), 4);
}

void TestRkTypes::filenames_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("dirname");
    QTest::addColumn<bool>("relative");
    QTest::newRow("absolute") << "/a/b/c.txt"
                              << "/a/b" << false;
    QTest::newRow("bare") << "file"
                          << "." << true;
    QTest::newRow("root child") << "/x"
                                << "/" << false;
    QTest::newRow("trailing slash") << "/a/b/"
                                    << "/a" << false;
    QTest::newRow("windows") << "C:\\data\\x.ini"
                             << "C:\\data" << false;
}

void TestRkTypes::filenames()
{
    QFETCH(QString, path);
    QFETCH(QString, dirname);
    QFETCH(bool, relative);
    RkString dir;
    RkFilename::dirname(path.toUtf8().constData(), dir);
    QCOMPARE(QString::fromStdString(dir.str()), dirname);
    QCOMPARE(RkFilename(path.toUtf8().constData()).isRelative(), relative);
    RkFilename joined("/a/");
    QCOMPARE(joined.appendFile("/b"), RkString("/a/b"));
    QCOMPARE(RkFilename("C:\\x\\y").fixSlashes(), RkString("C:/x/y"));
}

void TestRkTypes::filenameOnDisk()
{
    QTemporaryDir dir;
    const QByteArray from = dir.filePath("a").toLocal8Bit();
    const QByteArray to = dir.filePath("b").toLocal8Bit();
    RkFilename file(from.constData());
    QVERIFY(!file.doesExist());
    QVERIFY(!file.rename(to.constData()));
    QFile(dir.filePath("a")).open(QIODevice::WriteOnly);
    QVERIFY(file.rename(to.constData()));
    QCOMPARE(file, RkString(to.constData()));
    QVERIFY(file.doesExist());
    QVERIFY(!RkFilename(from.constData()).doesExist());
}

void TestRkTypes::threadWaitTimesOut()
{
    Looper looper;
    QVERIFY(looper.wait(0)); // never started
    looper.start();
    QVERIFY(!looper.wait(20));
    QVERIFY(looper.isRunning());
    looper.stop = true;
    QVERIFY(looper.wait(RkThread::Forever));
    QVERIFY(!looper.isRunning());
    QVERIFY(looper.passes > 0);
}

QTEST_GUILESS_MAIN(TestRkTypes)
#include "tst_rktypes.moc"
