// Named pipes: transfers between processes, the connection states, failures of a peer that goes
// away, one instance per name, a peer that is not ours, copies and the serving thread.
#include "zubase/Pipe.h"
#include "zubase/platform/Pipe.h"

#include "rklib/RkLogFile.h"

#include <QElapsedTimer>
#include <QFile>
#include <QProcess>
#include <QRegularExpression>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QUuid>
#include <QtTest>

#include <memory>
#include <thread>

#include <unistd.h>

namespace {

const QString sPeer = QStringLiteral(ZUBASE_TEST_HELPER_DIR "/zu_pipe_peer");
const QString sWhere = QStringLiteral("src/core/zubase/Pipe:ZuBase::Pipe::");

// The bytes zu_pipe_peer sends and expects.
QByteArray pattern(int inSize)
{
    QByteArray bytes(inSize, '\0');
    for (int i = 0; i < inSize; ++i)
        bytes[i] = static_cast<char>((i * 31 + i / 251) & 0xFF);
    return bytes;
}

QString uniqueName()
{
    return QStringLiteral("zutest-") + QUuid::createUuid().toString(QUuid::WithoutBraces);
}

QStringList failureLines(const RkLogCapture& inCapture)
{
    QStringList lines;
    for (const std::string& text : inCapture.texts("Tz"))
        lines << QString::fromStdString(text).replace(QRegularExpression(R"(\(\d+\): )"), ": ");
    return lines;
}

QString socketPath(const QString& inName)
{
    std::string path;
    ZuPlatform::pipeSocketPath(("\\\\.\\pipe\\" + inName).toStdString(), path);
    return QString::fromStdString(path);
}

int countOf(const RkLogCapture& inCapture, const std::string& inText)
{
    int count = 0;
    for (const std::string& text : inCapture.texts())
        count += text == inText;
    return count;
}

} // namespace

class TestPipe : public QObject
{
    Q_OBJECT

private slots:
    void serverWritesToClientProcess_data();
    void serverWritesToClientProcess();
    void clientReadsFromServerProcess_data();
    void clientReadsFromServerProcess();
    void clientFirstCountsAsConnected();
    void acceptTimesOutWithoutClient();
    void secondClientFindsPipeBusy();
    void clientWaitsForServer();
    void noSuchPipe();
    void clientEndIsReadOnly();
    void oneServerPerName();
    void staleSocketDoesNotBlock();
    void clientDiesWhileServerWrites();
    void serverDiesWhileClientReads();
    void foreignPeerReadsStream();
    void copiesShareOneHandle();
    void closeTwiceIsHarmless();
    void pipeServerAcceptsAndPaces();
    void socketDirectoryIsPrivate();
};

void TestPipe::serverWritesToClientProcess_data()
{
    QTest::addColumn<int>("size");
    QTest::newRow("1") << 1;
    QTest::newRow("100") << 100;
    QTest::newRow("65537") << 65537;
    QTest::newRow("3 MiB + 11") << 3 * 1024 * 1024 + 11;
}

void TestPipe::serverWritesToClientProcess()
{
    QFETCH(int, size);
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    QVERIFY(server.isCreated());
    QProcess client;
    client.start(sPeer, {"client", name, QString::number(size)});
    RkLogCapture capture;
    QVERIFY(server.acceptOnServer().isOk());
    QVERIFY(server.isConnected());
    QCOMPARE(capture.texts(),
             std::vector<std::string>(
                 {"::ConnectNamedPipe() [" + name.toStdString() + "]", "pipeConnected"}));
    const QByteArray data = pattern(size);
    QVERIFY(server.write(data.constData(), unsigned(size)).isOk());
    QVERIFY(client.waitForFinished(20000));
    QCOMPARE(client.exitCode(), 0); // the client got exactly the pattern
}

void TestPipe::clientReadsFromServerProcess_data()
{
    QTest::addColumn<int>("size");
    QTest::addColumn<int>("pieces");
    QTest::newRow("100 in 60 and 40") << 100 << 60;
    QTest::newRow("odd size, one write") << 1000003 << 0;
    QTest::newRow("odd size, odd pieces") << 777777 << 4093;
}

void TestPipe::clientReadsFromServerProcess()
{
    QFETCH(int, size);
    QFETCH(int, pieces);
    const QString name = uniqueName();
    QProcess server;
    QStringList args{"server", name, QString::number(size)};
    if (pieces)
        args << QString::number(pieces);
    server.start(sPeer, args);
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isOk());
    QVERIFY(client.isConnected());
    QByteArray got(size, '\0');
    QVERIFY(client.read(got.data(), 0).isOk());
    QVERIFY(client.read(got.data(), unsigned(size)).isOk());
    QCOMPARE(got, pattern(size));
    client.close();
    QVERIFY(server.waitForFinished(10000));
    QCOMPARE(server.exitCode(), 0);
}

void TestPipe::clientFirstCountsAsConnected()
{
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isOk());
    QVERIFY(!server.isConnected());
    QVERIFY(server.acceptOnServer().isOk());
    QVERIFY(server.isConnected());
    const char text[] = "hello";
    QVERIFY(server.write(text, 5).isOk());
    char got[6] = {};
    QVERIFY(client.read(got, 5).isOk());
    QCOMPARE(QByteArray(got), QByteArray("hello"));
    // Further passes find the client connected at once.
    QVERIFY(server.acceptOnServer().isOk());
    // After the client has gone the pipe cannot be used again: accepting fails at once.
    client.close();
    RkLogCapture capture;
    QElapsedTimer timer;
    timer.start();
    QVERIFY(server.acceptOnServer().isBad());
    QVERIFY(timer.elapsed() < 900);
    QVERIFY(!server.isConnected());
    QVERIFY(capture.texts("Tz").empty());
}

void TestPipe::acceptTimesOutWithoutClient()
{
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    RkLogCapture capture;
    QElapsedTimer timer;
    timer.start();
    QVERIFY(server.acceptOnServer().isBad());
    QVERIFY(timer.elapsed() >= 900);
    QVERIFY(!server.isConnected());
    QCOMPARE(capture.texts(),
             std::vector<std::string>{"::ConnectNamedPipe() [" + name.toStdString() + "]"});
    // Nothing was left pending: a client that comes later is accepted by the next pass.
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isOk());
    QVERIFY(server.acceptOnServer().isOk());
    QVERIFY(server.write("x", 1).isOk());
    char got = 0;
    QVERIFY(client.read(&got, 1).isOk());
    QCOMPARE(got, 'x');
}

void TestPipe::secondClientFindsPipeBusy()
{
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    ZuBase::Pipe first(false);
    first.nameSet(name);
    QVERIFY(first.connectOnClient().isOk());
    QVERIFY(server.acceptOnServer().isOk());
    // One instance: a second client is refused with a record, and the first is undisturbed.
    RkLogCapture capture;
    ZuBase::Pipe second(false);
    second.nameSet(name);
    QVERIFY(second.connectOnClient().isBad());
    QVERIFY(!second.isConnected());
    QCOMPARE(failureLines(capture),
             QStringList({sWhere + "connectOnClient: ::CreateFile  val[-1]  notexp[-1]",
                          "last error 16: Device or resource busy"}));
    QVERIFY(server.write("z", 1).isOk());
    char got = 0;
    QVERIFY(first.read(&got, 1).isOk());
    QCOMPARE(got, 'z');
}

void TestPipe::clientWaitsForServer()
{
    const QString name = uniqueName();
    ZuBase::Pipe client(false);
    client.nameSet(name);
    RkResult res;
    std::thread connecting([&] { res = client.connectOnClient(); });
    QTest::qWait(300);
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    connecting.join();
    QVERIFY(res.isOk());
    QVERIFY(client.isConnected());
    QVERIFY(server.acceptOnServer().isOk());
}

void TestPipe::noSuchPipe()
{
    RkLogCapture capture;
    ZuBase::Pipe client(false);
    client.nameSet(uniqueName());
    QVERIFY(client.connectOnClient().isBad());
    QVERIFY(!client.isConnected());
    QVERIFY(!client.isCreated());
    QVERIFY(capture.texts("Tz").empty());
}

void TestPipe::clientEndIsReadOnly()
{
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isOk());
    QVERIFY(server.acceptOnServer().isOk());
    RkLogCapture capture;
    QVERIFY(client.write("abc", 3).isBad());
    QCOMPARE(failureLines(capture), QStringList({sWhere + "write: ::WriteFile  cond[b]",
                                                 "last error 9: Bad file descriptor"}));
    // The pipe still works the other way.
    QVERIFY(server.write("abc", 3).isOk());
    char got[3];
    QVERIFY(client.read(got, 3).isOk());
    QCOMPARE(QByteArray(got, 3), QByteArray("abc"));
}

void TestPipe::oneServerPerName()
{
    const QString name = uniqueName();
    ZuBase::Pipe first(true);
    first.nameSet(name);
    QVERIFY(first.createOnServer().isOk());
    RkLogCapture capture;
    ZuBase::Pipe second(true);
    second.nameSet(name);
    QVERIFY(second.createOnServer().isBad());
    QVERIFY(!second.isCreated());
    QCOMPARE(failureLines(capture),
             QStringList({sWhere + "createOnServer: ::CreateNamedPipe  val[-1]  notexp[-1]",
                          "last error 98: Address already in use"}));
    // Once the first has closed, the name is free again.
    first.close();
    QVERIFY(second.createOnServer().isOk());
}

void TestPipe::staleSocketDoesNotBlock()
{
    const QString name = uniqueName();
    QProcess crashed;
    crashed.start(sPeer, {"server", name, "10"});
    QTRY_VERIFY(QFile::exists(socketPath(name)));
    crashed.kill();
    QVERIFY(crashed.waitForFinished(5000));
    QVERIFY(QFile::exists(socketPath(name))); // left behind

    // A client finds no pipe rather than a busy one ...
    RkLogCapture capture;
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isBad());
    QVERIFY(capture.texts("Tz").empty());
    // ... and a new server takes the name.
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    QVERIFY(client.connectOnClient().isOk());
    QVERIFY(server.acceptOnServer().isOk());
}

void TestPipe::clientDiesWhileServerWrites()
{
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    QProcess client;
    client.start(sPeer, {"client-die", name, "1000"});
    QVERIFY(server.acceptOnServer().isOk());
    RkLogCapture capture;
    const QByteArray data = pattern(8 * 1024 * 1024); // far more than the socket holds
    QVERIFY(server.write(data.constData(), unsigned(data.size())).isBad());
    const QStringList failures = failureLines(capture);
    QCOMPARE(failures.value(0), sWhere + "write: ::WriteFile  cond[b]");
    QVERIFY(failures.value(1).startsWith("last error "));
    QVERIFY(client.waitForFinished(5000));
}

void TestPipe::serverDiesWhileClientReads()
{
    const QString name = uniqueName();
    QProcess server;
    server.start(sPeer, {"server-die", name, "1000"});
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isOk());
    RkLogCapture capture;
    QByteArray got(5000, '\0');
    QVERIFY(client.read(got.data(), 5000).isBad());
    QCOMPARE(got.left(1000), pattern(1000)); // what came before stays
    QCOMPARE(failureLines(capture),
             QStringList({sWhere + "read: ::ReadFile  cond[b]", "last error 32: Broken pipe"}));
    QVERIFY(server.waitForFinished(5000));
    // The dead server's socket is taken over and removed by the next one.
    ZuBase::Pipe next(true);
    next.nameSet(name);
    QVERIFY(next.createOnServer().isOk());
    next.close();
    QVERIFY(!QFile::exists(socketPath(name)));
}

void TestPipe::foreignPeerReadsStream()
{
    const QString socat = QStandardPaths::findExecutable("socat");
    if (socat.isEmpty())
        QSKIP("socat is not installed");
    const QString name = uniqueName();
    ZuBase::Pipe server(true);
    server.nameSet(name);
    QVERIFY(server.createOnServer().isOk());
    QTemporaryDir dir;
    const QString output = dir.filePath("received");
    QProcess reader;
    reader.start(socat, {"-u", "UNIX-CONNECT:" + socketPath(name), "CREATE:" + output});
    QVERIFY(reader.waitForStarted());
    QVERIFY(server.acceptOnServer().isOk());
    const QByteArray data = pattern(300007);
    QVERIFY(server.write(data.constData(), 100000).isOk());
    QVERIFY(server.write(data.constData() + 100000, 200007).isOk());
    server.close();
    QVERIFY(reader.waitForFinished(10000));
    QCOMPARE(reader.exitCode(), 0);
    QFile received(output);
    QVERIFY(received.open(QIODevice::ReadOnly));
    QCOMPARE(received.readAll(), data);
}

void TestPipe::copiesShareOneHandle()
{
    const QString name = uniqueName();
    auto server = std::make_unique<ZuBase::Pipe>(true);
    server->nameSet(name);
    QVERIFY(server->createOnServer().isOk());
    ZuBase::Pipe copy(*server);
    {
        ZuBase::Pipe another(true);
        another = copy;
        QCOMPARE(another.name(), name);
    } // a copy going away leaves the handle open
    server.reset();
    QVERIFY(copy.isCreated());
    ZuBase::Pipe client(false);
    client.nameSet(name);
    QVERIFY(client.connectOnClient().isOk());
    QVERIFY(copy.acceptOnServer().isOk());
    QVERIFY(copy.write("ok", 2).isOk());
    char got[2];
    QVERIFY(client.read(got, 2).isOk());
    QCOMPARE(QByteArray(got, 2), QByteArray("ok"));

    // close() on one copy closes the shared handle for all of them.
    ZuBase::Pipe third(copy);
    third.close();
    QVERIFY(!copy.isCreated());
    QVERIFY(!third.isConnected());
}

void TestPipe::closeTwiceIsHarmless()
{
    ZuBase::Pipe server(true);
    server.nameSet(uniqueName());
    QVERIFY(server.createOnServer().isOk());
    server.close();
    QVERIFY(!server.isCreated());
    RkLogCapture capture;
    server.close();
    QVERIFY(capture.entries().empty());
    QVERIFY(server.read(nullptr, 0).isOk()); // no transfer, no check
}

void TestPipe::pipeServerAcceptsAndPaces()
{
    const QString name = uniqueName();
    ZuBase::Pipe pipe(true);
    pipe.nameSet(name);
    RkLogCapture capture;
    {
        ZuBase::PipeServer serving;
        QVERIFY(serving.pipeSet(pipe).isOk());
        QVERIFY(pipe.isCreated());
        ZuBase::Pipe client(false);
        client.nameSet(name);
        QVERIFY(client.connectOnClient().isOk());
        QTRY_VERIFY(pipe.isConnected());
        const QByteArray data = pattern(4099);
        QVERIFY(pipe.write(data.constData(), unsigned(data.size())).isOk());
        QByteArray got(4099, '\0');
        QVERIFY(client.read(got.data(), unsigned(got.size())).isOk());
        QCOMPARE(got, data);
        // While the client stays, the serving thread does not spin.
        QTest::qWait(2500);
        QVERIFY(countOf(capture, "pipeConnected") <= 5);
    } // the destructor stops the thread
    QVERIFY(pipe.isCreated());

    // A pipe that cannot be created starts no thread.
    ZuBase::Pipe taken(true);
    taken.nameSet(name);
    ZuBase::PipeServer refused;
    QVERIFY(refused.pipeSet(taken).isBad());
    QVERIFY(!refused.isRunning());
}

void TestPipe::socketDirectoryIsPrivate()
{
    const QFileInfo socket(socketPath(uniqueName()));
    const QFileInfo dir(socket.absolutePath());
    QVERIFY(dir.isDir());
    QCOMPARE(dir.permissions() & (QFile::ReadGroup | QFile::WriteGroup | QFile::ExeGroup |
                                  QFile::ReadOther | QFile::WriteOther | QFile::ExeOther),
             QFile::Permissions());
    QCOMPARE(dir.ownerId(), uint(geteuid()));
}

QTEST_GUILESS_MAIN(TestPipe)
#include "tst_pipe.moc"
