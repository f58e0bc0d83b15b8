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

// Encodes block positions [inFrom, inFrom + inSize) from inPlain to outCypher:
// out[p] = in[p] ^ key[p % 8] ^ out[p - 1], with ioLast carrying out[p - 1] (0 before the block).
// Input and output may be the same bytes.
void encodeChained(const uchar* inPlain, uchar* outCypher, qint64 inSize, qint64 inFrom,
                   const uchar* inKey, uchar& ioLast)
{
    uchar last = ioLast;
    qint64 i = 0;
    for (; i < inSize && ((inFrom + i) & 7) != 0; ++i) {
        last = inPlain[i] ^ inKey[(inFrom + i) & 7] ^ last;
        outCypher[i] = last;
    }
    // Whole rounds of the key, so that the key index is a constant in the inner loop.
    for (; i + 8 <= inSize; i += 8) {
        for (int k = 0; k < 8; ++k) {
            last = inPlain[i + k] ^ inKey[k] ^ last;
            outCypher[i + k] = last;
        }
    }
    for (; i < inSize; ++i) {
        last = inPlain[i] ^ inKey[(inFrom + i) & 7] ^ last;
        outCypher[i] = last;
    }
    ioLast = last;
}

// Decodes block positions [inFrom, inFrom + inSize) of inBlock (the whole encoded block) to
// outPlain: plain[p] = in[p] ^ key[p % 8] ^ in[p - 1], with in[-1] taken as 0.
void decodeChained(const uchar* inBlock, uchar* outPlain, qint64 inSize, qint64 inFrom,
                   const uchar* inKey)
{
    const uchar* in = inBlock + inFrom;
    uchar previous = inFrom > 0 ? in[-1] : 0;
    qint64 i = 0;
    for (; i < inSize && ((inFrom + i) & 7) != 0; ++i) {
        outPlain[i] = in[i] ^ inKey[(inFrom + i) & 7] ^ previous;
        previous = in[i];
    }
    for (; i + 8 <= inSize; i += 8) {
        for (int k = 0; k < 8; ++k) {
            const uchar c = in[i + k];
            outPlain[i + k] = c ^ inKey[k] ^ previous;
            previous = c;
        }
    }
    for (; i < inSize; ++i) {
        outPlain[i] = in[i] ^ inKey[(inFrom + i) & 7] ^ previous;
        previous = in[i];
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

    // One allocation for the whole frame, the payload encoded straight into it.
    const QByteArray head = char(randomByte()) + integrity;
    QByteArray frame(2 + head.size() + payload.size(), Qt::Uninitialized);
    auto* out = reinterpret_cast<uchar*>(frame.data());
    const auto* key = reinterpret_cast<const uchar*>(mKeyParts.constData());
    out[0] = uchar(kVersion);
    out[1] = uchar(flags);
    uchar last = 0;
    encodeChained(reinterpret_cast<const uchar*>(head.constData()), out + 2, head.size(), 0, key,
                  last);
    encodeChained(reinterpret_cast<const uchar*>(payload.constData()), out + 2 + head.size(),
                  payload.size(), head.size(), key, last);

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
    const auto* encoded = reinterpret_cast<const uchar*>(inCypher.constData()) + 2;
    const qint64 blockSize = inCypher.size() - 2;
    const auto* key = reinterpret_cast<const uchar*>(mKeyParts.constData());

    // The random byte and the integrity field are decoded apart from the payload, so that the
    // payload is decoded once, straight into its own array.
    const int fieldSize =
        (flags & kFlagChecksum) ? kChecksumSize : ((flags & kFlagHash) ? kHashSize : 0);
    if (blockSize < 1 + fieldSize) {
        mLastError = IntegrityError;
        return QByteArray();
    }
    uchar field[1 + kHashSize];
    decodeChained(encoded, field, 1 + fieldSize, 0, key);
    QByteArray block(int(blockSize - 1 - fieldSize), Qt::Uninitialized);
    decodeChained(encoded, reinterpret_cast<uchar*>(block.data()), block.size(), 1 + fieldSize,
                  key);

    if (flags & kFlagChecksum) {
        const quint16 stored = quint16((field[1] << 8) | field[2]);
        if (stored != qChecksum(block.constData(), uint(block.size()))) {
            mLastError = IntegrityError;
            return QByteArray();
        }
    } else if (flags & kFlagHash) {
        const QByteArray stored(reinterpret_cast<const char*>(field + 1), kHashSize);
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
