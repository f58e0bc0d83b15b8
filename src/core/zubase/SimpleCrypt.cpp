#include "zubase/SimpleCrypt.h"

#include <QCryptographicHash>
#include <QDataStream>
#include <QDateTime>
#include <QtGlobal>

#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <limits>

namespace {

constexpr char kVersion = 0x03;
constexpr char kFlagCompression = 0x01;
constexpr char kFlagChecksum = 0x02;
constexpr char kFlagHash = 0x04;
constexpr int kChecksumSize = 2;
constexpr int kHashSize = 20;
// The largest payload a QByteArray can hold, with room for its header.
constexpr qint64 kMaxPayload = std::numeric_limits<int>::max() - 64;

void seedThreadGenerator()
{
    // The random first byte comes from the thread's qrand() sequence; hosts rely on the reseed.
    QT_WARNING_PUSH
    QT_WARNING_DISABLE_DEPRECATED
    qsrand(uint(QDateTime::currentMSecsSinceEpoch() & 0xFFFF));
    QT_WARNING_POP
}

char randomByte()
{
    QT_WARNING_PUSH
    QT_WARNING_DISABLE_DEPRECATED
    return char(qrand() & 0xFF);
    QT_WARNING_POP
}

// out[p] = in[p] ^ key[p % 8] ^ out[p - 1], in place.
void encodeChained(uchar* ioData, qint64 inSize, const uchar* inKey)
{
    uchar last = 0;
    qint64 p = 0;
    for (; p + 8 <= inSize; p += 8) {
        for (int k = 0; k < 8; ++k) {
            last = ioData[p + k] ^ inKey[k] ^ last;
            ioData[p + k] = last;
        }
    }
    for (; p < inSize; ++p) {
        last = ioData[p] ^ inKey[p & 7] ^ last;
        ioData[p] = last;
    }
}

// plain[p] = in[p] ^ key[p % 8] ^ in[p - 1], in place.
void decodeChained(uchar* ioData, qint64 inSize, const uchar* inKey)
{
    uchar previous = 0;
    qint64 p = 0;
    for (; p + 8 <= inSize; p += 8) {
        for (int k = 0; k < 8; ++k) {
            const uchar in = ioData[p + k];
            ioData[p + k] = in ^ inKey[k] ^ previous;
            previous = in;
        }
    }
    for (; p < inSize; ++p) {
        const uchar in = ioData[p];
        ioData[p] = in ^ inKey[p & 7] ^ previous;
        previous = in;
    }
}

QByteArray checksumField(const QByteArray& inPayload)
{
    QByteArray field;
    QDataStream stream(&field, QIODevice::WriteOnly);
    stream << qChecksum(inPayload.constData(), uint(inPayload.size()));
    return field;
}

// The inverse of qCompress (4-byte big-endian size, then a zlib stream) that trusts neither the
// claimed size nor the stream: the buffer grows only as far as the stream really inflates, never
// beyond the claimed size, and anything but a complete stream fails.
bool inflatePayload(const QByteArray& inCompressed, QByteArray& outPlain)
{
    outPlain.clear();
    if (inCompressed.size() < 4)
        return false;
    const auto* bytes = reinterpret_cast<const uchar*>(inCompressed.constData());
    const qint64 claimed =
        (qint64(bytes[0]) << 24) | (bytes[1] << 16) | (bytes[2] << 8) | qint64(bytes[3]);
    if (inCompressed.size() == 4)
        return claimed == 0; // qCompress of nothing
    if (claimed > kMaxPayload)
        return false;

    z_stream stream;
    std::memset(&stream, 0, sizeof stream);
    if (inflateInit(&stream) != Z_OK)
        return false;
    stream.next_in = const_cast<Bytef*>(bytes + 4);
    stream.avail_in = uInt(inCompressed.size() - 4);

    qint64 capacity = std::min<qint64>(claimed, std::max<qint64>(inCompressed.size() * 4, 65536));
    QByteArray out(int(capacity), Qt::Uninitialized);
    qint64 produced = 0;
    int status = Z_OK;
    for (;;) {
        if (produced == capacity) {
            if (capacity == claimed) {
                // All claimed bytes are there; the stream must end right here.
                unsigned char probe;
                stream.next_out = &probe;
                stream.avail_out = 1;
                status = inflate(&stream, Z_NO_FLUSH);
                if (stream.avail_out != 1)
                    status = Z_DATA_ERROR; // more than claimed
                break;
            }
            capacity = std::min<qint64>(claimed, capacity * 2);
            out.resize(int(capacity));
        }
        stream.next_out = reinterpret_cast<Bytef*>(out.data()) + produced;
        stream.avail_out = uInt(capacity - produced);
        status = inflate(&stream, Z_NO_FLUSH);
        produced = capacity - stream.avail_out;
        if (status != Z_OK)
            break;
        if (produced < capacity && stream.avail_in == 0)
            break; // the input ends before the stream does
    }
    inflateEnd(&stream);
    if (status != Z_STREAM_END)
        return false;
    out.resize(int(produced));
    outPlain = out;
    return true;
}

} // namespace

SimpleCrypt::SimpleCrypt()
{
    seedThreadGenerator();
}

SimpleCrypt::SimpleCrypt(quint64 inKey)
{
    seedThreadGenerator();
    setKey(inKey);
}

void SimpleCrypt::setKey(quint64 inKey)
{
    mKey = inKey;
    mKeyParts.resize(8);
    for (int i = 0; i < 8; ++i)
        mKeyParts[i] = char((inKey >> (8 * i)) & 0xFF);
}

QByteArray SimpleCrypt::encryptToByteArray(QByteArray inPlain)
{
    if (!hasKey()) {
        qWarning("No key set.");
        mLastError = NoKeyError;
        return QByteArray();
    }

    QByteArray payload = inPlain;
    char flags = 0;
    if (mCompressionMode == CompressAlways) {
        payload = qCompress(payload, 9);
        flags |= kFlagCompression;
    } else if (mCompressionMode == CompressAuto) {
        const QByteArray compressed = qCompress(payload, 9);
        if (compressed.size() < payload.size()) {
            payload = compressed;
            flags |= kFlagCompression;
        }
    }

    QByteArray integrity;
    if (mProtectionMode == IntegrityChecksum) {
        flags |= kFlagChecksum;
        integrity = checksumField(payload);
    } else if (mProtectionMode == IntegrityHash) {
        flags |= kFlagHash;
        integrity = QCryptographicHash::hash(payload, QCryptographicHash::Sha1);
    }

    // One allocation for the whole frame; the XOR pass then runs in place over the block.
    QByteArray frame(2 + 1 + integrity.size() + payload.size(), Qt::Uninitialized);
    char* out = frame.data();
    out[0] = kVersion;
    out[1] = flags;
    out[2] = randomByte();
    std::memcpy(out + 3, integrity.constData(), size_t(integrity.size()));
    std::memcpy(out + 3 + integrity.size(), payload.constData(), size_t(payload.size()));
    encodeChained(reinterpret_cast<uchar*>(out + 2), frame.size() - 2,
                  reinterpret_cast<const uchar*>(mKeyParts.constData()));

    mLastError = NoError;
    return frame;
}

QByteArray SimpleCrypt::encryptToByteArray(const QString& inPlain)
{
    return encryptToByteArray(inPlain.toUtf8());
}

QString SimpleCrypt::encryptToString(QByteArray inPlain)
{
    return QString::fromLatin1(encryptToByteArray(inPlain).toBase64());
}

QString SimpleCrypt::encryptToString(const QString& inPlain)
{
    return encryptToString(inPlain.toUtf8());
}

QByteArray SimpleCrypt::decryptToByteArray(QByteArray inCypher)
{
    if (!hasKey()) {
        qWarning("No key set.");
        mLastError = NoKeyError;
        return QByteArray();
    }
    if (inCypher.isEmpty() || inCypher.at(0) != kVersion) {
        qWarning("Invalid version or not a cyphertext.");
        mLastError = VersionError;
        return QByteArray();
    }
    // Every frame has at least the flags and the random byte.
    if (inCypher.size() < 3) {
        mLastError = IntegrityError;
        return QByteArray();
    }

    const char flags = inCypher.at(1);
    QByteArray block = inCypher.mid(2);
    decodeChained(reinterpret_cast<uchar*>(block.data()), block.size(),
                  reinterpret_cast<const uchar*>(mKeyParts.constData()));
    block.remove(0, 1); // the random byte

    if (flags & kFlagChecksum) {
        if (block.size() < kChecksumSize) {
            mLastError = IntegrityError;
            return QByteArray();
        }
        const quint16 stored = quint16((uchar(block.at(0)) << 8) | uchar(block.at(1)));
        block.remove(0, kChecksumSize);
        if (stored != qChecksum(block.constData(), uint(block.size()))) {
            mLastError = IntegrityError;
            return QByteArray();
        }
    } else if (flags & kFlagHash) {
        if (block.size() < kHashSize) {
            mLastError = IntegrityError;
            return QByteArray();
        }
        const QByteArray stored = block.left(kHashSize);
        block.remove(0, kHashSize);
        if (stored != QCryptographicHash::hash(block, QCryptographicHash::Sha1)) {
            mLastError = IntegrityError;
            return QByteArray();
        }
    }

    if (flags & kFlagCompression) {
        QByteArray plain;
        if (!inflatePayload(block, plain)) {
            mLastError = IntegrityError;
            return QByteArray();
        }
        block = plain;
    }

    mLastError = NoError;
    return block;
}

QByteArray SimpleCrypt::decryptToByteArray(const QString& inCypher)
{
    return decryptToByteArray(QByteArray::fromBase64(inCypher.toLatin1()));
}

QString SimpleCrypt::decryptToString(QByteArray inCypher)
{
    const QByteArray plain = decryptToByteArray(inCypher);
    return QString::fromUtf8(plain.constData(), plain.size());
}

QString SimpleCrypt::decryptToString(const QString& inCypher)
{
    const QByteArray plain = decryptToByteArray(inCypher);
    return QString::fromUtf8(plain.constData(), plain.size());
}
