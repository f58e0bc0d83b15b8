// Files: whole-file reading and writing, removal with its trace lines, junctions on disk and file
// identity.
#include "TestSupport.h"
#include "zubase/File.h"

using TestSupport::logLines;

namespace {

const QString kWhere = QStringLiteral("src/core/zubase/File:ZuBase::File::");

QStringList listOf(const QString& inLine)
{
    return inLine.isEmpty() ? QStringList() : QStringList{inLine};
}

void makeFile(const QString& inPath, const QByteArray& inData = "x")
{
    QDir().mkpath(QFileInfo(inPath).absolutePath());
    QFile file(inPath);
    QVERIFY(file.open(QIODevice::WriteOnly) && file.write(inData) == inData.size());
}

// Every entry below inRoot as a sorted relative path; folders end with "/".
QStringList treeOf(const QString& inRoot)
{
    QStringList entries;
    QDirIterator it(inRoot, QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot,
                    QDirIterator::Subdirectories);
    while (it.hasNext()) {
        const QFileInfo info(it.next());
        entries << QDir(inRoot).relativeFilePath(info.filePath()) +
                       (info.isDir() && !info.isSymLink() ? "/" : "");
    }
    entries.sort();
    return entries;
}

// A device that takes at most mChunk bytes per write, or nothing when mChunk is 0.
struct ChunkDevice : QIODevice
{
    explicit ChunkDevice(qint64 inChunk) : mChunk(inChunk) { open(QIODevice::WriteOnly); }
    qint64 readData(char*, qint64) override { return -1; }
    qint64 writeData(const char* inData, qint64 inSize) override
    {
        ++mWrites;
        mData.append(inData, int(qMin(inSize, mChunk)));
        return qMin(inSize, mChunk);
    }
    qint64 mChunk;
    QByteArray mData;
    int mWrites = 0;
};

// What is at a path: "link to <target>", "empty dir", "full dir", "file" or "nothing".
QString whatIsAt(const QString& inPath)
{
    const QFileInfo info(inPath);
    if (info.isSymLink())
        return "link to " + info.symLinkTarget();
    if (info.isDir())
        return QDir(inPath).isEmpty() ? "empty dir" : "full dir";
    return info.exists() ? "file" : "nothing";
}

} // namespace

class TestFile : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void wholeFiles_data();
    void wholeFiles();
    void writeAllToDevice();
    void removeFile_data();
    void removeFile();
    void removeDir_data();
    void removeDir();
    void removeDirDoesNotFollowASwappedFolder();
    void junctionCreate_data();
    void junctionCreate();
    void junctionInfo();
    void pathsPointToTheSameFile();

private:
    QTemporaryDir mTemp;
};

void TestFile::wholeFiles_data()
{
    QTest::addColumn<bool>("write");
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("record"); // in the result
    QTest::addColumn<QString>("logged");
    const QString read = kWhere + "readAll: ", write = kWhere + "writeAll: ";
    QTest::newRow("read text and binary") << false << "old.bin" << QString() << QString();
    QTest::newRow("read missing") << false << "missing.txt"
                                  << read + "Internal Error  cond[file.exists()]" << QString();
    QTest::newRow("read a folder")
        << false << "dir" << read + "%1  cond[file.open( QIODevice::ReadOnly )]" << QString();
    QTest::newRow("write over a longer file") << true << "old.bin" << QString() << QString();
    QTest::newRow("write into no folder")
        << true << "no/dir/x.txt"
        << write + "%1  cond[file.open( QIODevice::WriteOnly | QIODevice::Truncate )]" << QString();
    // A full disk must show in the result, not vanish when the file is closed.
    QTest::newRow("write a full disk")
        << true << "/dev/full" << QString() << write + "Internal Error  cond[numBytesDone > 0]";
}

void TestFile::wholeFiles()
{
    QFETCH(bool, write);
    QFETCH(QString, path);
    QFETCH(QString, record);
    QFETCH(QString, logged);
    if (!path.startsWith('/'))
        path = mTemp.filePath(path);
    static const char kOld[] = "hi\n\0\1\xff and more"; // bytes no text codec keeps
    const QByteArray old(kOld, sizeof kOld - 1), data("new content\n");
    makeFile(mTemp.filePath("old.bin"), old);
    QDir().mkpath(mTemp.filePath("dir"));

    RkLogCapture capture;
    QByteArray buffer("left over");
    const RkResult res =
        write ? ZuBase::File::writeAll(path, data) : ZuBase::File::readAll(path, buffer);
    QStringList records;
    for (const RkResult::Record& r : res.records())
        records << QString::fromStdString(r.where + ": " + r.message + "  " + r.detail);
    QCOMPARE(records, listOf(record.arg(path)));
    QCOMPARE(logLines(capture, "Tz", RkLogError), listOf(logged)); // else only accumulated
    const bool ok = record.isEmpty() && logged.isEmpty();
    QCOMPARE(res.isOk(), ok);
    if (write && ok)
        QVERIFY(ZuBase::File::readAll(path, buffer).isOk() && buffer == data);
    else if (!write)
        QCOMPARE(buffer, ok ? old : QByteArray());
}

void TestFile::writeAllToDevice()
{
    // Partial writes go on; a write without progress ends it.
    ChunkDevice device(3), stuck(0);
    QVERIFY_OK(ZuBase::File::writeAll(device, QByteArray("abcdefgh")));
    QVERIFY(device.mData == "abcdefgh" && device.mWrites == 3);
    QVERIFY(ZuBase::File::writeAll(stuck, QByteArray("abc")).isBad() && stuck.mWrites == 1);
}

void TestFile::removeFile_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<bool>("traced");
    QTest::newRow("existing") << "gone.txt" << true << true;
    QTest::newRow("missing") << "never.txt" << true << false;
    // Even root cannot unlink a file of the proc file system.
    QTest::newRow("undeletable") << "/proc/version" << false << true;
}

void TestFile::removeFile()
{
    QFETCH(QString, path);
    QFETCH(bool, ok);
    QFETCH(bool, traced);
    if (!path.startsWith('/')) {
        path = mTemp.filePath(path);
        if (traced)
            makeFile(path);
    }

    RkLogCapture capture;
    QVERIFY(ZuBase::File::removeFile(path).isOk() == ok && QFileInfo::exists(path) != ok);
    const QString trace = QString("QFile::remove() [%1] -> %2").arg(path, ok ? "ok" : "fail");
    QCOMPARE(logLines(capture, "ZuBase"), listOf(traced ? trace : ""));
    // A failure is a warning, and reported.
    QCOMPARE(logLines(capture, "ZuBase", RkLogWarning), listOf(ok ? "" : trace));
    QCOMPARE(
        logLines(capture, "Tz"),
        listOf(ok ? "" : kWhere + "removeFile: Internal Error  cond[!QFile::exists(inFilePath)]"));
}

void TestFile::removeDir_data()
{
    QTest::addColumn<bool>("recursive");
    QTest::addColumn<QString>("nameFilter");
    QTest::addColumn<QString>("keepFilter");
    QTest::addColumn<QString>("remaining"); // besides "outside/"; "top" is the folder removed

    const auto row = [](const char* inRow, bool inRecursive, const char* inName, const char* inKeep,
                        const QString& inRemaining) {
        QTest::newRow(inRow) << inRecursive << inName << inKeep << inRemaining;
    };
    const QString subfolders = "top/ top/sub/ top/sub/b.tmp top/sub/deeper/ top/sub/deeper/c.txt";
    row("everything", true, "", "", "");
    row("not recursive keeps subfolders", false, "", "",
        subfolders + " top/sub/link top/sub/empty/");
    // The keep filter lists every folder too, so folders are kept whole.
    row("keep filter keeps matches and every folder", true, "", "*.TXT",
        subfolders + " top/sub/link top/sub/empty/ top/a.txt");
    row("name filter removes only matching files", true, "*.tmp", "",
        "top/ top/.hidden top/a.txt top/sub/ top/sub/deeper/ top/sub/deeper/c.txt");
    row("link to a folder", true, "", "", "link");
}

void TestFile::removeDir()
{
    QFETCH(bool, recursive);
    QFETCH(QString, nameFilter);
    QFETCH(QString, keepFilter);
    QFETCH(QString, remaining);

    QTemporaryDir root;
    const QString top = root.filePath("top");
    makeFile(root.filePath("outside/precious.txt"));
    // A link to a folder outside, as the folder itself or in it: removed, never followed.
    const bool link = remaining == "link";
    if (!link) {
        for (const char* file : {"/a.txt", "/.hidden", "/sub/b.tmp", "/sub/deeper/c.txt"})
            makeFile(top + file);
        QVERIFY(QDir().mkpath(top + "/sub/empty")); // goes at once, without a trace
    }
    QVERIFY(QFile::link(root.filePath("outside"), top + (link ? "" : "/sub/link")));

    RkLogCapture capture;
    QVERIFY_OK(ZuBase::File::removeDir(top, recursive, listOf(nameFilter), listOf(keepFilter)));
    QStringList expected = (link ? "" : remaining).split(' ', Qt::SkipEmptyParts);
    expected << "outside/"
             << "outside/precious.txt";
    expected.sort();
    QCOMPARE(treeOf(root.path()), expected);

    // What went is information, what stayed a warning; the folder itself comes last.
    const QStringList trace = logLines(capture, "ZuBase");
    const QStringList failed = trace.filter(QRegularExpression(" -> fail$"));
    QCOMPARE(logLines(capture, "ZuBase", RkLogWarning), failed);
    QCOMPARE(trace.size() - failed.size(), trace.filter(QRegularExpression(" -> ok$")).size());
    QCOMPARE(
        trace.value(trace.size() - 1),
        link ? QString()
             : QString("QDir::rmdir() [%1] -> %2").arg(top, remaining.isEmpty() ? "ok" : "fail"));
    QVERIFY(trace.filter("/sub/empty").isEmpty());
}

void TestFile::removeDirDoesNotFollowASwappedFolder()
{
    // After the first file in "sub" has gone, "sub" is swapped for a link to a folder with
    // files of the same names: the rest of the walk must stay in the folder it opened.
    QTemporaryDir root;
    const QString top = root.filePath("top");
    const QStringList names{"f1", "f2", "f3"};
    for (const QString& name : names) {
        makeFile(top + "/sub/" + name);
        makeFile(root.filePath("outside/") + name);
    }
    bool swapped = false;
    const int sink = getTheLogInstance().addSink([&](const RkLogEntry& inEntry) {
        if (!swapped && inEntry.text.find("/sub/") != std::string::npos)
            swapped = QDir().rename(top + "/sub", top + "/moved") &&
                      QFile::link(root.filePath("outside"), top + "/sub");
    });
    ZuBase::File::removeDir(top, true, {}, {});
    getTheLogInstance().removeSink(sink);
    QVERIFY(swapped);
    QCOMPARE(QDir(root.filePath("outside")).entryList(QDir::Files), names);
    QCOMPARE(QDir(top + "/moved").entryList(QDir::Files), QStringList());
}

void TestFile::junctionCreate_data()
{
    QTest::addColumn<QString>("before");  // what is at the junction path beforehand
    QTest::addColumn<QString>("target");  // "target" or "too long"
    QTest::addColumn<QString>("failure"); // the record reported; none for success
    QTest::addColumn<QString>("after");   // what is at the junction path afterwards

    const auto row = [](const char* inRow, const char* inBefore, const char* inTarget,
                        const char* inFailure, const char* inAfter) {
        QTest::newRow(inRow) << inBefore << inTarget << inFailure << inAfter;
    };
    const char* io = "::DeviceIoControl  cond[bret!=0]";
    row("nothing there", "nothing", "target", "", "link");
    row("empty folder replaced", "empty dir", "target", "", "link");
    row("non-empty folder refused", "full dir", "target", io, "full dir");
    row("created folder removed on failure", "nothing", "too long", io, "nothing");
    row("existing folder kept on failure", "empty dir", "too long", io, "empty dir");
    row("parent missing", "no parent", "target", "::CreateDirectoryW  cond[bret]", "nothing");
    row("a file there", "file", "target",
        "::CreateFileW  cond[hDirMountPoint!=((HANDLE)(LONG_PTR)-1)]", "file");
}

void TestFile::junctionCreate()
{
    QFETCH(QString, before);
    QFETCH(QString, target);
    QFETCH(QString, failure);
    QFETCH(QString, after);

    // A target name of one, two, three and four bytes per character, at the edges of the
    // encodings.
    QTemporaryDir root;
    const QString targetName = QString::fromUtf8("target \u00e4\u0915\u20ac\U00010000\U0001D11E");
    const QString targetDir = root.filePath(targetName);
    makeFile(targetDir + "/inside.txt");
    QString junction = root.filePath(before == "no parent" ? "missing/j" : "j");
    if (before == "empty dir")
        QDir().mkpath(junction);
    else if (before == "full dir")
        makeFile(junction + "/keep.txt");
    else if (before == "file")
        makeFile(junction);

    RkLogCapture capture;
    // Longer than any link target the system stores.
    const RkResult res = ZuBase::File::junctionCreate(
        junction, target == "too long" ? targetDir + '/' + QString(5000, 'x') : targetDir);
    QCOMPARE(res.isOk(), after == "link");
    const QStringList failures = logLines(capture, "Tz", RkLogError);
    QCOMPARE(failures.value(0),
             failure.isEmpty() ? QString() : kWhere + "junctionCreate: " + failure);
    QCOMPARE(failures.size(), failure.isEmpty() ? 0 : 2); // with the last error
    QCOMPARE(whatIsAt(junction), after == "link" ? "link to " + targetDir : after);
    bool isJunction = false;
    QString outTarget;
    if (after == "link") {
        QVERIFY_OK(ZuBase::File::junctionInfo(junction, isJunction, outTarget));
        QVERIFY(isJunction && QFileInfo::exists(junction + "/inside.txt"));
        QCOMPARE(outTarget, QDir::toNativeSeparators(targetDir));
    }
}

void TestFile::junctionInfo()
{
    // "ok|target" of a path; a link made elsewhere with a relative target counts from its
    // folder, one whose target has gone is still a junction; nothing here is reported.
    QTemporaryDir root;
    makeFile(root.filePath("target dir/file.txt"));
    QVERIFY(QFile::link("target dir", root.filePath("relative")));
    QVERIFY(QFile::link(root.filePath("removed dir"), root.filePath("gone")));
    RkLogCapture capture;
    const auto info = [&root](const QString& inPath) {
        bool isJunction = true;
        QString target = "stale";
        const bool ok = ZuBase::File::junctionInfo(inPath, isJunction, target).isOk();
        return QString("%1|%2").arg(ok).arg(isJunction ? target : "no junction " + target);
    };
    QCOMPARE(info(root.filePath("relative")), "1|" + root.filePath("target dir"));
    QCOMPARE(info(root.filePath("gone")), "1|" + root.filePath("removed dir"));
    QCOMPARE(info(root.filePath("target dir")), "1|no junction ");
    QCOMPARE(info(root.filePath("target dir/file.txt")), "0|no junction ");
    QCOMPARE(info(QString()), "0|no junction ");
    QCOMPARE(logLines(capture, "Tz", RkLogError), QStringList());
}

void TestFile::pathsPointToTheSameFile()
{
    // The files themselves are compared, not only their folders.
    QTemporaryDir root;
    makeFile(root.filePath("d/one.txt"));
    makeFile(root.filePath("d/two.txt"));
    QVERIFY(QFile::link(root.filePath("d"), root.filePath("dlink")));
    const auto same = [&root](const char* inA, const char* inB) {
        return ZuBase::File::pathsPointToTheSameFile(root.filePath(inA), root.filePath(inB));
    };
    QVERIFY(same("d/one.txt", "dlink/../d/./one.txt") && same("dlink/one.txt", "d/one.txt"));
    QVERIFY(!same("d/one.txt", "d/two.txt") && !same("d/none.txt", "d/none.txt"));
}

QTEST_GUILESS_MAIN(TestFile)
#include "tst_file.moc"
