// Cipher frames: decrypting arbitrary bytes never crashes, a failure gives an empty result, only
// a wrong version warns, and what decrypts encrypts and decrypts again to the same bytes.
#include "zubase/SimpleCrypt.h"

#include <QString>
#include <QtGlobal>

#include <cstdint>
#include <cstdlib>

namespace {

constexpr quint64 kKey = Q_UINT64_C(0x0c2ad4a4acb9f023);

void onlyVersionWarnings(QtMsgType, const QMessageLogContext&, const QString& inText)
{
    if (inText != QLatin1String("Invalid version or not a cyphertext."))
        std::abort();
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***)
{
    qInstallMessageHandler(&onlyVersionWarnings);
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* inData, std::size_t inSize)
{
    const QByteArray cypher(reinterpret_cast<const char*>(inData), int(inSize));
    SimpleCrypt crypt(kKey);
    const QByteArray plain = crypt.decryptToByteArray(cypher);
    const SimpleCrypt::Error error = crypt.lastError();
    if (error != SimpleCrypt::NoError && !plain.isEmpty())
        std::abort();
    if ((error == SimpleCrypt::VersionError) != (cypher.isEmpty() || cypher.at(0) != 0x03))
        std::abort();
    if (error == SimpleCrypt::NoError) {
        const char flags = cypher.at(1);
        crypt.setCompressionMode((flags & 0x01) ? SimpleCrypt::CompressAlways
                                                : SimpleCrypt::CompressNever);
        crypt.setIntegrityProtectionMode((flags & 0x02)   ? SimpleCrypt::IntegrityChecksum
                                         : (flags & 0x04) ? SimpleCrypt::IntegrityHash
                                                          : SimpleCrypt::IntegrityNone);
        if (crypt.decryptToByteArray(crypt.encryptToByteArray(plain)) != plain)
            std::abort();
    }
    // The same bytes taken as Base64 text.
    crypt.decryptToString(QString::fromLatin1(cypher));
    return 0;
}
