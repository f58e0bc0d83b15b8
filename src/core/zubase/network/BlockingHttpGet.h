#pragma once

#include "zubase/zubase_export.h"

#include <QList>
#include <QNetworkReply>
#include <QSslError>
#include <QUrl>

#include <functional>
#include <memory>

class QNetworkAccessManager;

namespace ZuBase {

// A GET through inManager that waits up to inTimeoutMs (a negative value counts as 0) on a local
// event loop. When the reply has not finished by then, outTimedOut is set to true and the reply
// is aborted; otherwise outTimedOut is left as it was. The reply is the caller's whatever the
// outcome: check its error(). inOnSslErrors, when set, sees the reply's SSL errors.
// Callable from any thread that owns inManager.
ZUBASE_EXPORT std::unique_ptr<QNetworkReply>
blockingHttpGet(QNetworkAccessManager* inManager, const QUrl& inUrl, int inTimeoutMs,
                bool& outTimedOut, std::function<void(const QList<QSslError>&)> inOnSslErrors);

// Handlers for blockingHttpGet: one warning "HTTP GET SSL error: ..." per error, or nothing.
ZUBASE_EXPORT void logSSLErrors(const QList<QSslError>& inErrors);
ZUBASE_EXPORT void ignoreSSLErrors(const QList<QSslError>& inErrors);

} // namespace ZuBase
