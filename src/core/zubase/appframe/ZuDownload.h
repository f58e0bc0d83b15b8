#pragma once

#include "zubase/zubase_export.h"

#include <QList>
#include <QObject>
#include <QSslCertificate>
#include <QString>

#include <memory>

class QWidget;
class ZuDownloadPrivate;

// Fetches one file over HTTPS into a local file: a HEAD request first, then a GET unless the
// local file already has the server's size. The body is streamed into a temporary file beside
// the target, which replaces the target only once it is complete; on any failure the previous
// file stays as it was. Reports exactly once through finished(const QString&, ZuDownload::Result)
// and then deletes itself. Peers are verified; see trustCertificates() for internal servers.
class ZUBASE_EXPORT ZuDownload : public QObject
{
    Q_OBJECT
public:
    // Ok: the local file holds the server's file. FileError: it could not be written.
    // NetworkError: the server, the network or the time-out ended the download.
    enum Result
    {
        Ok = 0,
        FileError = 1,
        NetworkError = 2
    };
    Q_ENUM(Result)

    // A new download (every call makes one) without or with a progress dialog.
    static ZuDownload& instance();
    static ZuDownload& instanceWithProgress(QWidget* parent, const QString& title,
                                            const QString& label);

    // Connects finished(const QString& path, ZuDownload::Result) to a slot or signal given as a
    // SLOT()/SIGNAL() string. The path is the local file, or the server path for NetworkError.
    void connectFinished(const QObject* receiver, const char* member);

    // Trusts these certificates (a self-signed server certificate or the CA of an internal
    // server) in addition to the system's, for this download only. Logs a warning at start().
    void trustCertificates(const QList<QSslCertificate>& certificates);
    // The same for the PEM certificates in a file; false when it holds none.
    bool trustCertificateFile(const QString& path);

    // Ends the download with NetworkError when no byte arrives for this long (60000 ms by
    // default); 0 or less waits for ever.
    void setInactivityTimeout(int milliseconds);

    // Requests "https://" + server + serverPath and writes localFile.
    void start(const QString& server, const QString& serverPath, const QString& localFile);

private:
    ZuDownload();
    ~ZuDownload() override;
    friend class ZuDownloadPrivate;

    std::unique_ptr<ZuDownloadPrivate> const d;
};
