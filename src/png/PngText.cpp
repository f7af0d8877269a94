#include "PngText.h"

#include "common/modFuncs.h"

#include <QStringList>

#include <zlib.h>

namespace zelctl::png {

namespace {

// Keywords have at most 79 characters, so the separator lies within the first 81 bytes.
constexpr qsizetype keywordSearchLength = 81;
// Compressed text is inflated into buffers growing by twice its length, up to this ratio.
constexpr qsizetype maximumTextRatio = 50;

std::optional<QByteArray> inflateText(QByteArrayView compressed)
{
    const qsizetype step = 2 * compressed.size();
    if (step == 0)
        return std::nullopt;
    for (qsizetype capacity = step; capacity <= maximumTextRatio * compressed.size(); capacity += step) {
        QByteArray text(capacity, Qt::Uninitialized);
        uLongf length = uLongf(capacity);
        if (uncompress(reinterpret_cast<Bytef *>(text.data()), &length,
                reinterpret_cast<const Bytef *>(compressed.data()), uLong(compressed.size()))
            == Z_OK) {
            text.truncate(qsizetype(length));
            return text;
        }
    }
    return std::nullopt;
}

std::optional<QString> recordLine(QByteArrayView type, QByteArrayView data)
{
    const qsizetype zero = data.first(std::min(data.size(), keywordSearchLength)).indexOf('\0');
    if (zero < 1)
        return std::nullopt;
    QByteArray text;
    if (type == "tEXt") {
        text = data.sliced(zero + 1).toByteArray();
    } else {
        if (data.size() < zero + 2)
            return std::nullopt;
        const auto inflated = inflateText(data.sliced(zero + 2));
        if (!inflated)
            return std::nullopt;
        text = *inflated;
    }
    // An escape character would start a terminal sequence wherever the text is shown.
    text.replace('\x1b', ' ');
    return modFuncs::decodeWindows1252(data.first(zero).toByteArray()) + QStringLiteral(": ")
        + modFuncs::decodeWindows1252(text);
}

} // namespace

QString commentText(const QByteArray &textRecords)
{
    QStringList lines;
    const QByteArrayView records(textRecords);
    qsizetype position = 0;
    while (records.size() - position >= 8) {
        const auto *p = reinterpret_cast<const uchar *>(records.data() + position);
        const quint32 length = quint32(p[0]) | quint32(p[1]) << 8 | quint32(p[2]) << 16 | quint32(p[3]) << 24;
        if (length > quint64(records.size() - position - 8))
            break;
        const QByteArrayView type = records.sliced(position + 4, 4);
        const QByteArrayView data = records.sliced(position + 8, qsizetype(length));
        position += 8 + qsizetype(length);
        if (type != "tEXt" && type != "zTXt")
            continue;
        if (const auto line = recordLine(type, data))
            lines.append(*line);
    }
    QString text = lines.join(QStringLiteral("\r\n"));
    text.replace(QStringLiteral("\r\n"), QStringLiteral("\n"));
    text.replace(QStringLiteral("\n"), QStringLiteral("\r\n"));
    return text;
}

} // namespace zelctl::png
