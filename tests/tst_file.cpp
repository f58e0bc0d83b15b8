// Files: whole-file reading and writing, removal with its trace lines, the junction buffer and
// junctions on disk, and file identity.
#include "zubase/File.h"
#include "zubase/platform/ReparseBuffer.h"

#include "rklib/RkLogFile.h"

#include <QBuffer>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QRegularExpression>
#include <QTemporaryDir>
#include <QtTest>

namespace {

QStringList texts(const RkLogCapture& inCapture, const char* inCategory)
{
    QStringList lines;
    for (const std::string& text : inCapture.texts(inCategory))
        lines << QString::fromStdString(text);
    return lines;
}

// Reported failures (errors of the category "Tz") without their source line numbers.
QStringList failureLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const RkLogEntry& entry : inCapture.entries()) {
        if (entry.category == "Tz" && entry.level >= RkLogError)
            lines << QString::fromStdString(entry.text)
                         .replace(QRegularExpression(R"(\(\d+\): )"), ": ");
    }
    return lines;
}

// "where: message  detail" of each record, without line numbers.
QStringList records(const RkResult& inResult)
{
    QStringList lines;
    for (const RkResult::Record& record : inResult.records())
        lines << QString::fromStdString(record.where + ": " + record.message + "  " +
                                        record.detail);
    return lines;
}

void makeFile(const QString& inPath, const QByteArray& inData = "x")
{
    QDir().mkpath(QFileInfo(inPath).absolutePath());
    QFile file(inPath);
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write(inData);
}

// Every entry below inRoot as a sorted relative path; directories end with "/".
QStringList treeOf(const QString& inRoot)
{
    QStringList entries;
    QDirIterator it(inRoot, QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot,
                    QDirIterator::Subdirectories);
    while (it.hasNext()) {
        it.next();
        const QFileInfo info = it.fileInfo();
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
        const qint64 n = qMin(inSize, mChunk);
        mData.append(inData, int(n));
        return n;
    }

private:
    qint64 mChunk;
};

const QString sWhere = QStringLiteral("src/core/zubase/File:ZuBase::File::");

} // namespace

class TestFile : public QObject
{
    Q_OBJECT

private slots:
    void readAll_data();
    void readAll();
    void writeAllToPath_data();
    void writeAllToPath();
    void writeAllToDevice_data();
    void writeAllToDevice();
    void removeFile_data();
    void removeFile();
    void removeDir_data();
    void removeDir();
    void reparseBufferBytes();
    void reparseBufferParse_data();
    void reparseBufferParse();
    void mountPointTarget_data();
    void mountPointTarget();
    void junctionRoundTrip();
    void junctionCreateCases_data();
    void junctionCreateCases();
    void junctionInfoOnNonJunctions();
    void pathsPointToTheSameFile_data();
    void pathsPointToTheSameFile();

private:
    QTemporaryDir mTemp;
};

void TestFile::readAll_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QStringList>("records");

    QTest::newRow("text") << "a.txt" << QByteArray("hello\nworld") << QStringList();
    QTest::newRow("binary") << "b.bin" << QByteArray("\0\1\2\xff", 4) << QStringList();
    QTest::newRow("empty") << "c.txt" << QByteArray() << QStringList();
    QTest::newRow("missing") << "missing.txt" << QByteArray()
                             << QStringList{sWhere +
                                            "readAll: Internal Error  cond[file.exists()]"};
    QTest::newRow("directory") << "dir" << QByteArray()
                               << QStringList{sWhere + "readAll: %1  cond[file.open( "
                                                       "QIODevice::ReadOnly )]"};
}

void TestFile::readAll()
{
    QFETCH(QString, name);
    QFETCH(QByteArray, content);
    QFETCH(QStringList, records);
    const QString path = mTemp.filePath(name);
    if (name == "dir")
        QDir().mkpath(path);
    else if (name != "missing.txt")
        makeFile(path, content);

    RkLogCapture capture;
    QByteArray buffer("left over");
    const RkResult res = ZuBase::File::readAll(path, buffer);
    QCOMPARE(res.isBad(), !records.isEmpty());
    QCOMPARE(buffer, content);
    records.replaceInStrings("%1", path);
    QCOMPARE(::records(res), records);
    QVERIFY(capture.texts().empty()); // accumulated, never logged
}

void TestFile::writeAllToPath_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QStringList>("records");
    QTest::addColumn<QStringList>("logged");

    QTest::newRow("new file") << "new.txt" << true << QStringList() << QStringList();
    QTest::newRow("replaces longer file") << "old.txt" << true << QStringList() << QStringList();
    const QString openFailure =
        sWhere + "writeAll: %1  cond[file.open( QIODevice::WriteOnly | QIODevice::Truncate )]";
    QTest::newRow("missing folder")
        << "no/such/dir/x.txt" << false << QStringList{openFailure} << QStringList();
    // A full disk must show in the result, not vanish when the file is closed.
    const QString writeFailure = sWhere + "writeAll: Internal Error  cond[numBytesDone > 0]";
    QTest::newRow("full disk") << "/dev/full" << false << QStringList()
                               << QStringList{writeFailure};
}

void TestFile::writeAllToPath()
{
    QFETCH(QString, path);
    QFETCH(bool, ok);
    QFETCH(QStringList, records);
    QFETCH(QStringList, logged);
    if (!path.startsWith('/'))
        path = mTemp.filePath(path);
    if (path.endsWith("old.txt"))
        makeFile(path, QByteArray(1000, 'o'));
    if (path == "/dev/full" && !QFileInfo::exists(path))
        QSKIP("/dev/full is not available");

    RkLogCapture capture;
    const QByteArray data("new content\n");
    const RkResult res = ZuBase::File::writeAll(path, data);
    QCOMPARE(res.isOk(), ok);
    records.replaceInStrings("%1", path);
    QCOMPARE(::records(res), records);
    QCOMPARE(failureLines(capture), logged);
    if (ok) {
        QByteArray back;
        QVERIFY(ZuBase::File::readAll(path, back).isOk());
        QCOMPARE(back, data);
    }
}

void TestFile::writeAllToDevice_data()
{
    QTest::addColumn<qint64>("chunk");
    QTest::addColumn<QByteArray>("data");
    QTest::addColumn<int>("writes");
    QTest::addColumn<bool>("ok");

    QTest::newRow("one write") << qint64(1 << 20) << QByteArray(5000, 'a') << 1 << true;
    QTest::newRow("partial writes continue") << qint64(3) << QByteArray("abcdefgh") << 3 << true;
    QTest::newRow("nothing to write") << qint64(0) << QByteArray() << 0 << true;
    QTest::newRow("device takes nothing") << qint64(0) << QByteArray("abc") << 1 << false;
}

void TestFile::writeAllToDevice()
{
    QFETCH(qint64, chunk);
    QFETCH(QByteArray, data);
    QFETCH(int, writes);
    QFETCH(bool, ok);

    RkLogCapture capture;
    ChunkDevice device(chunk);
    const RkResult res = ZuBase::File::writeAll(device, data);
    QCOMPARE(res.isOk(), ok);
    QCOMPARE(device.mWrites, writes);
    if (ok) {
        QCOMPARE(device.mData, data);
        QVERIFY(capture.texts().empty());
    } else {
        QCOMPARE(failureLines(capture),
                 QStringList{sWhere + "writeAll: Internal Error  cond[numBytesDone > 0]"});
    }

    // The raw form with a size of zero or less never touches the device.
    ChunkDevice untouched(10);
    char byte = 'x';
    QVERIFY(ZuBase::File::writeAll(untouched, &byte, 0).isOk());
    QVERIFY(ZuBase::File::writeAll(untouched, &byte, -5).isOk());
    QCOMPARE(untouched.mWrites, 0);
}

void TestFile::removeFile_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QStringList>("trace");
    QTest::addColumn<int>("level");

    QTest::newRow("existing") << "gone.txt" << true << QStringList{"QFile::remove() [%1] -> ok"}
                              << int(RkLogInfo);
    QTest::newRow("missing") << "never.txt" << true << QStringList() << -1;
    // Even root cannot unlink a file of the proc file system.
    QTest::newRow("undeletable") << "/proc/version" << false
                                 << QStringList{"QFile::remove() [%1] -> fail"}
                                 << int(RkLogWarning);
}

void TestFile::removeFile()
{
    QFETCH(QString, path);
    QFETCH(bool, ok);
    QFETCH(QStringList, trace);
    QFETCH(int, level);
    if (!path.startsWith('/')) {
        path = mTemp.filePath(path);
        if (path.endsWith("gone.txt"))
            makeFile(path);
    }

    RkLogCapture capture;
    const RkResult res = ZuBase::File::removeFile(path);
    QCOMPARE(res.isOk(), ok);
    for (QString& line : trace)
        line = line.arg(path);
    QCOMPARE(texts(capture, "ZuBase"), trace);
    for (const RkLogEntry& entry : capture.entries()) {
        if (entry.category == "ZuBase")
            QCOMPARE(int(entry.level), level);
    }
    QCOMPARE(
        failureLines(capture),
        ok ? QStringList()
           : QStringList{sWhere + "removeFile: Internal Error  cond[!QFile::exists(inFilePath)]"});
    if (ok)
        QVERIFY(!QFileInfo::exists(path));
}

void TestFile::removeDir_data()
{
    QTest::addColumn<QString>("layout"); // "top" = the directory removed; "outside/" stays
    QTest::addColumn<bool>("recursive");
    QTest::addColumn<QStringList>("nameFilters");
    QTest::addColumn<QStringList>("keepFilters");
    QTest::addColumn<QStringList>("remaining");
    QTest::addColumn<QString>("lastTrace");

    const QStringList full{"outside/", "outside/precious.txt"};
    QTest::newRow("everything") << "tree" << true << QStringList() << QStringList() << full
                                << "QDir::rmdir() [top] -> ok";
    QTest::newRow("not recursive keeps subfolders")
        << "tree" << false << QStringList() << QStringList()
        << full + QStringList{"top/",
                              "top/sub/",
                              "top/sub/b.tmp",
                              "top/sub/deeper/",
                              "top/sub/deeper/c.txt",
                              "top/sub/link"}
        << "QDir::rmdir() [top] -> fail";
    // The keep filter lists every folder too, so folders are kept whole.
    QTest::newRow("keep filter keeps matches and every folder")
        << "tree" << true << QStringList() << QStringList{"*.txt"}
        << full + QStringList{"top/",          "top/a.txt",       "top/sub/",
                              "top/sub/b.tmp", "top/sub/deeper/", "top/sub/deeper/c.txt",
                              "top/sub/link"}
        << "QDir::rmdir() [top] -> fail";
    QTest::newRow("name filter removes only matching files")
        << "tree" << true << QStringList{"*.tmp"} << QStringList()
        << full + QStringList{"top/",     "top/.hidden",     "top/a.txt",
                              "top/sub/", "top/sub/deeper/", "top/sub/deeper/c.txt"}
        << "QDir::rmdir() [top] -> fail";
    QTest::newRow("plain file") << "file" << true << QStringList() << QStringList() << full
                                << QString();
    QTest::newRow("missing") << "missing" << true << QStringList() << QStringList() << full
                             << QString();
    QTest::newRow("link to a folder")
        << "link" << true << QStringList() << QStringList() << full << QString();
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
        makeFile(top + "/a.txt");
        makeFile(top + "/.hidden");
        makeFile(top + "/sub/b.tmp");
        makeFile(top + "/sub/deeper/c.txt");
        // A link to a folder outside: removed itself, never followed.
        QVERIFY(QFile::link(root.filePath("outside"), top + "/sub/link"));
    } else if (layout == "file") {
        makeFile(top);
    } else if (layout == "link") {
        QVERIFY(QFile::link(root.filePath("outside"), top));
    }

    RkLogCapture capture;
    const RkResult res = ZuBase::File::removeDir(top, recursive, nameFilters, keepFilters);
    QVERIFY(res.isOk());
    remaining.sort();
    QCOMPARE(treeOf(root.path()), remaining);

    const QStringList trace = texts(capture, "ZuBase");
    if (lastTrace.isEmpty()) {
        QCOMPARE(trace, QStringList());
        return;
    }
    QVERIFY(!trace.isEmpty());
    QCOMPARE(trace.last(), QString(lastTrace).replace("top", top));
    // When all went, every line on the way says so.
    for (const QString& line : lastTrace.endsWith("ok") ? trace : QStringList())
        QVERIFY2(QRegularExpression(R"(^Q(File::remove|Dir::rmdir)\(\) \[.*\] -> ok$)")
                     .match(line)
                     .hasMatch(),
                 qPrintable(line));
    if (!remaining.contains("top/sub/b.tmp"))
        QVERIFY(trace.contains(QString("QFile::remove() [%1] -> ok").arg(top + "/sub/b.tmp")));
    if (!remaining.contains("top/a.txt"))
        QVERIFY(trace.contains(QString("QFile::remove() [%1] -> ok").arg(top + "/a.txt")));
    for (const RkLogEntry& entry : capture.entries()) {
        if (entry.category == "ZuBase")
            QCOMPARE(int(entry.level), QString::fromStdString(entry.text).endsWith("ok")
                                           ? int(RkLogInfo)
                                           : int(RkLogWarning));
    }
}

void TestFile::reparseBufferBytes()
{
    const std::vector<std::uint8_t> buffer =
        ZuPlatform::mountPointBuild(ZuPlatform::mountPointSubstituteName(u"D:\\data"));
    // "\??\D:\data\" is 12 UTF-16 units: 24 name bytes, 44 in all.
    const QByteArray expected =
        QByteArray::fromHex("030000a0" // tag
                            "2400"
                            "0000" // data length 36, reserved
                            "0000"
                            "1800" // substitute name at 0, 24 bytes
                            "1a00"
                            "0000" // print name at 26, empty
                            "5c003f003f005c0044003a005c0064006100740061005c00"
                            "00000000");
    QCOMPARE(QByteArray(reinterpret_cast<const char*>(buffer.data()), int(buffer.size())),
             expected);
    // A target that already ends with a backslash gets no second one.
    QCOMPARE(ZuPlatform::mountPointSubstituteName(u"E:\\"), std::u16string(u"\\??\\E:\\"));
}

void TestFile::reparseBufferParse_data()
{
    QTest::addColumn<QByteArray>("buffer");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<quint32>("tag");
    QTest::addColumn<QString>("name");

    const auto built = [](const char16_t* inName) {
        const auto bytes = ZuPlatform::mountPointBuild(inName);
        return QByteArray(reinterpret_cast<const char*>(bytes.data()), int(bytes.size()));
    };
    QTest::newRow("mount point") << built(u"\\??\\C:\\x\\") << true << 0xA0000003u
                                 << "\\??\\C:\\x\\";
    QTest::newRow("non-ASCII") << built(u"\\??\\C:\\Bilder \u00e4\u20ac\\") << true << 0xA0000003u
                               << QString::fromUtf8("\\??\\C:\\Bilder ä€\\");
    QTest::newRow("symbolic link tag")
        << QByteArray::fromHex("0c0000a00000000000000000") << true << 0xA000000Cu << QString();
    QTest::newRow("too short") << QByteArray::fromHex("030000") << false << 0u << QString();
    // A name length pointing past the end must not be read.
    QTest::newRow("length past end")
        << QByteArray::fromHex("030000a0100000000000ff000000000041004200") << false << 0xA0000003u
        << QString();
    QTest::newRow("odd length") << QByteArray::fromHex("030000a010000000000003000000000041004200")
                                << false << 0xA0000003u << QString();
}

void TestFile::reparseBufferParse()
{
    QFETCH(QByteArray, buffer);
    QFETCH(bool, ok);
    QFETCH(quint32, tag);
    QFETCH(QString, name);
    std::uint32_t outTag = 0;
    std::u16string outName;
    QCOMPARE(ZuPlatform::reparseBufferParse(reinterpret_cast<const std::uint8_t*>(buffer.data()),
                                            std::size_t(buffer.size()), outTag, outName),
             ok);
    if (ok || tag)
        QCOMPARE(quint32(outTag), tag);
    if (ok)
        QCOMPARE(QString::fromStdU16String(outName), name);
}

void TestFile::mountPointTarget_data()
{
    QTest::addColumn<QString>("substitute");
    QTest::addColumn<QString>("target");
    QTest::newRow("folder") << "\\??\\D:\\data\\"
                            << "D:\\data";
    QTest::newRow("drive root keeps its backslash") << "\\??\\X:\\"
                                                    << "X:\\";
    QTest::newRow("posix path") << "\\??\\/srv/data\\"
                                << "/srv/data";
    QTest::newRow("posix root") << "\\??\\/\\"
                                << "/";
    QTest::newRow("no prefix") << "D:\\data\\"
                               << "D:\\data";
    QTest::newRow("only one backslash dropped") << "\\??\\D:\\a\\\\"
                                                << "D:\\a\\";
}

void TestFile::mountPointTarget()
{
    QFETCH(QString, substitute);
    QFETCH(QString, target);
    QCOMPARE(QString::fromStdU16String(ZuPlatform::mountPointTarget(substitute.toStdU16String())),
             target);
}

void TestFile::junctionRoundTrip()
{
    QTemporaryDir root;
    const QString target = root.filePath("target dir");
    makeFile(target + "/inside.txt", "through the junction");
    const QString junction = root.filePath("junction");

    RkLogCapture capture;
    QVERIFY(ZuBase::File::junctionCreate(junction, target).isOk());
    QVERIFY(failureLines(capture).isEmpty());
    QVERIFY(QFileInfo(junction).isSymLink());

    bool isJunction = false;
    QString outTarget;
    QVERIFY(ZuBase::File::junctionInfo(junction, isJunction, outTarget).isOk());
    QVERIFY(isJunction);
    QCOMPARE(outTarget, QDir::toNativeSeparators(target));
    QByteArray data;
    QVERIFY(ZuBase::File::readAll(junction + "/inside.txt", data).isOk());
    QCOMPARE(data, QByteArray("through the junction"));

    // A relative junction path and a relative target come out absolute.
    const QString previous = QDir::currentPath();
    QDir::setCurrent(root.path());
    const RkResult relative = ZuBase::File::junctionCreate("second", "target dir");
    QDir::setCurrent(previous);
    QVERIFY(relative.isOk());
    QVERIFY(ZuBase::File::junctionInfo(root.filePath("second"), isJunction, outTarget).isOk());
    QVERIFY(isJunction);
    QCOMPARE(outTarget, QDir::toNativeSeparators(target));

    // A link made elsewhere with a relative target reports it from the link's folder.
    QVERIFY(QFile::link("target dir", root.filePath("third")));
    QVERIFY(ZuBase::File::junctionInfo(root.filePath("third"), isJunction, outTarget).isOk());
    QVERIFY(isJunction);
    QCOMPARE(outTarget, QDir::toNativeSeparators(root.path() + "/target dir"));

    // Removing the junction leaves the target's content alone.
    ZuBase::File::removeDir(junction, true, QStringList(), QStringList());
    QVERIFY(!QFileInfo(junction).isSymLink() && !QFileInfo::exists(junction));
    QVERIFY(QFileInfo::exists(target + "/inside.txt"));
}

void TestFile::junctionCreateCases_data()
{
    QTest::addColumn<QString>("before");  // what is at the junction path beforehand
    QTest::addColumn<bool>("longTarget"); // a target the system refuses
    QTest::addColumn<bool>("ok");
    QTest::addColumn<QString>("failure");
    QTest::addColumn<QString>("after"); // "link", "empty dir", "full dir", "nothing"

    QTest::newRow("nothing there") << "nothing" << false << true << ""
                                   << "link";
    QTest::newRow("empty folder replaced") << "empty dir" << false << true << ""
                                           << "link";
    QTest::newRow("existing junction replaced") << "link" << false << true << ""
                                                << "link";
    QTest::newRow("non-empty folder refused")
        << "full dir" << false << false << "::DeviceIoControl  cond[bret!=0]"
        << "full dir";
    QTest::newRow("created folder removed on failure")
        << "nothing" << true << false << "::DeviceIoControl  cond[bret!=0]"
        << "nothing";
    QTest::newRow("existing folder kept on failure")
        << "empty dir" << true << false << "::DeviceIoControl  cond[bret!=0]"
        << "empty dir";
    QTest::newRow("parent missing")
        << "no parent" << false << false << "::CreateDirectoryW  cond[bret]"
        << "nothing";
    QTest::newRow("a file there") << "file" << false << false
                                  << "::CreateFileW  cond[hDirMountPoint!=((HANDLE)(LONG_PTR)-1)]"
                                  << "file";
}

void TestFile::junctionCreateCases()
{
    QFETCH(QString, before);
    QFETCH(bool, longTarget);
    QFETCH(bool, ok);
    QFETCH(QString, failure);
    QFETCH(QString, after);

    QTemporaryDir root;
    const QString target = root.filePath("target");
    QDir().mkpath(target);
    QString junction = root.filePath("j");
    if (before == "empty dir")
        QDir().mkpath(junction);
    else if (before == "full dir")
        makeFile(junction + "/keep.txt");
    else if (before == "link") {
        QDir().mkpath(root.filePath("elsewhere"));
        QVERIFY(QFile::link(root.filePath("elsewhere"), junction));
    } else if (before == "no parent")
        junction = root.filePath("missing/j");
    else if (before == "file")
        makeFile(junction);
    // Longer than any link target the system stores.
    const QString wantedTarget = longTarget ? target + "/" + QString(5000, 'x') : target;

    RkLogCapture capture;
    const RkResult res = ZuBase::File::junctionCreate(junction, wantedTarget);
    QCOMPARE(res.isOk(), ok);
    const QStringList failures = failureLines(capture);
    if (ok) {
        QCOMPARE(failures, QStringList());
    } else {
        QVERIFY(!failures.isEmpty());
        QCOMPARE(failures.first(), sWhere + "junctionCreate: " + failure);
        QVERIFY(failures.size() == 2 && failures.at(1).startsWith("last error "));
    }

    const QFileInfo info(junction);
    if (after == "link") {
        QVERIFY(info.isSymLink());
        QCOMPARE(info.symLinkTarget(), target);
    } else if (after == "empty dir") {
        QVERIFY(info.isDir() && !info.isSymLink());
        QCOMPARE(QDir(junction).entryList(QDir::AllEntries | QDir::NoDotAndDotDot).size(), 0);
    } else if (after == "full dir") {
        QVERIFY(info.isDir() && !info.isSymLink());
        QVERIFY(QFileInfo::exists(junction + "/keep.txt"));
    } else if (after == "file") {
        QVERIFY(info.isFile() && !info.isSymLink());
    } else {
        QVERIFY(!info.exists() && !info.isSymLink());
    }
}

void TestFile::junctionInfoOnNonJunctions()
{
    QTemporaryDir root;
    makeFile(root.filePath("plain/file.txt"));

    RkLogCapture capture;
    bool isJunction = true;
    QString target = "stale";
    QVERIFY(ZuBase::File::junctionInfo(root.filePath("plain"), isJunction, target).isOk());
    QVERIFY(!isJunction);
    QVERIFY(target.isEmpty());

    for (const QString& path :
         {root.filePath("plain/file.txt"), root.filePath("missing"), QString()}) {
        isJunction = true;
        target = "stale";
        QVERIFY(ZuBase::File::junctionInfo(path, isJunction, target).isBad());
        QVERIFY(!isJunction);
        QVERIFY(target.isEmpty());
    }
    // A link to a file is no directory at all.
    QVERIFY(QFile::link(root.filePath("plain/file.txt"), root.filePath("filelink")));
    QVERIFY(ZuBase::File::junctionInfo(root.filePath("filelink"), isJunction, target).isBad());
    QCOMPARE(failureLines(capture), QStringList()); // none of these is reported
    QVERIFY(ZuBase::File::junctionCreate(QString(), root.filePath("plain")).isBad());
    QVERIFY(ZuBase::File::junctionCreate(root.filePath("j"), QString()).isBad());
    QVERIFY(!QFileInfo::exists(root.filePath("j")));
}

void TestFile::pathsPointToTheSameFile_data()
{
    QTest::addColumn<QString>("a");
    QTest::addColumn<QString>("b");
    QTest::addColumn<bool>("same");
    QTest::newRow("same path") << "d/one.txt"
                               << "d/one.txt" << true;
    QTest::newRow("dot-dot spelling") << "d/one.txt"
                                      << "d/../d/./one.txt" << true;
    QTest::newRow("through a link") << "d/one.txt"
                                    << "link.txt" << true;
    QTest::newRow("through a folder link") << "d/one.txt"
                                           << "dlink/one.txt" << true;
    QTest::newRow("two files in one folder") << "d/one.txt"
                                             << "d/two.txt" << false;
    QTest::newRow("same name in two folders") << "d/one.txt"
                                              << "e/one.txt" << false;
    QTest::newRow("missing") << "d/one.txt"
                             << "d/none.txt" << false;
    QTest::newRow("both missing") << "d/none.txt"
                                  << "d/none.txt" << false;
    QTest::newRow("empty") << ""
                           << "" << false;
}

void TestFile::pathsPointToTheSameFile()
{
    QFETCH(QString, a);
    QFETCH(QString, b);
    QFETCH(bool, same);
    QTemporaryDir root;
    makeFile(root.filePath("d/one.txt"));
    makeFile(root.filePath("d/two.txt"));
    makeFile(root.filePath("e/one.txt"));
    QVERIFY(QFile::link(root.filePath("d/one.txt"), root.filePath("link.txt")));
    QVERIFY(QFile::link(root.filePath("d"), root.filePath("dlink")));
    const auto full = [&](const QString& inPath) {
        return inPath.isEmpty() ? QString() : root.filePath(inPath);
    };
    QCOMPARE(ZuBase::File::pathsPointToTheSameFile(full(a), full(b)), same);
    QCOMPARE(ZuBase::File::pathsPointToTheSameFile(full(b), full(a)), same);
}

QTEST_GUILESS_MAIN(TestFile)
#include "tst_file.moc"
