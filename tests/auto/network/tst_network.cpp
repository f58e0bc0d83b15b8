// Peer names of real connections, and what a socket without an IP peer gives.
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
    void peerNameFailure();
};

void TestNetwork::peerName_data()
{
    QTest::addColumn<int>("listenOn"); // QHostAddress::SpecialAddress
    QTest::addColumn<QString>("connectTo");
    QTest::newRow("IPv4") << int(QHostAddress::LocalHost) << "127.0.0.1";
    QTest::newRow("IPv6") << int(QHostAddress::LocalHostIPv6) << "::1";
    // An IPv4 client of a dual-stack server arrives as ::ffff:127.0.0.1.
    QTest::newRow("IPv4-mapped IPv6") << int(QHostAddress::Any) << "127.0.0.1";
}

void TestNetwork::peerName()
{
    QFETCH(int, listenOn);
    QFETCH(QString, connectTo);
    QTcpServer server;
    if (!server.listen(QHostAddress(static_cast<QHostAddress::SpecialAddress>(listenOn))))
        QSKIP(qPrintable("cannot listen: " + server.errorString()));
    QTcpSocket client;
    client.connectToHost(QHostAddress(connectTo), server.serverPort());
    QVERIFY(client.waitForConnected(10000) && server.waitForNewConnection(10000));
    QTcpSocket* accepted = server.nextPendingConnection();
    RkLogCapture capture;
    QCOMPARE(ZuNetwork::getPeerName(int(accepted->socketDescriptor())), connectTo);
    QCOMPARE(ZuNetwork::getPeerName(int(client.socketDescriptor())), connectTo);
    QCOMPARE(logLines(capture), QStringList());
}

void TestNetwork::peerNameFailure()
{
    // Each failure is one error line without a category, and an empty name.
    int pair[2] = {-1, -1};
    QCOMPARE(::socketpair(AF_UNIX, SOCK_STREAM, 0, pair), 0);
    const int unconnected = ::socket(AF_INET, SOCK_STREAM, 0);
    RkLogCapture capture;
    for (const int fd : {9999, unconnected, pair[0]})
        QCOMPARE(ZuNetwork::getPeerName(fd), QString());
    for (const int fd : {unconnected, pair[0], pair[1]})
        ::close(fd);
    QCOMPARE(logLines(capture, "", RkLogError),
             QStringList({"getpeername() failed: Bad file descriptor",
                          "getpeername() failed: Transport endpoint is not connected",
                          "getpeername() failed: Address family not supported by protocol"}));
    QCOMPARE(logLines(capture).size(), 3);
}

QTEST_GUILESS_MAIN(TestNetwork)
#include "tst_network.moc"
