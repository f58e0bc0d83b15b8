#include "zubase/BlockingHttpGet.h"

#include "rklib/RkLogFile.h"

#include <QEventLoop>
#include <QMutex>
#include <QMutexLocker>
#include <QNetworkAccessManager>
#include <QNetworkRequest>
#include <QTimer>

#include <algorithm>

namespace ZuBase {

std::unique_ptr<QNetworkReply>
blockingHttpGet(QNetworkAccessManager* inManager, const QUrl& inUrl, int inTimeoutMs,
                bool& outTimedOut, std::function<void(const QList<QSslError>&)> inOnSslErrors)
{
    static QMutex sSendMutex; // serialises only the sending call
    std::unique_ptr<QNetworkReply> reply;
    {
        QMutexLocker lock(&sSendMutex);
        reply.reset(inManager->get(QNetworkRequest(inUrl)));
    }

    QEventLoop loop;
    QTimer timer;
    timer.setSingleShot(true);
    QObject::connect(&timer, &QTimer::timeout, &loop, &QEventLoop::quit);
    QObject::connect(reply.get(), &QNetworkReply::finished, &loop, &QEventLoop::quit);
    // An empty function would throw std::bad_function_call out of the event loop.
    QMetaObject::Connection sslConnection;
    if (inOnSslErrors)
        sslConnection = QObject::connect(reply.get(), &QNetworkReply::sslErrors, inOnSslErrors);

    if (!reply->isFinished()) {
        timer.start(std::max(0, inTimeoutMs));
        loop.exec();
    }
    // The reply tells whether it came in time; the timer would read active for ever if it had
    // been given a negative interval.
    if (!reply->isFinished()) {
        outTimedOut = true;
        reply->abort();
    }
    QObject::disconnect(reply.get(), nullptr, &loop, nullptr);
    QObject::disconnect(sslConnection);
    return reply;
}

void logSSLErrors(const QList<QSslError>& inErrors)
{
    for (const QSslError& error : inErrors)
        getTheLogInstance().warnf("HTTP GET SSL error: %s",
                                  error.errorString().toLocal8Bit().constData());
}

void ignoreSSLErrors(const QList<QSslError>&) {}

} // namespace ZuBase
