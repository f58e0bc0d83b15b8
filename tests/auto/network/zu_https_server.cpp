// A small HTTPS/1.1 server on 127.0.0.1 for the download tests and benchmark.
//   zu_https_server <certificate.pem> <key.pem>
// Prints "port N", then "METHOD target" for every request. The query of the target shapes the
// answer: size=N (body of N pattern bytes), nolength=1 (no Content-Length, close after the
// body), headstatus=S / getstatus=S (answer S), headlength=N (HEAD claims N bytes), stall=K
// (send K bytes, then nothing), truncate=K (close after K bytes), delay=MS (wait first),
// hold=MS (wait between the header and the body),
// redirect=URL (302 to URL), deflate=1 (compress when the client accepts it).
#include "HttpsTestServer.h"

#include <QCoreApplication>
#include <QFile>
#include <QPointer>
#include <QSslKey>
#include <QSslSocket>
#include <QTcpServer>
#include <QTimer>
#include <QUrlQuery>

#include <cstdio>

#include <csignal>
#include <sys/prctl.h>

namespace {

QSslCertificate sCertificate;
QSslKey sKey;
const QByteArray sPattern = patternBytes(0, 256 * 1024 + 64 * 1024);

struct Connection : QObject
{
    QSslSocket* socket = nullptr;
    QByteArray input;
    bool busy = false;
    qint64 offset = 0;
    qint64 stopAt = 0; // the body ends here (or stalls / breaks off)
    bool closeAfter = false;
    bool stall = false;
    bool hold = false;

    void onReadyRead()
    {
        input += socket->readAll();
        next();
    }

    void next()
    {
        const int end = input.indexOf("\r\n\r\n");
        if (busy || end < 0)
            return;
        const QList<QByteArray> lines = input.left(end).split('\n');
        input.remove(0, end + 4);
        const QList<QByteArray> first = lines.value(0).trimmed().split(' ');
        const QByteArray method = first.value(0);
        QByteArray acceptEncoding;
        for (const QByteArray& line : lines) {
            if (line.toLower().startsWith("accept-encoding:"))
                acceptEncoding = line.mid(16).trimmed();
        }
        std::printf("%s %s\n", method.constData(), first.value(1).constData());
        std::fflush(stdout);
        busy = true;
        const QUrlQuery query(QUrl(QString::fromLatin1(first.value(1))));
        const int delay = query.queryItemValue("delay").toInt();
        QPointer<QSslSocket> guard(socket);
        QTimer::singleShot(delay, this, [this, guard, method, query, acceptEncoding] {
            if (guard)
                answer(method == "HEAD", query, acceptEncoding);
        });
    }

    void answer(bool inHead, const QUrlQuery& inQuery, const QByteArray& inAcceptEncoding)
    {
        auto value = [&](const char* inKey, qint64 inDefault) {
            const QString text = inQuery.queryItemValue(inKey, QUrl::FullyDecoded);
            return text.isEmpty() ? inDefault : text.toLongLong();
        };
        const qint64 size = value("size", 0);
        const int status = int(value(inHead ? "headstatus" : "getstatus", 200));
        QByteArray head = "HTTP/1.1 " + QByteArray::number(status) + " Whatever\r\n";
        QByteArray body;
        offset = 0;
        stopAt = size;
        closeAfter = value("nolength", 0) != 0;
        stall = false;
        if (inQuery.hasQueryItem("redirect")) {
            head = "HTTP/1.1 302 Found\r\nLocation: " +
                   inQuery.queryItemValue("redirect", QUrl::FullyDecoded).toLatin1() + "\r\n";
            stopAt = 0;
        } else if (status != 200) {
            body = "error\n";
            stopAt = 0;
        } else if (value("deflate", 0) && inAcceptEncoding.contains("deflate")) {
            body = qCompress(patternBytes(0, size)).mid(4); // a zlib stream, as HTTP wants it
            head += "Content-Encoding: deflate\r\n";
            stopAt = 0;
        }
        qint64 length = body.isEmpty() ? stopAt : body.size();
        if (inHead)
            length = value("headlength", length);
        if (!closeAfter)
            head += "Content-Length: " + QByteArray::number(length) + "\r\n";
        else
            head += "Connection: close\r\n";
        socket->write(head + "\r\n");
        if (inHead) {
            stopAt = 0;
        } else {
            socket->write(body);
            if (inQuery.hasQueryItem("stall"))
                stopAt = value("stall", 0), stall = true;
            else if (inQuery.hasQueryItem("truncate"))
                stopAt = value("truncate", 0), closeAfter = true;
        }
        hold = !inHead && inQuery.hasQueryItem("hold");
        if (hold) {
            QTimer::singleShot(int(value("hold", 0)), this, [this] {
                hold = false;
                pump();
            });
        }
        pump();
    }

    // Writes the body in slices while the socket keeps up, so that memory stays flat.
    void pump()
    {
        if (!busy || hold)
            return;
        while (offset < stopAt &&
               socket->bytesToWrite() + socket->encryptedBytesToWrite() < 1 << 20) {
            const qint64 n = std::min<qint64>(64 * 1024, stopAt - offset);
            socket->write(sPattern.constData() + offset % (256 * 1024), n);
            offset += n;
        }
        if (offset < stopAt || stall)
            return;
        busy = false;
        if (closeAfter)
            socket->disconnectFromHost();
        else
            next();
    }
};

class Server : public QTcpServer
{
protected:
    void incomingConnection(qintptr inDescriptor) override
    {
        auto* socket = new QSslSocket(this);
        auto* connection = new Connection;
        connection->setParent(socket);
        connection->socket = socket;
        socket->setSocketDescriptor(inDescriptor);
        socket->setLocalCertificate(sCertificate);
        socket->setPrivateKey(sKey);
        connect(socket, &QSslSocket::readyRead, connection, &Connection::onReadyRead);
        connect(socket, &QSslSocket::encryptedBytesWritten, connection, &Connection::pump);
        connect(socket, &QSslSocket::disconnected, socket, &QObject::deleteLater);
        socket->startServerEncryption();
    }
};

QByteArray readFile(const char* inPath)
{
    QFile file(QString::fromLocal8Bit(inPath));
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

} // namespace

int main(int argc, char** argv)
{
    prctl(PR_SET_PDEATHSIG, SIGTERM); // never outlive the test that started us
    QCoreApplication app(argc, argv);
    if (argc != 3)
        return 2;
    sCertificate = QSslCertificate(readFile(argv[1]));
    sKey = QSslKey(readFile(argv[2]), QSsl::Ec);
    Server server;
    if (sCertificate.isNull() || sKey.isNull() || !server.listen(QHostAddress::LocalHost))
        return 1;
    std::printf("port %d\n", server.serverPort());
    std::fflush(stdout);
    return app.exec();
}
