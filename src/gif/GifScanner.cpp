#include "GifScanner.h"

#include <optional>

namespace zelctl::gifScanner {

namespace {

constexpr quint8 ExtensionIntroducer = 0x21;
constexpr quint8 ImageSeparator = 0x2C;
constexpr quint8 ApplicationLabel = 0xFF;
constexpr quint8 GraphicControlLabel = 0xF9;

// Reads the GIF at a moving position. Every read checks what remains; a read past the end
// answers nothing (or false) and the scan ends there.
class Reader
{
public:
    explicit Reader(QByteArrayView bytes)
        : m_bytes(bytes)
    { }

    qsizetype pos() const { return m_pos; }
    void seek(qsizetype pos) { m_pos = pos; }

    std::optional<quint8> byte()
    {
        if (m_pos < 0 || m_pos >= m_bytes.size())
            return std::nullopt;
        return quint8(m_bytes[m_pos++]);
    }

    std::optional<quint16> word()
    {
        if (m_pos < 0 || m_bytes.size() - m_pos < 2)
            return std::nullopt;
        const quint16 value = quint16(quint8(m_bytes[m_pos]) | quint8(m_bytes[m_pos + 1]) << 8);
        m_pos += 2;
        return value;
    }

    // n bytes, or n zero bytes without moving when they would run past the end.
    QByteArray bytes(qsizetype n)
    {
        if (m_pos < 0 || m_bytes.size() - m_pos < n)
            return QByteArray(n, '\0');
        const QByteArray result = m_bytes.sliced(m_pos, n).toByteArray();
        m_pos += n;
        return result;
    }

    // Jumps over data sub-blocks up to and past their zero terminator.
    bool skipSubBlocks()
    {
        for (;;) {
            const std::optional<quint8> length = byte();
            if (!length)
                return false;
            if (*length == 0)
                return true;
            m_pos += *length;
        }
    }

    // A table of 2^sizeField entries (sizeField 1..8) into table.
    bool colorTable(int sizeField, ColorTable &table)
    {
        const int count = 1 << sizeField;
        if (m_pos < 0 || m_bytes.size() - m_pos < qsizetype(count) * 3)
            return false;
        for (int k = 0; k < count; ++k) {
            const quint32 r = quint8(m_bytes[m_pos]), g = quint8(m_bytes[m_pos + 1]), b = quint8(m_bytes[m_pos + 2]);
            table.entries[size_t(k)] = r << 16 | g << 8 | b;
            m_pos += 3;
        }
        table.count = count;
        return true;
    }

private:
    QByteArrayView m_bytes;
    qsizetype m_pos = 0;
};

class Scanner
{
public:
    explicit Scanner(QByteArrayView bytes)
        : m_in(bytes)
    { }

    // False when the GIF must not load at all; true keeps the frames found so far, even
    // when the file ended early.
    bool run();

    GifLayout layout;

private:
    bool applicationExtension();
    bool graphicControlExtension(qsizetype introducer);
    enum class Image { Read, Truncated, Refused };
    Image imageBlock(qsizetype separator);

    Reader m_in;
    FrameRecord m_pending;
    bool m_hasPending = false;
};

bool Scanner::run()
{
    layout.ColorTables.append(ColorTable {});
    const QByteArray signature = m_in.bytes(6).toLower();
    if (signature != "gif89a" && signature != "gif87a")
        return false;
    m_in.seek(10);
    const std::optional<quint8> packed = m_in.byte();
    if (!packed)
        return true;
    m_in.seek(13); // background colour index and aspect ratio are not used
    if ((*packed & 0x80) && !m_in.colorTable((*packed & 7) + 1, layout.ColorTables[0]))
        return true;

    for (;;) {
        const qsizetype at = m_in.pos();
        const std::optional<quint8> introducer = m_in.byte();
        if (!introducer)
            return true;
        switch (*introducer) {
        case 0: // stray padding between blocks
            break;
        case ExtensionIntroducer: {
            const std::optional<quint8> label = m_in.byte();
            if (!label)
                return true;
            bool complete = false;
            if (*label == ApplicationLabel)
                complete = applicationExtension();
            else if (*label == GraphicControlLabel)
                complete = graphicControlExtension(at);
            else
                complete = m_in.skipSubBlocks();
            if (!complete)
                return true;
            break;
        }
        case ImageSeparator:
            switch (imageBlock(at)) {
            case Image::Read:
                break;
            case Image::Truncated:
                return true;
            case Image::Refused:
                return false;
            }
            break;
        default: // the trailer, or anything that is not a block
            return true;
        }
    }
}

bool Scanner::applicationExtension()
{
    const std::optional<quint8> size = m_in.byte();
    if (!size)
        return false;
    if (m_in.bytes(*size).toUpper() == "NETSCAPE2.0") {
        const qsizetype subBlock = m_in.pos();
        const std::optional<quint8> length = m_in.byte();
        if (!length)
            return false;
        if (*length == 3) {
            m_in.seek(m_in.pos() + 1); // the sub-block's id byte
            const std::optional<quint16> loops = m_in.word();
            if (!loops)
                return false;
            layout.LoopCount = *loops;
        }
        m_in.seek(subBlock);
    }
    return m_in.skipSubBlocks();
}

bool Scanner::graphicControlExtension(qsizetype introducer)
{
    m_pending = FrameRecord {};
    m_pending.Position = qint32(introducer);
    m_hasPending = true;
    const qsizetype sizeAt = m_in.pos();
    const std::optional<quint8> size = m_in.byte();
    const std::optional<quint8> packed = size ? m_in.byte() : std::nullopt;
    if (!packed)
        return false;
    m_pending.Disposal = quint8((*packed / 4) & 3);
    if (m_pending.Disposal == 3 && layout.Frames.isEmpty())
        m_pending.Disposal = 0; // nothing to go back to before the first frame
    const std::optional<quint16> delay = m_in.word();
    if (!delay)
        return false;
    m_pending.Delay = qint32(*delay) * 10;
    m_pending.HasTransparency = *packed & 1;
    if (m_pending.HasTransparency) {
        const std::optional<quint8> index = m_in.byte();
        if (!index)
            return false;
        m_pending.TransparentIndex = *index;
    }
    m_in.seek(sizeAt + 1 + *size);
    return m_in.skipSubBlocks();
}

Scanner::Image Scanner::imageBlock(qsizetype separator)
{
    FrameRecord frame = m_hasPending ? m_pending : FrameRecord {};
    if (!m_hasPending)
        frame.Position = qint32(separator);
    m_hasPending = false;

    for (qint32 *field : { &frame.Left, &frame.Top, &frame.Width, &frame.Height }) {
        const std::optional<quint16> value = m_in.word();
        if (!value)
            return Image::Truncated;
        *field = *value;
    }
    const std::optional<quint8> packedByte = m_in.byte();
    if (!packedByte)
        return Image::Truncated;
    const quint8 packed = *packedByte;
    if (packed & 0x80) {
        layout.ColorTables.append(ColorTable {});
        frame.ColorTable = qint32(layout.ColorTables.size() - 1);
        if (!m_in.colorTable((packed & 7) + 1, layout.ColorTables.last()))
            return Image::Truncated;
    } else if (!layout.hasGlobalTable()) {
        return Image::Refused;
    }
    if (!m_in.byte() || !m_in.skipSubBlocks()) // LZW minimum code size, then the data
        return Image::Truncated;

    const BlockEntry block { qint32(m_in.pos() - separator), qint32(separator) };
    if (block.Length >= 3) {
        layout.Frames.append(frame);
        layout.BlockList.append(block);
        layout.CanvasWidth = std::max(layout.CanvasWidth, frame.Left + frame.Width);
        layout.CanvasHeight = std::max(layout.CanvasHeight, frame.Top + frame.Height);
    }
    return Image::Read;
}

} // namespace

GifLayout scan(QByteArrayView bytes)
{
    Scanner scanner(bytes);
    if (!scanner.run())
        return GifLayout {};
    return std::move(scanner.layout);
}

} // namespace zelctl::gifScanner
