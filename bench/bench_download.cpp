// Download of 256 MiB from the loopback HTTPS test server: ZuDownload against the same Qt request
// written straight to a file and against curl, in the same run; and the growth of the process's
// peak memory during the ZuDownload transfer, which must stay far below the file's size.
#include "../tests/auto/network/HttpsTestServer.h"

#include "zubase/ZuDownload.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QFile>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QSslConfiguration>

#include <cstdio>

namespace {

constexpr qint64 sSize = 256LL * 1024 * 1024;
constexpr int sRounds = 3;

// A value of /proc/self/status in KiB ("VmHWM", "VmRSS").
qint64 statusKiB(const char* inKey)
{
    QFile status("/proc/self/status");
    status.open(QIODevice::ReadOnly);
    for (const QByteArray& line : status.readAll().split('\n'))
        if (line.startsWith(inKey))
            return line.mid(int(qstrlen(inKey)) + 1).trimmed().split(' ').value(0).toLongLong();
    return -1;
}

// Seconds for one ZuDownload of inPath into inFile; negative on failure.
double zuDownload(const QString& inServer, const QString& inCert, const QString& inPath,
                  const QString& inFile)
{
    QFile::remove(inFile);
    ZuDownload& download = ZuDownload::instance();
    download.trustCertificateFile(inCert);
    QEventLoop loop; // it deletes itself once done
    QObject::connect(&download, &QObject::destroyed, &loop, &QEventLoop::quit);
    QElapsedTimer clock;
    clock.start();
    download.start(inServer, inPath, inFile);
    loop.exec();
    const double seconds = clock.elapsed() / 1000.0;
    return QFileInfo(inFile).size() == sSize ? seconds : -1;
}

// The same GET through a plain QNetworkAccessManager, each chunk written straight to the file.
double qtDirect(const QUrl& inUrl, const QString& inCert, const QString& inFile)
{
    QNetworkAccessManager manager;
    QNetworkRequest request(inUrl);
    QSslConfiguration ssl = QSslConfiguration::defaultConfiguration();
    ssl.addCaCertificates(inCert);
    request.setSslConfiguration(ssl);
    QFile file(inFile);
    file.open(QIODevice::WriteOnly);
    QElapsedTimer clock;
    clock.start();
    QNetworkReply* reply = manager.get(request);
    QObject::connect(reply, &QNetworkReply::readyRead, [&] { file.write(reply->readAll()); });
    while (!reply->isFinished())
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    file.write(reply->readAll());
    file.close();
    const double seconds = clock.elapsed() / 1000.0;
    delete reply;
    return file.size() == sSize ? seconds : -1;
}

double curl(const QUrl& inUrl, const QString& inCert, const QString& inFile)
{
    QProcess process;
    QElapsedTimer clock;
    clock.start();
    process.start("curl", {"-sS", "--cacert", inCert, "-o", inFile, inUrl.toString()});
    process.waitForFinished(-1);
    const double seconds = clock.elapsed() / 1000.0;
    return process.exitCode() == 0 && QFileInfo(inFile).size() == sSize ? seconds : -1;
}

} // namespace

int main(int argc, char** argv)
{
    QApplication app(argc, argv);
    HttpsTestServer server;
    const QString cert = server.makeCertificate("server");
    if (cert.isEmpty() || !server.start(ZU_HTTPS_SERVER, "server")) {
        std::fprintf(stderr, "cannot start the HTTPS server\n");
        return 1;
    }
    const QString path = QStringLiteral("/file?size=%1").arg(sSize);
    const QUrl url("https://" + server.server() + path);
    const QString file = server.dir.filePath("download.bin");

    // Warm up: TLS libraries, the first connection.
    zuDownload(server.server(), cert, "/file?size=1000", file);
    QFile clearRefs("/proc/self/clear_refs");
    const bool peakReset = clearRefs.open(QIODevice::WriteOnly) && clearRefs.write("5") == 1;
    clearRefs.close();
    const qint64 rssBefore = statusKiB("VmRSS:");
    const double firstZu = zuDownload(server.server(), cert, path, file);
    const qint64 growth = statusKiB("VmHWM:") - rssBefore;

    double zu = firstZu, qt = 1e9, cu = 1e9;
    for (int round = 0; round < sRounds; ++round) {
        if (round > 0)
            zu = std::min(zu, zuDownload(server.server(), cert, path, file));
        qt = std::min(qt, qtDirect(url, cert, file));
        cu = std::min(cu, curl(url, cert, file));
    }
    if (firstZu < 0 || zu < 0 || qt < 0 || cu < 0) {
        std::fprintf(stderr, "a transfer failed\n");
        return 1;
    }
    const double mib = sSize / 1048576.0;
    std::printf("download of %.0f MiB, best of %d: ZuDownload %.0f MiB/s, Qt straight to a file "
                "%.0f MiB/s, curl %.0f MiB/s\n",
                mib, sRounds, mib / zu, mib / qt, mib / cu);
    std::printf("ratio ZuDownload / Qt straight: %.2f, ZuDownload / curl: %.2f (goal >= 0.8)\n",
                qt / zu, cu / zu);
    std::printf("peak memory growth during the ZuDownload transfer: %.1f MiB (goal < 32 MiB)%s\n",
                growth / 1024.0, peakReset ? "" : " (peak could not be reset)");
    return 0;
}
