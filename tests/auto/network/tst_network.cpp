// Peer names of real connections, and what a socket without a peer gives.
#include "TestSupport.h"
#include "zubase/ZuNetwork.h"

#include <QTcpServer>
#include <QTcpSocket>

#include <sys/socket.h>
#include <unistd.h>

using TestSupport::logLines;

class TestNetwork : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void peerName_data();
    void peerName();
    void peerNameFailure_data();
    void peerNameFailure();
};

void TestNetwork::peerName_data()
{
    QTest::addColumn<int>("listenOn"); // QHostAddress::SpecialAddress
    QTest::addColumn<QString>("connectTo");
    QTest::addColumn<int>("acceptedFamily");
    QTest::newRow("IPv4") << int(QHostAddress::LocalHost) << "127.0.0.1" << int(AF_INET);
    QTest::newRow("IPv6") << int(QHostAddress::LocalHostIPv6) << "::1" << int(AF_INET6);
    // An IPv4 client of a dual-stack server arrives as ::ffff:127.0.0.1.
    QTest::newRow("IPv4-mapped IPv6") << int(QHostAddress::Any) << "127.0.0.1" << int(AF_INET6);
}

void TestNetwork::peerName()
{
    QFETCH(int, listenOn);
    QFETCH(QString, connectTo);
    QFETCH(int, acceptedFamily);
    const QHostAddress address(static_cast<QHostAddress::SpecialAddress>(listenOn));
    QTcpServer server;
    if (!server.listen(address))
        QSKIP(qPrintable("cannot listen on " + address.toString() + ": " + server.errorString()));
    QTcpSocket client;
    client.connectToHost(QHostAddress(connectTo), server.serverPort());
    QVERIFY(client.waitForConnected(10000));
    QVERIFY(server.waitForNewConnection(10000));
    QTcpSocket* accepted = server.nextPendingConnection();
    QVERIFY(accepted);
    const int fd = int(accepted->socketDescriptor());
    sockaddr_storage own{};
    socklen_t length = sizeof own;
    QCOMPARE(::getsockname(fd, reinterpret_cast<sockaddr*>(&own), &length), 0);
    QCOMPARE(int(own.ss_family), acceptedFamily);

    RkLogCapture capture;
    QCOMPARE(ZuNetwork::getPeerName(fd), connectTo);
    QCOMPARE(ZuNetwork::getPeerName(int(client.socketDescriptor())), connectTo);
    QCOMPARE(logLines(capture), QStringList());
}

void TestNetwork::peerNameFailure_data()
{
    QTest::addColumn<int>("family"); // of an unconnected socket; 0: a descriptor that is not open
    QTest::addColumn<QString>("line");
    QTest::newRow("closed descriptor") << 0 << "getpeername() failed: Bad file descriptor";
    QTest::newRow("not connected")
        << int(AF_INET) << "getpeername() failed: Transport endpoint is not connected";
    QTest::newRow("no IP peer") << int(AF_UNIX)
                                << "getpeername() failed: Address family not "
                                   "supported by protocol";
}

void TestNetwork::peerNameFailure()
{
    QFETCH(int, family);
    QFETCH(QString, line);
    int fd = 9999; // not open
    int peer[2] = {-1, -1};
    if (family == AF_UNIX && ::socketpair(AF_UNIX, SOCK_STREAM, 0, peer) == 0)
        fd = peer[0];
    else if (family)
        fd = ::socket(family, SOCK_STREAM, 0);
    RkLogCapture capture;
    QCOMPARE(ZuNetwork::getPeerName(fd), QString());
    for (int open : {fd, peer[1]})
        if (open >= 0 && open != 9999)
            ::close(open);
    // One error line without a category.
    QCOMPARE(logLines(capture, "", RkLogError), QStringList{line});
    QCOMPARE(logLines(capture).size(), 1);
}

QTEST_GUILESS_MAIN(TestNetwork)
#include "tst_network.moc"
