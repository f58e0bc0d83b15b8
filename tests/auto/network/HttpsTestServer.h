#pragma once

// The loopback HTTPS server of the download tests and benchmark: zu_https_server run as a child
// with a certificate made here by openssl. The body of every answer is patternBytes().
#include <QByteArray>
#include <QProcess>
#include <QStandardPaths>
#include <QStringList>
#include <QTemporaryDir>

// The file the server sends for a size: a pattern that repeats only every 256 KiB.
inline QByteArray patternBytes(qint64 inOffset, qint64 inCount)
{
    QByteArray bytes(int(inCount), Qt::Uninitialized);
    for (qint64 i = 0; i < inCount; ++i)
        bytes[int(i)] = char(((inOffset + i) * 7 + ((inOffset + i) >> 10)) & 0xff);
    return bytes;
}

class HttpsTestServer
{
public:
    QTemporaryDir dir;

    // A self-signed certificate for 127.0.0.1 as <name>.pem with its key <name>.key.
    QString makeCertificate(const QString& inName)
    {
        const QString cert = dir.filePath(inName + ".pem");
        QProcess openssl;
        openssl.setProcessChannelMode(QProcess::ForwardedErrorChannel);
        openssl.start("openssl", {"req", "-x509", "-newkey", "ec", "-pkeyopt",
                                  "ec_paramgen_curve:prime256v1", "-nodes", "-days", "2", "-subj",
                                  "/CN=127.0.0.1", "-addext", "subjectAltName=IP:127.0.0.1",
                                  "-keyout", dir.filePath(inName + ".key"), "-out", cert});
        const bool made = openssl.waitForFinished(60000) && openssl.exitCode() == 0;
        return made ? cert : QString();
    }

    // Starts the server with the certificate <name>; false when it does not come up.
    bool start(const QString& inProgram, const QString& inName)
    {
        mProcess.setProcessChannelMode(QProcess::ForwardedErrorChannel);
        mProcess.start(inProgram, {dir.filePath(inName + ".pem"), dir.filePath(inName + ".key")});
        if (!mProcess.waitForReadyRead(30000))
            return false;
        mPort = mProcess.readLine().trimmed().mid(5).toUShort(); // "port N"
        return mPort != 0;
    }

    ~HttpsTestServer()
    {
        mProcess.kill();
        mProcess.waitForFinished();
    }

    QString server() const { return QStringLiteral("127.0.0.1:%1").arg(mPort); }

    // The requests seen since the last call, as "METHOD target".
    QStringList takeRequests()
    {
        mProcess.waitForReadyRead(50);
        QStringList lines;
        while (mProcess.canReadLine())
            lines << QString::fromLatin1(mProcess.readLine().trimmed());
        return lines;
    }

private:
    QProcess mProcess;
    quint16 mPort = 0;
};
