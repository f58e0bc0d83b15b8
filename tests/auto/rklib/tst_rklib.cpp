// The core runtime layer: failure records, the log, handles, arrays, versions, file names.
#include "rklib/RkCheck.h"
#include "rklib/RkDArray.h"
#include "rklib/RkFilename.h"
#include "rklib/RkHandle.h"
#include "rklib/RkLogFile.h"
#include "rklib/RkString.h"
#include "rklib/RkThread.h"
#include "rklib/RkVersion.h"
#include "rklib/Tz.h"

#include <QDir>
#include <QTemporaryDir>
#include <QtTest>

#include <atomic>
#include <cerrno>
#include <set>
#include <thread>

#include <fcntl.h>
#include <unistd.h>

namespace {

struct Counted : RkHandable
{
    explicit Counted(int* inDeaths) : mDeaths(inDeaths) {}
    ~Counted() override { ++*mDeaths; }
    int* mDeaths;
};

namespace Family {
struct Widget
{
    static RkResult check(int inValue)
    {
        return RK_CHECK(inValue > 0, "inValue>0", "Internal Error");
    }
    static RkResult equal(int inValue) { return RK_CHECK_EQ(inValue, 1, QStringLiteral("count")); }
    static RkResult differ(const QString& inValue)
    {
        return RK_CHECK_NE(inValue, QStringLiteral("x"), "must not be x");
    }
};
} // namespace Family

std::vector<std::pair<RkLogLevel, std::string>> sCallbackLines;
void recordCallback(RkLogLevel inLevel, const RkString& inText)
{
    sCallbackLines.emplace_back(inLevel, inText.str());
}

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

class TestRkLib : public QObject
{
    Q_OBJECT

private slots:
    void checkRecords_data();
    void checkRecords();
    void checkMessageOnlyBuiltOnFailure();
    void accumulateAndMakeBad();
    void qualifiedFunctionName_data();
    void qualifiedFunctionName();
    void failReportsEachRecord();
    void failWinAndLogWinFuncLogErrno();
    void writeCallbackLevelsAndDisabler();
    void logFromManyThreadsKeepsLines();
    void logFileFromEnvironmentFormat();
    void handleCounting();
    void arrayGrowthAndOrder();
    void arrayOfHandlesReleases();
    void stringHelpers_data();
    void stringHelpers();
    void tokenizer();
    void versionOrdering_data();
    void versionOrdering();
    void filenameHelpers_data();
    void filenameHelpers();
    void filenameExistsAndRename();
    void threadWaitTimesOut();
};

void TestRkLib::checkRecords_data()
{
    QTest::addColumn<int>("which");
    QTest::addColumn<bool>("bad");
    QTest::addColumn<QString>("message");
    QTest::addColumn<QString>("detail");
    QTest::newRow("cond holds") << 0 << false << ""
                                << "";
    QTest::newRow("cond fails") << 1 << true << "Internal Error"
                                << "cond[inValue>0]";
    QTest::newRow("eq holds") << 2 << false << ""
                              << "";
    QTest::newRow("eq fails") << 3 << true << "count"
                              << "val[7]  exp[1]";
    QTest::newRow("ne holds") << 4 << false << ""
                              << "";
    QTest::newRow("ne fails") << 5 << true << "must not be x"
                              << "val[x]  notexp[x]";
}

void TestRkLib::checkRecords()
{
    QFETCH(int, which);
    QFETCH(bool, bad);
    QFETCH(QString, message);
    QFETCH(QString, detail);
    RkResult res;
    switch (which) {
    case 0:
        res = Family::Widget::check(3);
        break;
    case 1:
        res = Family::Widget::check(-3);
        break;
    case 2:
        res = Family::Widget::equal(1);
        break;
    case 3:
        res = Family::Widget::equal(7);
        break;
    case 4:
        res = Family::Widget::differ("y");
        break;
    case 5:
        res = Family::Widget::differ("x");
        break;
    }
    QCOMPARE(res.isBad(), bad);
    QCOMPARE(res.isOk(), !bad);
    if (!bad) {
        QVERIFY(res.records().empty());
        return;
    }
    QCOMPARE(int(res.records().size()), 1);
    const RkResult::Record& record = res.records().front();
    QCOMPARE(int(record.code), 2);
    QCOMPARE(QString::fromStdString(record.message), message);
    QCOMPARE(QString::fromStdString(record.detail), detail);
    QVERIFY2(QString::fromStdString(record.where).startsWith("tst_rklib:"), record.where.c_str());
    QVERIFY2(QString::fromStdString(record.where)
                 .endsWith("Family::Widget::" + QString(which == 1   ? "check"
                                                        : which == 3 ? "equal"
                                                                     : "differ")),
             record.where.c_str());
    QVERIFY(record.line > 0);
}

void TestRkLib::checkMessageOnlyBuiltOnFailure()
{
    int built = 0;
    auto message = [&built]() {
        ++built;
        return std::string("m");
    };
    const int one = 1;
    QVERIFY(RK_CHECK(one == 1, "one==1", message()).isOk());
    QVERIFY(RK_CHECK_EQ(one, 1, message()).isOk());
    QCOMPARE(built, 0);
    QVERIFY(RK_CHECK_NE(one, 1, message()).isBad());
    QCOMPARE(built, 1);
}

void TestRkLib::accumulateAndMakeBad()
{
    RkResult res;
    res << RkResult();
    QVERIFY(res.isOk());
    res << RkResult(RkResult::Error, 10, "a:f", "first", "cond[a]");
    res << RkResult(RkResult::Error, 20, "b:g", "second", "cond[b]");
    QVERIFY(res.isBad());
    QCOMPARE(int(res.records().size()), 2);
    QCOMPARE(res.records()[0].message, std::string("first"));
    QCOMPARE(res.records()[1].line, 20);
    QCOMPARE(res.toString(), std::string("a:f(10): first  cond[a]\nb:g(20): second  cond[b]"));

    RkResult made;
    made.makeBad(1);
    QVERIFY(made.isBad());
    QVERIFY(made.records().empty());

    const RkResult twoTexts(RkResult::Error, "", "");
    QVERIFY(twoTexts.isBad());
    QCOMPARE(twoTexts.records().front().message, std::string());
}

void TestRkLib::qualifiedFunctionName_data()
{
    QTest::addColumn<QString>("pretty");
    QTest::addColumn<QString>("name");
    QTest::newRow("static member")
        << "static RkResult ZuBase::Command::create(RkHandle<ZuBase::Command>&, const QString&)"
        << "ZuBase::Command::create";
    QTest::newRow("free function") << "RkResult ZuBase::File::readAll(const QString&, QByteArray&)"
                                   << "ZuBase::File::readAll";
    QTest::newRow("template return") << "QMap<QString, int> Zu::Foo::bar(int)"
                                     << "Zu::Foo::bar";
    QTest::newRow("constructor") << "ZuBase::Pipe::Pipe(const QString&)"
                                 << "ZuBase::Pipe::Pipe";
    QTest::newRow("operator call") << "bool Zu::Less::operator()(int) const"
                                   << "Zu::Less::operator()";
    QTest::newRow("lambda inside") << "ZuBase::Process::start(bool)::<lambda()>"
                                   << "ZuBase::Process::start";
    QTest::newRow("pointer return") << "const char* ZuX::name() const"
                                    << "ZuX::name";
}

void TestRkLib::qualifiedFunctionName()
{
    QFETCH(QString, pretty);
    QFETCH(QString, name);
    QCOMPARE(QString::fromStdString(Rk::qualifiedFunctionName(pretty.toUtf8().constData())), name);
    QCOMPARE(QString::fromStdString(Rk::sourceFamily("/work/x/src/core/zubase/File.cpp")),
             QStringLiteral("src/core/zubase/File"));
    QCOMPARE(
        QString::fromStdString(Rk::sourceFamily("../../../../src/core/zubase/system/Pipe.cpp")),
        QStringLiteral("src/core/zubase/Pipe"));
}

void TestRkLib::failReportsEachRecord()
{
    RkLogCapture capture;
    QVERIFY(!Tz::fail(RkResult()));
    QVERIFY(capture.entries().empty());

    RkResult res(RkResult::Error, 12, "src/core/zubase/File:ZuBase::File::readAll",
                 "Internal Error", "cond[file.exists()]");
    res << RkResult(RkResult::Error, 13, "w", "m", "d");
    QVERIFY(Tz::fail(res));
    const auto entries = capture.entries();
    QCOMPARE(int(entries.size()), 2);
    QCOMPARE(entries[0].level, RkLogError);
    QCOMPARE(entries[0].text,
             std::string("src/core/zubase/File:ZuBase::File::readAll(12): Internal Error  "
                         "cond[file.exists()]"));
    QCOMPARE(entries[1].text, std::string("w(13): m  d"));
}

void TestRkLib::failWinAndLogWinFuncLogErrno()
{
    RkLogCapture capture;
    QVERIFY(Tz::failWin(RkResult(RkResult::Error, 5, "w", "::ReadFile", "cond[bret]"), ENOENT));
    QVERIFY(!Tz::logWinFunc(1, 1, "::RevertToSelf", nullptr, true));
    QVERIFY(Tz::logWinFunc(0, 1, "::LogonUser", "user", true, EACCES));
    const auto texts = capture.texts("Tz");
    QCOMPARE(int(texts.size()), 4);
    QCOMPARE(texts[0], std::string("w(5): ::ReadFile  cond[bret]"));
    QCOMPARE(texts[1], std::string("last error 2: No such file or directory"));
    QCOMPARE(texts[2], std::string("::RevertToSelf -> ok"));
    QCOMPARE(texts[3], std::string("::LogonUser user -> 0, last error 13: Permission denied"));
}

void TestRkLib::writeCallbackLevelsAndDisabler()
{
    sCallbackLines.clear();
    RkLogFile& log = getTheLogInstance();
    log.setWriteCallback(&recordCallback, RkLogWarning);
    log.tracef(RkLogInfo, "T", "info %d", 1);
    log.warnf("warn %s", "x");
    {
        RkLogFileWriteCallbackDisabler disabler;
        disabler.disableWriteCallback();
        log.errorf("hidden");
        // Another thread is not affected by this thread's disabler.
        std::thread([&log] { log.errorf("other thread"); }).join();
        disabler.restoreWriteCallback();
        log.errorf("shown");
        disabler.disableWriteCallback();
    } // restored by the destructor
    log.errorf("after scope");
    log.setWriteCallback(nullptr, RkLogOff);
    log.errorf("removed");
    const std::vector<std::pair<RkLogLevel, std::string>> expected = {{RkLogWarning, "warn x"},
                                                                      {RkLogError, "other thread"},
                                                                      {RkLogError, "shown"},
                                                                      {RkLogError, "after scope"}};
    QCOMPARE(sCallbackLines, expected);
}

void TestRkLib::logFromManyThreadsKeepsLines()
{
    RkLogCapture capture;
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([t] {
            for (int i = 0; i < 250; ++i)
                getTheLogInstance().tracef(RkLogDebug, "Stress", "t%d line %d", t, i);
        });
    }
    for (auto& thread : threads)
        thread.join();
    const auto texts = capture.texts("Stress");
    QCOMPARE(int(texts.size()), 1000);
    std::set<std::string> unique(texts.begin(), texts.end());
    QCOMPARE(int(unique.size()), 1000);
}

void TestRkLib::logFileFromEnvironmentFormat()
{
    // A file and a level from the environment; one call is one line, whatever the text holds.
    QTemporaryDir dir;
    const QString path = dir.filePath("log.txt");
    qputenv("ZUBASE_LOG_FILE", path.toLocal8Bit());
    qputenv("ZUBASE_LOG_LEVEL", "2");
    bool closedOnExec = false;
    {
        RkLogFile log;
        QCOMPARE(log.outputLevel(), RkLogWarning);
        log.printf("not written");
        log.tracef(RkLogWarning, "ZuBase", "value [%s]", "a\nE Tz: forged\r\x1b[2J\tb");
        // The children the library starts must not inherit the log file.
        for (const QFileInfo& fd :
             QDir("/proc/self/fd").entryInfoList(QDir::Files | QDir::System)) {
            if (fd.symLinkTarget() == path)
                closedOnExec = fcntl(fd.fileName().toInt(), F_GETFD) & FD_CLOEXEC;
        }
    }
    QVERIFY(closedOnExec);
    QFile file(path);
    QVERIFY(file.open(QIODevice::ReadOnly));
    const QStringList lines = QString::fromUtf8(file.readAll()).split('\n', Qt::SkipEmptyParts);
    QCOMPARE(lines.size(), 1);
    QVERIFY2(QRegularExpression(R"(^\d{4}-\d\d-\d\d \d\d:\d\d:\d\d\.\d{3} \[\d+\] W ZuBase: )")
                 .match(lines[0])
                 .hasMatch(),
             qPrintable(lines[0]));
    QVERIFY2(lines[0].endsWith("value [a\\nE Tz: forged\\r\\x1b[2J\tb]"), qPrintable(lines[0]));

    // What cannot be used is said once on standard error, and the defaults stay.
    qputenv("ZUBASE_LOG_FILE", dir.filePath("missing/log.txt").toLocal8Bit());
    qputenv("ZUBASE_LOG_LEVEL", "1x");
    const QString errors = dir.filePath("stderr.txt");
    std::fflush(stderr);
    const int savedStderr = dup(STDERR_FILENO);
    QFile errorFile(errors);
    QVERIFY(errorFile.open(QIODevice::WriteOnly));
    dup2(errorFile.handle(), STDERR_FILENO);
    RkLogLevel level = RkLogOff;
    {
        RkLogFile first;
        RkLogFile second;
        level = first.outputLevel();
        first.printf("to standard error");
    }
    std::fflush(stderr);
    dup2(savedStderr, STDERR_FILENO);
    close(savedStderr);
    errorFile.close();
    qunsetenv("ZUBASE_LOG_FILE");
    qunsetenv("ZUBASE_LOG_LEVEL");
    QCOMPARE(level, RkLogInfo);
    QVERIFY(errorFile.open(QIODevice::ReadOnly));
    const QStringList said = QString::fromUtf8(errorFile.readAll()).split('\n', Qt::SkipEmptyParts);
    QCOMPARE(said.size(), 3);
    QCOMPARE(said[0], "zubase: ZUBASE_LOG_LEVEL \"1x\" is no level from 0 to 5; the log keeps "
                      "level 1");
    QCOMPARE(said[1], "zubase: cannot open ZUBASE_LOG_FILE \"" + dir.filePath("missing/log.txt") +
                          "\" (No such file or directory); the log goes to standard error");
    QVERIFY(said[2].endsWith(" I to standard error"));
}

void TestRkLib::handleCounting()
{
    int deaths = 0;
    {
        RkHandle<Counted> a(new Counted(&deaths));
        QCOMPARE(a->refCount(), 1);
        RkHandle<Counted> b = a;
        QCOMPARE(a->refCount(), 2);
        RkHandle<Counted> c(std::move(b));
        QVERIFY(b.isNull());
        QCOMPARE(a->refCount(), 2);
        c.clear();
        QCOMPARE(a->refCount(), 1);
        QCOMPARE(deaths, 0);
        a = RkHandle<Counted>(new Counted(&deaths));
        QCOMPARE(deaths, 1);
        a = a; // self-assignment keeps the object
        QCOMPARE(deaths, 1);
        QVERIFY(a.isNotNull());
    }
    QCOMPARE(deaths, 2);
}

void TestRkLib::arrayGrowthAndOrder()
{
    RkDArray<int> array;
    QCOMPARE(array.size(), 0);
    for (int i = 0; i < 1000; ++i)
        array.append(i);
    QCOMPARE(array.size(), 1000);
    QVERIFY(array.capacity() >= 1000);
    QVERIFY(array.capacity() < 2048); // doubling, not one allocation per element
    for (int i = 0; i < 1000; ++i)
        QCOMPARE(array[i], i);
    array.append(array[0]); // an element of the array itself, across a reallocation
    QCOMPARE(array[1000], 0);
    array.removeAt(0);
    QCOMPARE(array[0], 1);
    RkDArray<int> copy = array;
    array.clear();
    QCOMPARE(copy.size(), 1000);
    QCOMPARE(copy[999], 0);
}

void TestRkLib::arrayOfHandlesReleases()
{
    int deaths = 0;
    {
        RkDArray<RkHandle<Counted>> array;
        for (int i = 0; i < 100; ++i)
            array.append(RkHandle<Counted>(new Counted(&deaths)));
        RkDArray<RkHandle<Counted>> copy = array;
        QCOMPARE(copy[5]->refCount(), 2);
        array.removeAt(5);
        QCOMPARE(deaths, 0);
        copy.clear();
        QCOMPARE(deaths, 1);
    }
    QCOMPARE(deaths, 100);
}

void TestRkLib::stringHelpers_data()
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
    QTest::newRow("none") << "abc"
                          << "x"
                          << "y"
                          << "abc";
    QTest::newRow("empty needle") << "abc"
                                  << ""
                                  << "y"
                                  << "abc";
}

void TestRkLib::stringHelpers()
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
    QCOMPARE(RkString("abc").index("z", 0), -1);
    QCOMPARE(RkString("abc").index("a", 9), -1);
    RkString sum = RkString("a") + "b";
    sum += "c";
    QCOMPARE(sum.replace('b', '/'), RkString("a/c"));
    QCOMPARE(rk_hash("help"), rk_hash("help"));
    QVERIFY(rk_hash("help") != rk_hash("Help"));
}

void TestRkLib::tokenizer()
{
    RkStringTokenizer tokens(RkString("  one two\tthree  "));
    QStringList found;
    while (tokens.hasMoreTokens())
        found << QString::fromStdString(tokens.nextToken().str());
    QCOMPARE(found, QStringList({"one", "two", "three"}));
    QVERIFY(!RkStringTokenizer(RkString("   ")).hasMoreTokens());
}

void TestRkLib::versionOrdering_data()
{
    QTest::addColumn<QString>("left");
    QTest::addColumn<QString>("right");
    QTest::addColumn<int>("order");
    QTest::newRow("numeric not text") << "1.10"
                                      << "1.9" << 1;
    QTest::newRow("equal with zero") << "1.2"
                                     << "1.2.0" << 0;
    QTest::newRow("patch") << "7.4.12"
                           << "7.4.2" << 1;
    QTest::newRow("major wins") << "2.0"
                                << "10.0" << -1;
    QTest::newRow("suffix ignored") << "3.1beta"
                                    << "3.1" << 0;
    QTest::newRow("empty") << ""
                           << "0" << 0;
}

void TestRkLib::versionOrdering()
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

void TestRkLib::filenameHelpers_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("dirname");
    QTest::addColumn<bool>("relative");
    QTest::newRow("absolute") << "/a/b/c.txt"
                              << "/a/b" << false;
    QTest::newRow("relative") << "a/b"
                              << "a" << true;
    QTest::newRow("bare") << "file"
                          << "." << true;
    QTest::newRow("root child") << "/x"
                                << "/" << false;
    QTest::newRow("trailing slash") << "/a/b/"
                                    << "/a" << false;
    QTest::newRow("windows") << "C:\\data\\x.ini"
                             << "C:\\data" << false;
}

void TestRkLib::filenameHelpers()
{
    QFETCH(QString, path);
    QFETCH(QString, dirname);
    QFETCH(bool, relative);
    RkString dir;
    RkFilename::dirname(path.toUtf8().constData(), dir);
    QCOMPARE(QString::fromStdString(dir.str()), dirname);
    QCOMPARE(RkFilename(path.toUtf8().constData()).isRelative(), relative);

    RkFilename joined("/a/");
    joined.appendFile("/b");
    QCOMPARE(joined, RkString("/a/b"));
    RkFilename slashes("C:\\x\\y");
    QCOMPARE(slashes.fixSlashes(), RkString("C:/x/y"));
}

void TestRkLib::filenameExistsAndRename()
{
    QTemporaryDir dir;
    const QByteArray from = dir.filePath("a").toLocal8Bit();
    const QByteArray to = dir.filePath("b").toLocal8Bit();
    RkFilename file(from.constData());
    QVERIFY(!file.doesExist());
    QVERIFY(!file.rename(to.constData()));
    QFile(dir.filePath("a")).open(QIODevice::WriteOnly);
    QVERIFY(file.doesExist());
    QVERIFY(file.rename(to.constData()));
    QCOMPARE(file, RkString(to.constData()));
    QVERIFY(file.doesExist());
    QVERIFY(!RkFilename(from.constData()).doesExist());
}

void TestRkLib::threadWaitTimesOut()
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

QTEST_GUILESS_MAIN(TestRkLib)
#include "tst_rklib.moc"
