#include "HttpsTestServer.h"
#include "TestSupport.h"

#include "zubase/BlockingHttpGet.h"
#include "zubase/ZuDownload.h"
#include "zubase/ZuProgressDialog.h"

#include <QApplication>
#include <QNetworkAccessManager>
#include <QSslConfiguration>

#include <sys/mount.h>
#include <sys/resource.h>

#include <csignal>

class tst_Download : public QObject
{
    Q_OBJECT

    HttpsTestServer mServer;
    QTemporaryDir mDir;
    QString mTarget;
    QList<QPair<QString, ZuDownload::Result>> mCalls;
    bool mDialogAtEnd = false; // a progress dialog existed when finished() came

    // Runs one download to its end; mCalls holds what it reported.
    void run(ZuDownload& ioDownload, const QString& inPath, int inTimeout = 0)
    {
        QPointer<ZuDownload> alive(&ioDownload);
        ioDownload.connectFinished(this, SLOT(onFinished(QString, ZuDownload::Result)));
        if (inTimeout)
            ioDownload.setInactivityTimeout(inTimeout);
        ioDownload.start(mServer.server(), inPath, mTarget);
        QTRY_VERIFY_WITH_TIMEOUT(alive.isNull(), 30000); // it deletes itself once reported
        QTest::qWait(100); // time for a second report that must not come
        QCOMPARE(mCalls.size(), 1);
    }

    QStringList methods()
    {
        QStringList seen;
        for (const QString& request : mServer.takeRequests())
            seen << request.section(' ', 0, 0);
        return seen;
    }

    // Nothing but the target may be left in the folder: temporary files go away.
    QStringList files() const { return QDir(mDir.path()).entryList(QDir::Files | QDir::Hidden); }

private Q_SLOTS:
    void onFinished(const QString& inPath, ZuDownload::Result inResult)
    {
        mCalls << qMakePair(inPath, inResult);
        mDialogAtEnd = false;
        for (QWidget* widget : QApplication::allWidgets())
            mDialogAtEnd = mDialogAtEnd || qobject_cast<ZuProgressDialog*>(widget);
    }

    void initTestCase()
    {
        QVERIFY(!mServer.makeCertificate("server").isEmpty());
        QVERIFY(!mServer.makeCertificate("other").isEmpty());
        QVERIFY(mServer.start(TestSupport::helper("zu_https_server"), "server"));
    }

    void init()
    {
        mCalls.clear();
        QDir(mDir.path()).removeRecursively();
        QDir().mkpath(mDir.path());
        mTarget = mDir.filePath("target.bin");
        mServer.takeRequests();
    }

    void download_data()
    {
        QTest::addColumn<QString>("query");
        QTest::addColumn<qint64>("before"); // size of the file already there, -1 none
        QTest::addColumn<int>("timeout");
        QTest::addColumn<int>("result");
        QTest::addColumn<qint64>("after"); // pattern bytes the file then holds; -1 the old file
        QTest::addColumn<QStringList>("requests");
        const QStringList head{"HEAD"}, both{"HEAD", "GET"};
        const QString redirect =
            "redirect=%1://127.0.0.1:" + mServer.server().section(':', 1) + "/moved%3Fsize%3D10";
        QTest::newRow("new file") << "size=100000" << -1LL << 0 << 0 << 100000LL << both;
        QTest::newRow("same size") << "size=1000" << 1000LL << 0 << 0 << -1LL << head;
        QTest::newRow("other size") << "size=5000" << 4999LL << 0 << 0 << 5000LL << both;
        QTest::newRow("no length") << "size=3&nolength=1" << 3LL << 0 << 0 << 3LL << both;
        QTest::newRow("above 4 GiB")
            << "size=1&headlength=4294967396" << 4294967396LL << 0 << 0 << -1LL << head;
        QTest::newRow("compressible") << "size=2000&deflate=1" << 2000LL << 0 << 0 << -1LL << head;
        QTest::newRow("404 on HEAD") << "size=10&headstatus=404" << 7LL << 0 << 2 << -1LL << head;
        QTest::newRow("500 on GET") << "size=10&getstatus=500" << 7LL << 0 << 2 << -1LL << both;
        QTest::newRow("cut off") << "size=300000&truncate=1000" << 7LL << 0 << 2 << -1LL << both;
        QTest::newRow("stalled") << "size=300000&stall=1000" << 7LL << 300 << 2 << -1LL << both;
        QTest::newRow("no answer") << "delay=5000" << 7LL << 300 << 2 << -1LL << head;
        QTest::newRow("redirect") << redirect.arg("https") << 7LL << 0 << 0 << 10LL
                                  << QStringList{"HEAD", "HEAD", "GET", "GET"};
        QTest::newRow("downgrade") << redirect.arg("http") << 7LL << 0 << 2 << -1LL << head;
    }

    void download()
    {
        QFETCH(QString, query);
        QFETCH(qint64, before);
        QFETCH(int, timeout);
        QFETCH(qint64, after);
        QFile old(mTarget);
        if (before >= 0)
            QVERIFY(old.open(QIODevice::WriteOnly) && old.resize(before));
        old.close();
        ZuDownload& download = ZuDownload::instance();
        download.trustCertificateFile(mServer.dir.filePath("server.pem"));
        run(download, "/file?" + query, timeout);
        if (QTest::currentTestFailed())
            return;
        QFETCH(int, result);
        QCOMPARE(int(mCalls[0].second), result);
        QCOMPARE(mCalls[0].first, result == ZuDownload::NetworkError ? "/file?" + query : mTarget);
        QTEST(methods(), "requests");
        QCOMPARE(files(), QStringList("target.bin"));
        QVERIFY(!mDialogAtEnd); // none asked for
        QVERIFY(old.open(QIODevice::ReadOnly));
        if (after < 0)
            QCOMPARE(old.size(), before); // the old file stays as it was
        else
            QVERIFY(old.readAll() == patternBytes(0, after));
    }

    void certificates_data()
    {
        QTest::addColumn<QString>("trusted");
        QTest::addColumn<int>("result");
        QTest::newRow("none") << QString() << 2;
        QTest::newRow("another") << "other" << 2;
        QTest::newRow("the server's") << "server" << 0;
    }

    void certificates()
    {
        QFETCH(QString, trusted);
        RkLogCapture log;
        ZuDownload& download = ZuDownload::instance();
        if (!trusted.isEmpty())
            QVERIFY(download.trustCertificateFile(mServer.dir.filePath(trusted + ".pem")));
        run(download, "/file?size=10");
        QTEST(int(mCalls.value(0).second), "result");
        const QString warning =
            "ZuDownload: trusting 1 additional certificate(s) for '" + mServer.server() + "'";
        QCOMPARE(TestSupport::logLines(log, nullptr, RkLogWarning).contains(warning),
                 !trusted.isEmpty());
    }

    // A folder where the file should go.
    void folderTarget()
    {
        QVERIFY(QDir().mkpath(mTarget));
        ZuDownload& download = ZuDownload::instance();
        download.trustCertificateFile(mServer.dir.filePath("server.pem"));
        run(download, "/file?size=10");
        QCOMPARE(mCalls.value(0), qMakePair(mTarget, ZuDownload::FileError));
        QVERIFY(QFileInfo(mTarget).isDir());
    }

    // The disk fills up during the write: a small tmpfs, or a file-size limit (which binds
    // root too).
    void fullDisk_data()
    {
        QTest::addColumn<bool>("tmpfs");
        QTest::newRow("small tmpfs") << true;
        QTest::newRow("file-size limit") << false;
    }

    void fullDisk()
    {
        QFETCH(bool, tmpfs);
        const QString small = mDir.filePath("small");
        QDir().mkpath(small);
        if (tmpfs && mount("tmpfs", small.toLocal8Bit(), "tmpfs", 0, "size=64k") != 0)
            QSKIP("a small tmpfs cannot be mounted here (needs root)");
        mTarget = small + "/target.bin";
        QFile old(mTarget);
        QVERIFY(old.open(QIODevice::WriteOnly) && old.write("old") == 3);
        old.close();
        rlimit saved;
        QVERIFY(getrlimit(RLIMIT_FSIZE, &saved) == 0);
        if (!tmpfs) {
            std::signal(SIGXFSZ, SIG_IGN); // the write fails with EFBIG instead
            rlimit limit = saved;
            limit.rlim_cur = 64 * 1024;
            QVERIFY(setrlimit(RLIMIT_FSIZE, &limit) == 0);
        }
        ZuDownload& full = ZuDownload::instance();
        full.trustCertificateFile(mServer.dir.filePath("server.pem"));
        run(full, "/file?size=300000");
        const QStringList left = QDir(small).entryList(QDir::Files | QDir::Hidden);
        const QByteArray kept = old.open(QIODevice::ReadOnly) ? old.readAll() : QByteArray();
        old.close();
        if (tmpfs)
            umount(small.toLocal8Bit());
        else
            setrlimit(RLIMIT_FSIZE, &saved);
        QCOMPARE(mCalls.value(0), qMakePair(mTarget, ZuDownload::FileError));
        QCOMPARE(left, QStringList("target.bin"));
        QCOMPARE(kept, QByteArray("old"));
    }

    void progressDialog()
    {
        auto* parent = new QWidget;
        ZuDownload& download = ZuDownload::instanceWithProgress(parent, "Title", "Label");
        download.trustCertificateFile(mServer.dir.filePath("server.pem"));
        download.connectFinished(this, SLOT(onFinished(QString, ZuDownload::Result)));
        download.setInactivityTimeout(3000);
        download.start(mServer.server(), "/file?size=3000000000&stall=50000&hold=200", mTarget);
        QTRY_VERIFY(parent->findChild<ZuProgressDialog*>());
        const QPointer<ZuProgressDialog> dialog = parent->findChild<ZuProgressDialog*>();
        QCOMPARE(dialog->labelText(), QString("Label"));
        QCOMPARE(dialog->windowTitle(), QString("Title"));
        // Sizes beyond int are scaled into the dialog's range.
        QTRY_COMPARE(dialog->value(), 25000);
        QCOMPARE(dialog->maximum(), int(3000000000LL >> 1));
        QTRY_COMPARE(mCalls.size(), 1);
        QVERIFY(mDialogAtEnd);
        QTRY_VERIFY(dialog.isNull()); // closed and gone at the end

        // The dialog's parent dies while the HEAD request is out: one report, no dialog.
        mCalls.clear();
        ZuDownload& orphan = ZuDownload::instanceWithProgress(parent, "Title", "Label");
        orphan.trustCertificateFile(mServer.dir.filePath("server.pem"));
        QTimer::singleShot(100, parent, [parent] { delete parent; });
        run(orphan, "/file?size=10&delay=400");
        QCOMPARE(mCalls.value(0), qMakePair(mTarget, ZuDownload::Ok));
        for (QWidget* widget : QApplication::allWidgets())
            QVERIFY(!qobject_cast<ZuProgressDialog*>(widget));
    }

    void blockingGet_data()
    {
        QTest::addColumn<QString>("query");
        QTest::addColumn<int>("timeout");
        QTest::addColumn<bool>("timedOut");
        QTest::newRow("fast") << "size=10" << 20000 << false;
        QTest::newRow("1 ms") << "size=10&delay=3000" << 1 << true;
        QTest::newRow("negative") << "size=10&delay=3000" << -5 << true;
    }

    void blockingGet()
    {
        QFETCH(QString, query);
        QFETCH(int, timeout);
        const QSslConfiguration plain = QSslConfiguration::defaultConfiguration();
        QSslConfiguration trusting = plain;
        trusting.addCaCertificates(mServer.dir.filePath("server.pem"));
        QSslConfiguration::setDefaultConfiguration(trusting);
        QNetworkAccessManager manager;
        bool timedOut = false;
        QElapsedTimer clock;
        clock.start();
        const std::unique_ptr<QNetworkReply> reply = ZuBase::blockingHttpGet(
            &manager, QUrl("https://" + mServer.server() + "/file?" + query), timeout, timedOut,
            ZuBase::logSSLErrors);
        QSslConfiguration::setDefaultConfiguration(plain);
        QTEST(timedOut, "timedOut");
        QVERIFY(clock.elapsed() < 2500);
        QVERIFY(reply->isFinished());
        QCOMPARE(reply->error(),
                 timedOut ? QNetworkReply::OperationCanceledError : QNetworkReply::NoError);
        QCOMPARE(reply->readAll(), timedOut ? QByteArray() : patternBytes(0, 10));
    }

    // The server's certificate is unknown: the handler sees the errors, an empty one is skipped.
    void blockingGetSslErrors()
    {
        QNetworkAccessManager manager;
        const QUrl url("https://" + mServer.server() + "/file?size=10");
        bool timedOut = false;
        RkLogCapture log;
        auto reply = ZuBase::blockingHttpGet(&manager, url, 20000, timedOut, ZuBase::logSSLErrors);
        QCOMPARE(reply->error(), QNetworkReply::SslHandshakeFailedError);
        const QStringList lines = TestSupport::logLines(log, nullptr, RkLogWarning);
        QVERIFY(!lines.isEmpty());
        QVERIFY(lines.filter(QRegularExpression("^HTTP GET SSL error: .+$")).size() ==
                lines.size());
        reply = ZuBase::blockingHttpGet(&manager, url, 20000, timedOut, nullptr);
        QCOMPARE(reply->error(), QNetworkReply::SslHandshakeFailedError);
        QVERIFY(!timedOut);
    }
};

QTEST_MAIN(tst_Download)
#include "tst_download.moc"
