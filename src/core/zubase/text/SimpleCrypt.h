#pragma once

#include "zubase/zubase_export.h"

#include <QByteArray>
#include <QString>
#include <QVector>

// Makes texts and byte arrays unreadable and back with a 64-bit key. Not strong cryptography:
// it keeps casual readers out of stored settings.
//
// Frame (the byte layout is the contract with every other reader and writer of it):
//   byte 0   version 0x03
//   byte 1   flags: 0x01 payload compressed (qCompress), 0x02 16-bit checksum, 0x04 SHA-1
//   byte 2.. block = random byte, integrity field (nothing, qChecksum big-endian, or 20-byte
//            SHA-1 of the payload), payload; XOR-ed byte by byte with key byte (p mod 8), least
//            significant key byte first, and with the previous encrypted byte.
// The string variants carry the frame as Base64.
//
// Decryption of damaged or foreign bytes gives an empty result and IntegrityError (truncated
// frame, integrity mismatch, compressed payload that does not inflate); a compressed payload is
// inflated only as far as it really reaches, whatever size its header claims.
class ZUBASE_EXPORT SimpleCrypt
{
public:
    enum CompressionMode
    {
        CompressAuto = 0, // compress when that makes the payload strictly shorter
        CompressAlways = 1,
        CompressNever = 2
    };
    enum IntegrityProtectionMode
    {
        IntegrityNone = 0,
        IntegrityChecksum = 1,
        IntegrityHash = 2
    };
    enum Error
    {
        NoError = 0,
        NoKeyError = 1,
        VersionError = 2,
        IntegrityError = 3
    };

    // Both constructors reseed the calling thread's qrand() generator from the clock.
    SimpleCrypt();
    explicit SimpleCrypt(quint64 inKey);

    void setKey(quint64 inKey);
    // True once a key was set, also for the key 0.
    bool hasKey() const { return !mKeyParts.isEmpty(); }

    void setCompressionMode(CompressionMode inMode) { mCompressionMode = inMode; }
    CompressionMode compressionMode() const { return mCompressionMode; }
    void setIntegrityProtectionMode(IntegrityProtectionMode inMode) { mProtectionMode = inMode; }
    IntegrityProtectionMode integrityProtectionMode() const { return mProtectionMode; }
    // Outcome of the last encryption or decryption.
    Error lastError() const { return mLastError; }

    QByteArray encryptToByteArray(QByteArray inPlain);
    // The text as UTF-8.
    QByteArray encryptToByteArray(const QString& inPlain);
    QString encryptToString(QByteArray inPlain);
    QString encryptToString(const QString& inPlain);

    QByteArray decryptToByteArray(QByteArray inCypher);
    // Base64 text of a frame.
    QByteArray decryptToByteArray(const QString& inCypher);
    // The decrypted bytes read as UTF-8.
    QString decryptToString(QByteArray inCypher);
    QString decryptToString(const QString& inCypher);

private:
    quint64 mKey = 0;
    QVector<char> mKeyParts;
    CompressionMode mCompressionMode = CompressAuto;
    IntegrityProtectionMode mProtectionMode = IntegrityChecksum;
    Error mLastError = NoError;
};
