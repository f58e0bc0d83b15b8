#pragma once

// Starts an Xvfb with the given screens on a free display number for a test executable and
// sets DISPLAY; the caller then creates its application with QT_QPA_PLATFORM=xcb.
#include <QByteArray>
#include <QFileInfo>
#include <QProcess>
#include <QStandardPaths>
#include <QStringList>

#include <unistd.h>

class XvfbServer
{
public:
    // inScreens: sizes such as "1920x1200x24", one per X screen.
    explicit XvfbServer(const QStringList& inScreens) { mRunning = start(inScreens); }
    ~XvfbServer()
    {
        if (!mProcess)
            return;
        mProcess->terminate();
        mProcess->waitForFinished(5000);
        delete mProcess;
    }
    XvfbServer(const XvfbServer&) = delete;
    XvfbServer& operator=(const XvfbServer&) = delete;

    bool isRunning() const { return mRunning; }
    // Why it is not running.
    QString skipReason() const { return mSkipReason; }

private:
    bool start(const QStringList& inScreens)
    {
        const QString xvfb = QStandardPaths::findExecutable(QStringLiteral("Xvfb"));
        if (xvfb.isEmpty()) {
            mSkipReason = QStringLiteral("Xvfb is not installed");
            return false;
        }
        for (int display = 100 + int(getpid() % 300); display < 1000; display += 7) {
            const QString socket = QStringLiteral("/tmp/.X11-unix/X%1").arg(display);
            if (QFileInfo::exists(socket) ||
                QFileInfo::exists(QStringLiteral("/tmp/.X%1-lock").arg(display)))
                continue;
            QStringList arguments{QStringLiteral(":%1").arg(display), QStringLiteral("-nolisten"),
                                  QStringLiteral("tcp")};
            for (int i = 0; i < inScreens.size(); ++i)
                arguments << QStringLiteral("-screen") << QString::number(i) << inScreens.at(i);
            mProcess = new QProcess;
            mProcess->setProcessChannelMode(QProcess::ForwardedErrorChannel);
            mProcess->start(xvfb, arguments);
            if (!mProcess->waitForStarted(5000))
                break;
            for (int i = 0; i < 100 && !QFileInfo::exists(socket); ++i) {
                if (mProcess->waitForFinished(50))
                    break;
            }
            if (QFileInfo::exists(socket) && mProcess->state() == QProcess::Running) {
                qputenv("DISPLAY", QByteArray(":") + QByteArray::number(display));
                return true;
            }
            delete mProcess;
            mProcess = nullptr;
        }
        mSkipReason = QStringLiteral("Xvfb did not start");
        return false;
    }

    QProcess* mProcess = nullptr;
    bool mRunning = false;
    QString mSkipReason;
};
