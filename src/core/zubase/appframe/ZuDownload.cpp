#include "zubase/ZuDownload.h"

#include "zubase/ZuProgressDialog.h"

#include "rklib/RkLogFile.h"

#include <QElapsedTimer>
#include <QFile>
#include <QFileInfo>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QNetworkRequest>
#include <QPointer>
#include <QSaveFile>
#include <QSslConfiguration>
#include <QTimer>
#include <QUrl>

#include <algorithm>
#include <limits>

namespace {

// Bytes Qt may hold for a reply before it stops reading the socket: memory stays bounded
// whatever the size of the file.
constexpr qint64 kReadBufferSize = 1024 * 1024;

QByteArray local8(const QString& inText)
{
    return inText.toLocal8Bit();
}

} // namespace

class ZuDownloadPrivate : public QObject
{
    Q_OBJECT
public:
    explicit ZuDownloadPrivate(ZuDownload* inQ);

    ZuDownload* const q;
    QPointer<ZuProgressDialog> progressDialog; // a child of the dialog parent: may die with it
    bool showProgress = false;
    QNetworkAccessManager* const manager;
    QString server;
    QString serverPath;
    QString localFile;
    QPointer<QWidget> dialogParent;
    bool hadDialogParent = false;
    QString dialogTitle;
    QString dialogLabel;

    QList<QSslCertificate> trusted;
    int inactivityTimeout = 60000;
    QTimer inactivityTimer;
    QElapsedTimer sinceActivity;
    bool timedOut = false;
    QPointer<QNetworkReply> current; // the request whose answer counts
    bool currentIsHead = false;
    std::unique_ptr<QSaveFile> file;
    qint64 bodyLength = -1;
    qint64 written = 0;
    bool reported = false;

    QNetworkRequest request() const;
    void send(bool inHead);
    void startGet();
    bool writeAvailable();
    void dropCurrent();
    void fail(const QString& inPath, ZuDownload::Result inResult);
    void report(const QString& inPath, ZuDownload::Result inResult);

Q_SIGNALS:
    void finished(const QString& path, ZuDownload::Result);

public Q_SLOTS:
    void start();
    void slotReplyFinished(QNetworkReply* aReply);
    void slotDownloadProgress(qint64 done, qint64 total);

private Q_SLOTS:
    void slotReadyRead();
    void slotActivity();
    void slotInactivityCheck();
};

ZuDownloadPrivate::ZuDownloadPrivate(ZuDownload* inQ)
    : q(inQ), manager(new QNetworkAccessManager(this))
{
    qRegisterMetaType<QNetworkReply*>();
    qRegisterMetaType<ZuDownload::Result>();
    // Qt follows no redirect by default and reports none as an error; follow those that keep
    // TLS, refuse the others.
    manager->setRedirectPolicy(QNetworkRequest::NoLessSafeRedirectPolicy);
    connect(manager, &QNetworkAccessManager::finished, this, &ZuDownloadPrivate::slotReplyFinished);
    connect(manager, &QNetworkAccessManager::sslErrors, this,
            [](QNetworkReply*, const QList<QSslError>& inErrors) {
                for (const QSslError& error : inErrors)
                    getTheLogInstance().printf("ZuDownload: warning - ssl error '%s'\n",
                                               local8(error.errorString()).constData());
            });
    inactivityTimer.setSingleShot(true);
    connect(&inactivityTimer, &QTimer::timeout, this, &ZuDownloadPrivate::slotInactivityCheck);
}

QNetworkRequest ZuDownloadPrivate::request() const
{
    QNetworkRequest req(QUrl(QStringLiteral("https://") + server + serverPath, QUrl::TolerantMode));
    QSslConfiguration ssl = QSslConfiguration::defaultConfiguration();
    if (!trusted.isEmpty())
        ssl.addCaCertificates(trusted);
    req.setSslConfiguration(ssl);
    // A compressed answer has another length than the file: the size check could never match.
    req.setRawHeader("Accept-Encoding", "identity");
    return req;
}

void ZuDownloadPrivate::send(bool inHead)
{
    currentIsHead = inHead;
    timedOut = false;
    current = inHead ? manager->head(request()) : manager->get(request());
    connect(current, &QNetworkReply::metaDataChanged, this, &ZuDownloadPrivate::slotActivity);
    if (!inHead) {
        current->setReadBufferSize(kReadBufferSize);
        connect(current, &QNetworkReply::readyRead, this, &ZuDownloadPrivate::slotReadyRead);
        connect(current, &QNetworkReply::downloadProgress, this,
                &ZuDownloadPrivate::slotDownloadProgress);
    }
    sinceActivity.start();
    if (inactivityTimeout > 0)
        inactivityTimer.start(inactivityTimeout);
}

void ZuDownloadPrivate::start()
{
    if (!trusted.isEmpty())
        getTheLogInstance().warnf("ZuDownload: trusting %d additional certificate(s) for '%s'",
                                  trusted.size(), local8(server).constData());
    send(true);
}

void ZuDownloadPrivate::startGet()
{
    file.reset(new QSaveFile(localFile));
    if (!file->open(QIODevice::WriteOnly)) {
        getTheLogInstance().printf("ZuDownload: warning - cannot write '%s': %s\n",
                                   local8(localFile).constData(),
                                   local8(file->errorString()).constData());
        fail(localFile, ZuDownload::FileError);
        return;
    }
    bodyLength = -1;
    written = 0;
    send(false);
    if (showProgress && (dialogParent || !hadDialogParent)) {
        // The window the dialog belonged to is gone: show none rather than a stray one.
        progressDialog = new ZuProgressDialog(dialogParent);
        progressDialog->setLabelText(dialogLabel);
        progressDialog->setWindowTitle(dialogTitle);
    }
}

// Moves what the reply holds into the file; false (and the download ended) when a write fails.
bool ZuDownloadPrivate::writeAvailable()
{
    while (current && current->bytesAvailable() > 0) {
        const QByteArray chunk = current->read(kReadBufferSize);
        if (file->write(chunk) != chunk.size()) {
            getTheLogInstance().printf("ZuDownload: warning - cannot write '%s': %s\n",
                                       local8(localFile).constData(),
                                       local8(file->errorString()).constData());
            fail(localFile, ZuDownload::FileError);
            return false;
        }
        written += chunk.size();
    }
    return true;
}

void ZuDownloadPrivate::slotReadyRead()
{
    slotActivity();
    writeAvailable();
}

void ZuDownloadPrivate::slotActivity()
{
    sinceActivity.restart();
}

void ZuDownloadPrivate::slotInactivityCheck()
{
    // Restarting the timer on every chunk would cost more than the chunk; look back instead.
    const qint64 quiet = sinceActivity.elapsed();
    if (quiet < inactivityTimeout) {
        inactivityTimer.start(int(inactivityTimeout - quiet));
        return;
    }
    getTheLogInstance().printf("ZuDownload: warning - no data for %d ms from '%s'\n",
                               inactivityTimeout, local8(server + serverPath).constData());
    fail(serverPath, ZuDownload::NetworkError);
}

void ZuDownloadPrivate::slotReplyFinished(QNetworkReply* aReply)
{
    aReply->deleteLater();
    if (aReply != current || reported)
        return; // aborted by us: already reported
    inactivityTimer.stop();
    const int status = aReply->attribute(QNetworkRequest::HttpStatusCodeAttribute).toInt();
    if (aReply->error() != QNetworkReply::NoError || status < 200 || status > 299) {
        const QString text =
            aReply->error() != QNetworkReply::NoError
                ? aReply->errorString()
                : aReply->attribute(QNetworkRequest::HttpReasonPhraseAttribute).toString();
        getTheLogInstance().printf("ZuDownload: warning - http error received '%s' status %d\n",
                                   local8(text).constData(), status);
        fail(serverPath, ZuDownload::NetworkError);
        return;
    }
    if (currentIsHead) {
        const QVariant header = aReply->header(QNetworkRequest::ContentLengthHeader);
        const qint64 length = header.isValid() ? header.toLongLong() : -1;
        const QFileInfo info(localFile);
        if (length >= 0 && info.isFile() && info.size() == length) {
            report(localFile, ZuDownload::Ok);
            return;
        }
        startGet();
        return;
    }

    if (!writeAvailable())
        return;
    const QVariant header = aReply->header(QNetworkRequest::ContentLengthHeader);
    if (header.isValid() && header.toLongLong() != written) {
        getTheLogInstance().printf("ZuDownload: warning - received %lld of %lld bytes\n",
                                   static_cast<long long>(written),
                                   static_cast<long long>(header.toLongLong()));
        fail(serverPath, ZuDownload::NetworkError);
        return;
    }
    if (!file->commit()) {
        getTheLogInstance().printf("ZuDownload: warning - cannot write '%s': %s\n",
                                   local8(localFile).constData(),
                                   local8(file->errorString()).constData());
        file.reset();
        fail(localFile, ZuDownload::FileError);
        return;
    }
    file.reset();
    report(localFile, ZuDownload::Ok);
}

void ZuDownloadPrivate::slotDownloadProgress(qint64 done, qint64 total)
{
    if (!progressDialog || progressDialog->wasCanceled())
        return; // cancelling only stops the updates: callers may rely on the file arriving
    // The dialog counts in int: scale sizes of 2 GiB and more down to fit.
    int shift = 0;
    while ((std::max(total, done) >> shift) > std::numeric_limits<int>::max())
        ++shift;
    progressDialog->setRange(0, total < 0 ? 0 : int(total >> shift));
    progressDialog->setValue(int(done >> shift));
}

void ZuDownloadPrivate::dropCurrent()
{
    inactivityTimer.stop();
    if (QNetworkReply* reply = current.data()) {
        current = nullptr; // its finished() no longer counts
        reply->abort();
        reply->deleteLater();
    }
}

void ZuDownloadPrivate::fail(const QString& inPath, ZuDownload::Result inResult)
{
    dropCurrent();
    file.reset(); // an uncommitted temporary file is removed, the target left alone
    report(inPath, inResult);
}

void ZuDownloadPrivate::report(const QString& inPath, ZuDownload::Result inResult)
{
    if (reported)
        return;
    reported = true;
    if (progressDialog) {
        progressDialog->close();
        progressDialog->deleteLater(); // we may be inside one of its own calls
    }
    Q_EMIT finished(inPath, inResult);
    q->deleteLater();
}

ZuDownload::ZuDownload() : d(new ZuDownloadPrivate(this)) {}

ZuDownload::~ZuDownload() = default;

ZuDownload& ZuDownload::instance()
{
    return *new ZuDownload;
}

ZuDownload& ZuDownload::instanceWithProgress(QWidget* parent, const QString& title,
                                             const QString& label)
{
    ZuDownload* download = new ZuDownload;
    download->d->showProgress = true;
    download->d->dialogParent = parent;
    download->d->hadDialogParent = parent != nullptr;
    download->d->dialogTitle = title;
    download->d->dialogLabel = label;
    return *download;
}

void ZuDownload::connectFinished(const QObject* receiver, const char* member)
{
    connect(d.get(), SIGNAL(finished(QString, ZuDownload::Result)), receiver, member);
}

void ZuDownload::trustCertificates(const QList<QSslCertificate>& certificates)
{
    d->trusted += certificates;
}

bool ZuDownload::trustCertificateFile(const QString& path)
{
    QFile pem(path);
    const QList<QSslCertificate> certificates =
        pem.open(QIODevice::ReadOnly) ? QSslCertificate::fromData(pem.readAll(), QSsl::Pem)
                                      : QList<QSslCertificate>();
    d->trusted += certificates;
    return !certificates.isEmpty();
}

void ZuDownload::setInactivityTimeout(int milliseconds)
{
    d->inactivityTimeout = milliseconds;
}

void ZuDownload::start(const QString& server, const QString& serverPath, const QString& localFile)
{
    d->server = server;
    d->serverPath = serverPath;
    d->localFile = localFile;
    d->start();
}

#include "ZuDownload.moc"
