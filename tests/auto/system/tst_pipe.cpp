// Named pipes: transfers between processes, the connection states, a peer that goes away, one
// instance per name, socket names, copies and the serving thread.
#include "TestSupport.h"

#include "zubase/Pipe.h"
#include "zubase/platform/SysPipe.h"

#include <memory>
#include <thread>

#include <sys/stat.h>
#include <unistd.h>

using TestSupport::failureLines;

namespace {

const QString kWhere = QStringLiteral("src/core/zubase/Pipe:ZuBase::Pipe::");

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
    return "zutest-" + QUuid::createUuid().toString(QUuid::WithoutBraces);
}

QString socketPath(const QString& inName)
{
    std::string path;
    ZuPlatform::pipeSocketPath(("\\\\.\\pipe\\" + inName).toStdString(), path);
    return QString::fromStdString(path);
}

// Whether inText goes from inServer to inClient unchanged.
bool passes(ZuBase::Pipe& inServer, ZuBase::Pipe& inClient, const QByteArray& inText)
{
    QByteArray got(inText.size(), '\0');
    return inServer.write(inText.constData(), unsigned(inText.size())).isOk() &&
           inClient.read(got.data(), unsigned(got.size())).isOk() && got == inText;
}

// Both ends of one name, neither open yet.
struct Ends
{
    explicit Ends(const QString& inName = uniqueName()) : name(inName)
    {
        server.nameSet(name);
        client.nameSet(name);
    }
    QString name;
    ZuBase::Pipe server{true};
    ZuBase::Pipe client{false};
};

} // namespace

class TestPipe : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void transferAcrossProcesses_data();
    void transferAcrossProcesses();
    void acceptStates();
    void oneInstanceAndReadOnlyClient();
    void privateSocketWithoutLiveServer();
    void socketNames_data();
    void socketNames();
    void copiesShareOneHandle();
    void pipeServerAcceptsAndPaces();
};

void TestPipe::transferAcrossProcesses_data()
{
    QTest::addColumn<QString>("peerMode"); // zu_pipe_peer's mode
    QTest::addColumn<int>("size");
    QTest::addColumn<int>("piece"); // the peer server's writes, 0: one
    QTest::newRow("to client: 3 MiB + 11") << "client" << 3 * 1024 * 1024 + 11 << 0;
    QTest::newRow("from server: odd size, odd pieces") << "server" << 77777 << 4093;
    // The transfer ends with a record; no signal kills us, nothing hangs.
    QTest::newRow("client dies while we write") << "client-die" << 1000 << 0;
    QTest::newRow("server dies while we read") << "server-die" << 1000 << 0;
}

void TestPipe::transferAcrossProcesses()
{
    QFETCH(QString, peerMode);
    QFETCH(int, size);
    QFETCH(int, piece);
    const bool dies = peerMode.endsWith("-die");
    const QString name = uniqueName();
    QStringList args{peerMode, name, QString::number(size)};
    if (piece)
        args << QString::number(piece);
    ZuBase::Pipe pipe(peerMode.startsWith("client"));
    pipe.nameSet(name);
    QProcess peer;
    RkLogCapture capture;
    RkResult res;
    if (pipe.isServer()) {
        QVERIFY_OK(pipe.createOnServer());
        peer.start(TestSupport::helper("zu_pipe_peer"), args);
        QVERIFY_OK(pipe.acceptOnServer());
        const QByteArray data = pattern(dies ? 8 * 1024 * 1024 : size); // dying: more than fits
        res = pipe.write(data.constData(), unsigned(data.size()));
    } else {
        peer.start(TestSupport::helper("zu_pipe_peer"), args);
        QVERIFY_OK(pipe.connectOnClient());
        QVERIFY(pipe.isConnected() && pipe.isClient());
        QByteArray got(dies ? 5000 : size, '\0');
        QVERIFY_OK(pipe.read(got.data(), 0));
        res = pipe.read(got.data(), unsigned(got.size()));
        QCOMPARE(got.left(size), pattern(size)); // also what came before a failure
    }
    QCOMPARE(failureLines(capture).value(0),
             !dies ? QString()
                   : kWhere + (pipe.isServer() ? "write: ::WriteFile" : "read: ::ReadFile") +
                         "  cond[b]");
    QCOMPARE(res.isOk(), !dies);
    pipe.close(); // what was sent stays readable for the peer
    QVERIFY(peer.waitForFinished(20000));
    QCOMPARE(peer.exitCode(), 0); // a client peer got exactly the pattern
    // A server that died leaves its files; the next server of the name takes them over and
    // removes them when it closes.
    ZuBase::Pipe next(true);
    next.nameSet(name);
    QVERIFY_OK(next.createOnServer());
    next.close();
    QVERIFY(!QFile::exists(socketPath(name)) &&
            !QFile::exists(socketPath(name).replace(".pipe", ".lock")));
}

void TestPipe::acceptStates()
{
    // Sockets live in a folder of ours that nobody else may enter, also after it was opened up.
    Ends ends;
    const QByteArray dir = QFile::encodeName(QFileInfo(socketPath(ends.name)).absolutePath());
    QCOMPARE(::chmod(dir.constData(), 0755), 0);
    QVERIFY_OK(ends.server.createOnServer());
    struct stat info;
    QVERIFY(::stat(dir.constData(), &info) == 0 && info.st_uid == geteuid());
    QCOMPARE(info.st_mode & 0777, 0700u);
    // No client: a bad result after the time-out, and nothing left pending.
    RkLogCapture capture;
    QElapsedTimer timer;
    timer.start();
    QVERIFY(ends.server.acceptOnServer().isBad() && !ends.server.isConnected());
    QVERIFY(timer.elapsed() >= 900);
    // A client that connects before the next pass counts as connected; further passes find it
    // connected at once.
    QVERIFY_OK(ends.client.connectOnClient());
    QVERIFY_OK(ends.server.acceptOnServer());
    QVERIFY(ends.server.isConnected() && passes(ends.server, ends.client, "hello"));
    QVERIFY_OK(ends.server.acceptOnServer());
    const std::string accepting = "::ConnectNamedPipe() [" + ends.name.toStdString() + "]";
    QCOMPARE(capture.texts(), std::vector<std::string>({accepting, accepting, "pipeConnected",
                                                        accepting, "pipeConnected"}));
    // After the client has gone the pipe cannot be used again: accepting fails at once.
    ends.client.close();
    capture.clear();
    timer.restart();
    QVERIFY(ends.server.acceptOnServer().isBad() && !ends.server.isConnected());
    QVERIFY(timer.elapsed() < 900 && capture.texts("Tz").empty());
}

void TestPipe::oneInstanceAndReadOnlyClient()
{
    Ends ends, second(ends.name);
    QVERIFY_OK(ends.server.createOnServer());
    // Creating again replaces our own server end instead of competing with it.
    QVERIFY_OK(ends.server.createOnServer());
    QVERIFY_OK(ends.client.connectOnClient());
    RkLogCapture capture;
    // A second client finds the one instance taken at once, before and after the accept.
    QElapsedTimer timer;
    timer.start();
    QVERIFY(second.client.connectOnClient().isBad() && timer.elapsed() < 1000);
    QVERIFY_OK(ends.server.acceptOnServer());
    QVERIFY(second.client.connectOnClient().isBad() && !second.client.isConnected());
    // A second server is refused as well, and the client end cannot write.
    QVERIFY(second.server.createOnServer().isBad() && !second.server.isCreated());
    QVERIFY(ends.client.write("abc", 3).isBad());
    const QString busy = kWhere + "connectOnClient: ::CreateFile  val[-1]  notexp[-1]";
    QCOMPARE(
        failureLines(capture),
        QStringList({busy, "last error 16: Device or resource busy", busy,
                     "last error 16: Device or resource busy",
                     kWhere + "createOnServer: ::CreateNamedPipe  val[-1]  notexp[-1]",
                     "last error 98: Address already in use",
                     kWhere + "write: ::WriteFile  cond[b]", "last error 9: Bad file descriptor"}));
    // None of that disturbs the connected pair; once the server has closed, the name is free.
    QVERIFY(passes(ends.server, ends.client, "abc"));
    ends.server.close();
    QVERIFY_OK(second.server.createOnServer());
}

void TestPipe::privateSocketWithoutLiveServer()
{
    Ends ends;
    QProcess crashed;
    crashed.start(TestSupport::helper("zu_pipe_peer"), {"server", ends.name, "10"});
    QTRY_VERIFY(QFile::exists(socketPath(ends.name)));
    // A server that was killed leaves its socket behind: a client finds no pipe (after the
    // wait for a server), rather than a busy one ...
    crashed.kill();
    QVERIFY(crashed.waitForFinished(5000));
    RkLogCapture capture;
    QVERIFY(ends.client.connectOnClient().isBad() && !ends.client.isConnected());
    QVERIFY(!ends.client.isCreated() && capture.texts("Tz").empty());
    // ... while a client that waits for a server gets the new one.
    RkResult res;
    std::thread connecting([&] { res = ends.client.connectOnClient(); });
    QTest::qWait(300);
    QVERIFY_OK(ends.server.createOnServer());
    connecting.join();
    QVERIFY_OK(res);
    QVERIFY_OK(ends.server.acceptOnServer());
}

void TestPipe::socketNames_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("file");
    const QString run = uniqueName();
    const QString longName = run + QString(240, 'y');
    const QByteArray digest =
        QCryptographicHash::hash(longName.toLocal8Bit(), QCryptographicHash::Sha256).toHex();
    QTest::newRow("plain") << run + "Plain_1.x" << run + "Plain_1.x.pipe";
    QTest::newRow("escaped") << run + QString::fromUtf8(" a/b\\~\u00fc")
                             << run + "%20a%2Fb%5C%7E%C3%BC.pipe";
    QTest::newRow("too long for a socket path")
        << longName << "~" + QString::fromLatin1(digest.left(32)) + ".pipe";
}

void TestPipe::socketNames()
{
    QFETCH(QString, name);
    QFETCH(QString, file);
    QCOMPARE(QFileInfo(socketPath(name)).fileName(), file);
    // Usable, and apart from a name that differs only at its end.
    Ends ends(name), other(name + "2");
    QVERIFY_OK(ends.server.createOnServer());
    QVERIFY_OK(other.server.createOnServer());
    QVERIFY_OK(ends.client.connectOnClient());
    QVERIFY_OK(ends.server.acceptOnServer());
    QVERIFY(passes(ends.server, ends.client, "x"));
}

void TestPipe::copiesShareOneHandle()
{
    Ends ends, idle;
    auto server = std::make_unique<ZuBase::Pipe>(true);
    server->nameSet(ends.name);
    QVERIFY_OK(server->createOnServer());
    QVERIFY_OK(idle.server.createOnServer());
    ZuBase::Pipe copy(*server), accepting(idle.server);
    {
        ZuBase::Pipe another(false);
        another = copy;
        QVERIFY(another.isServer() && another.name() == ends.name);
    } // a copy going away leaves the handle open
    server.reset();
    QVERIFY_OK(ends.client.connectOnClient());
    QVERIFY_OK(copy.acceptOnServer());
    ZuBase::Pipe connected(copy), reading(ends.client);
    QVERIFY(connected.isConnected() && passes(connected, ends.client, "ok"));

    // close() on one copy closes the shared handle for all of them, and ends an accept or a
    // read that waits in another thread; again it is harmless.
    RkResult read;
    char byte = 0;
    std::thread reader([&] { read = reading.read(&byte, 1); });
    std::thread acceptor([&] { accepting.acceptOnServer(); });
    QElapsedTimer timer;
    timer.start();
    QTest::qWait(100);
    ends.client.close();
    idle.server.close();
    reader.join();
    acceptor.join();
    QVERIFY2(timer.elapsed() < 800, qPrintable(QString::number(timer.elapsed())));
    QVERIFY(read.isBad());
    connected.close();
    QVERIFY(!copy.isCreated() && !connected.isConnected());
    RkLogCapture capture;
    copy.close();
    QVERIFY(capture.entries().empty() && copy.read(nullptr, 0).isOk()); // no transfer, no check
}

void TestPipe::pipeServerAcceptsAndPaces()
{
    Ends ends;
    RkLogCapture capture;
    QElapsedTimer stopping;
    {
        ZuBase::PipeServer serving;
        QVERIFY_OK(serving.pipeSet(ends.server));
        QVERIFY_OK(ends.client.connectOnClient());
        QTRY_VERIFY(ends.server.isConnected());
        QVERIFY(passes(ends.server, ends.client, pattern(4099)));
        // While the client stays, the serving thread does not spin.
        const auto passCount = [&capture] {
            return capture.texts().size();
        };
        QTest::qWait(1200);
        const std::size_t seen = passCount();
        QVERIFY(seen <= 6);
        QTRY_VERIFY(passCount() > seen); // a pass has just begun ...
        stopping.start();
    } // ... and the destructor stops the thread without waiting for its pace
    QVERIFY2(stopping.elapsed() < 500, qPrintable(QString::number(stopping.elapsed())));
    QVERIFY(ends.server.isCreated());

    // A pipe that cannot be created starts no thread.
    ZuBase::Pipe taken(true);
    taken.nameSet(ends.name);
    ZuBase::PipeServer refused;
    QVERIFY(refused.pipeSet(taken).isBad() && !refused.isRunning());
}

QTEST_GUILESS_MAIN(TestPipe)
#include "tst_pipe.moc"
