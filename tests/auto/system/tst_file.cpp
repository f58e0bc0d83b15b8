// Files: whole-file reading and writing, removal with its trace lines, the junction buffer and
// junctions on disk, and file identity.
#include "TestSupport.h"
#include "zubase/File.h"
#include "zubase/platform/ReparseBuffer.h"

using TestSupport::logLines;

namespace {

const QString kWhere = QStringLiteral("src/core/zubase/File:ZuBase::File::");

// "where: message  detail" of each record, without line numbers.
QStringList records(const RkResult& inResult)
{
    QStringList lines;
    for (const RkResult::Record& record : inResult.records())
        lines << QString::fromStdString(record.where + ": " + record.message + "  " +
                                        record.detail);
    return lines;
}

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
class ChunkDevice : public QIODevice
{
public:
    explicit ChunkDevice(qint64 inChunk) : mChunk(inChunk) { open(QIODevice::WriteOnly); }
    QByteArray mData;
    int mWrites = 0;

protected:
    qint64 readData(char*, qint64) override { return -1; }
    qint64 writeData(const char* inData, qint64 inSize) override
    {
        ++mWrites;
        mData.append(inData, int(qMin(inSize, mChunk)));
        return qMin(inSize, mChunk);
    }

private:
    qint64 mChunk;
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

QByteArray toBytes(const std::vector<std::uint8_t>& inBytes)
{
    return QByteArray(reinterpret_cast<const char*>(inBytes.data()), int(inBytes.size()));
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
    void reparseBuffer();
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
    const QByteArray old("hi\n\0\1\xff and more", 17), data("new content\n");
    makeFile(mTemp.filePath("old.bin"), old);
    QDir().mkpath(mTemp.filePath("dir"));

    RkLogCapture capture;
    QByteArray buffer("left over");
    const RkResult res =
        write ? ZuBase::File::writeAll(path, data) : ZuBase::File::readAll(path, buffer);
    QCOMPARE(records(res), listOf(record.arg(path)));
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
    // Partial writes go on; nothing to write calls nothing; a write without progress ends it.
    char data[] = "abcdefgh";
    for (const qint64 size : {qint64(8), qint64(0), qint64(-5)}) {
        ChunkDevice device(3);
        QVERIFY_OK(ZuBase::File::writeAll(device, data, size));
        QCOMPARE(device.mData, QByteArray(data, int(qMax(size, qint64(0)))));
        QCOMPARE(device.mWrites, size > 0 ? 3 : 0);
    }
    RkLogCapture capture;
    ChunkDevice stuck(0);
    QVERIFY(ZuBase::File::writeAll(stuck, QByteArray("abc")).isBad());
    QCOMPARE(stuck.mWrites, 1);
    QCOMPARE(logLines(capture),
             QStringList{kWhere + "writeAll: Internal Error  cond[numBytesDone > 0]"});
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
    QTest::addColumn<QString>("layout"); // "top" = the directory removed; "outside/" stays
    QTest::addColumn<bool>("recursive");
    QTest::addColumn<QStringList>("nameFilters");
    QTest::addColumn<QStringList>("keepFilters");
    QTest::addColumn<QStringList>("remaining"); // besides "outside/"
    QTest::addColumn<QString>("lastTrace");

    const auto row = [](const char* inRow, const char* inLayout, bool inRecursive,
                        const QString& inName, const QString& inKeep, const QString& inRemaining,
                        const QString& inLastTrace) {
        QTest::newRow(inRow) << inLayout << inRecursive << inName.split(' ', Qt::SkipEmptyParts)
                             << inKeep.split(' ', Qt::SkipEmptyParts)
                             << inRemaining.split(' ', Qt::SkipEmptyParts) << inLastTrace;
    };
    const QString ok = "QDir::rmdir() [top] -> ok";
    const QString fail = "QDir::rmdir() [top] -> fail";
    const QString subfolders = "top/ top/sub/ top/sub/b.tmp top/sub/deeper/ top/sub/deeper/c.txt ";
    row("everything", "tree", true, "", "", "", ok);
    row("not recursive keeps subfolders", "tree", false, "", "",
        subfolders + "top/sub/link top/sub/empty/", fail);
    // The keep filter lists every folder too, so folders are kept whole.
    row("keep filter keeps matches and every folder", "tree", true, "", "*.TXT",
        subfolders + "top/sub/link top/sub/empty/ top/a.txt", fail);
    row("name filter removes only matching files", "tree", true, "*.tmp", "",
        "top/ top/.hidden top/a.txt top/sub/ top/sub/deeper/ top/sub/deeper/c.txt", fail);
    row("plain file", "file", true, "", "", "", "");
    row("link to a folder", "link", true, "", "", "", "");
}

void TestFile::removeDir()
{
    QFETCH(QString, layout);
    QFETCH(bool, recursive);
    QFETCH(QStringList, nameFilters);
    QFETCH(QStringList, keepFilters);
    QFETCH(QStringList, remaining);
    QFETCH(QString, lastTrace);

    QTemporaryDir root;
    const QString top = root.filePath("top");
    makeFile(root.filePath("outside/precious.txt"));
    if (layout == "tree") {
        for (const char* file : {"/a.txt", "/.hidden", "/sub/b.tmp", "/sub/deeper/c.txt"})
            makeFile(top + file);
        QVERIFY(QDir().mkpath(top + "/sub/empty")); // goes at once, without a trace
        // A link to a folder outside: removed itself, never followed.
        QVERIFY(QFile::link(root.filePath("outside"), top + "/sub/link"));
    } else if (layout == "file") {
        makeFile(top);
    } else {
        QVERIFY(QFile::link(root.filePath("outside"), top));
    }

    RkLogCapture capture;
    QVERIFY_OK(ZuBase::File::removeDir(top, recursive, nameFilters, keepFilters));
    remaining << "outside/"
              << "outside/precious.txt";
    remaining.sort();
    QCOMPARE(treeOf(root.path()), remaining);

    const QStringList trace = logLines(capture, "ZuBase");
    QCOMPARE(trace.isEmpty() ? QString() : trace.last(), lastTrace.replace("top", top));
    // What went is information, what stayed a warning.
    const QStringList failed = trace.filter(QRegularExpression(" -> fail$"));
    QCOMPARE(logLines(capture, "ZuBase", RkLogWarning), failed);
    QCOMPARE(trace.size() - failed.size(), trace.filter(QRegularExpression(" -> ok$")).size());
    if (layout == "tree" && recursive && keepFilters.isEmpty())
        QVERIFY(trace.contains("QFile::remove() [" + top + "/sub/b.tmp] -> ok") &&
                trace.contains("QDir::rmdir() [" + top + "/sub/deeper] -> fail") ==
                    !nameFilters.isEmpty() &&
                trace.filter("/sub/empty").isEmpty());
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

void TestFile::reparseBuffer()
{
    // "\??\D:\data\" is 12 UTF-16 units: 24 name bytes, 44 in all.
    const std::u16string name = ZuPlatform::mountPointSubstituteName(u"D:\\data");
    const std::vector<std::uint8_t> built = ZuPlatform::mountPointBuild(name);
    QCOMPARE(toBytes(built), QByteArray::fromHex("030000a0" // tag
                                                 "24000000" // data length 36, reserved
                                                 "00001800" // substitute name at 0, 24 bytes
                                                 "1a000000" // print name at 26, empty
                                                 "5c003f003f005c0044003a005c0064006100740061005c00"
                                                 "00000000"));
    std::uint32_t tag = 0;
    std::u16string read;
    QVERIFY(ZuPlatform::reparseBufferParse(built.data(), built.size(), tag, read));
    QCOMPARE(ZuPlatform::mountPointTarget(read), std::u16string(u"D:\\data"));
    // A drive root keeps its backslash, and only one trailing backslash goes.
    QCOMPARE(ZuPlatform::mountPointSubstituteName(u"E:\\"), std::u16string(u"\\??\\E:\\"));
    QCOMPARE(ZuPlatform::mountPointTarget(u"\\??\\E:\\"), std::u16string(u"E:\\"));
    QCOMPARE(ZuPlatform::mountPointTarget(u"D:\\a\\\\"), std::u16string(u"D:\\a\\"));
    // Another tag is read without a name; a name length past the end is refused.
    const QByteArray link = QByteArray::fromHex("0c0000a000000000");
    const QByteArray past = QByteArray::fromHex("030000a0100000000000ff000000000041004200");
    const auto bytes = [](const QByteArray& inBuffer) {
        return reinterpret_cast<const std::uint8_t*>(inBuffer.data());
    };
    QVERIFY(ZuPlatform::reparseBufferParse(bytes(link), 8, tag, read));
    QVERIFY(tag == 0xA000000Cu && read.empty());
    QVERIFY(!ZuPlatform::reparseBufferParse(bytes(past), std::size_t(past.size()), tag, read));
}

void TestFile::junctionCreate_data()
{
    QTest::addColumn<QString>("before");  // what is at the junction path beforehand
    QTest::addColumn<QString>("target");  // "", "target", "relative" or "too long"
    QTest::addColumn<QString>("failure"); // the record reported; none for success
    QTest::addColumn<QString>("after");   // what is at the junction path afterwards

    const auto row = [](const char* inRow, const char* inBefore, const char* inTarget,
                        const char* inFailure, const char* inAfter) {
        QTest::newRow(inRow) << inBefore << inTarget << inFailure << inAfter;
    };
    const char* io = "::DeviceIoControl  cond[bret!=0]";
    row("nothing there", "nothing", "target", "", "link");
    row("relative paths made absolute", "nothing", "relative", "", "link");
    row("empty folder replaced", "empty dir", "target", "", "link");
    row("non-empty folder refused", "full dir", "target", io, "full dir");
    row("created folder removed on failure", "nothing", "too long", io, "nothing");
    row("existing folder kept on failure", "empty dir", "too long", io, "empty dir");
    row("parent missing", "no parent", "target", "::CreateDirectoryW  cond[bret]", "nothing");
    row("a file there", "file", "target",
        "::CreateFileW  cond[hDirMountPoint!=((HANDLE)(LONG_PTR)-1)]", "file");
    row("no target", "nothing", "", "", "nothing");
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
    QString junction = root.filePath("j");
    if (before == "empty dir")
        QDir().mkpath(junction);
    else if (before == "full dir")
        makeFile(junction + "/keep.txt");
    else if (before == "no parent")
        junction = root.filePath("missing/j");
    else if (before == "file")
        makeFile(junction);

    RkLogCapture capture;
    RkResult res;
    if (target == "relative") {
        const QString previous = QDir::currentPath();
        QDir::setCurrent(root.path());
        res = ZuBase::File::junctionCreate("j", targetName);
        QDir::setCurrent(previous);
    } else {
        // Longer than any link target the system stores.
        const QString path = target == "too long" ? targetDir + '/' + QString(5000, 'x')
                             : target.isEmpty()   ? QString()
                                                  : targetDir;
        res = ZuBase::File::junctionCreate(junction, path);
    }
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
    QVERIFY(!ZuBase::File::pathsPointToTheSameFile(QString(), QString()));
}

QTEST_GUILESS_MAIN(TestFile)
#include "tst_file.moc"
