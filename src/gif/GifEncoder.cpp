#include "GifEncoder.h"

#include <algorithm>
#include <vector>

namespace zelctl::gifEncoder {

namespace {

constexpr int MaxCode = 4096; // codes are at most 12 bits
constexpr int HashSize = 5003; // prime, about 80% occupied when the table is full
constexpr int HashShift = 4; // spreads the pixel over the hash slots
constexpr int MaxSubBlock = 254;

// Packs codes least significant bit first into data sub-blocks.
class CodeWriter
{
public:
    explicit CodeWriter(QByteArray &out)
        : m_out(out)
    { }

    void put(int code, int bits)
    {
        m_accumulator |= quint32(code) << m_bitCount;
        m_bitCount += bits;
        while (m_bitCount >= 8) {
            pushByte(char(m_accumulator & 0xFF));
            m_accumulator >>= 8;
            m_bitCount -= 8;
        }
    }

    void finish()
    {
        if (m_bitCount > 0)
            pushByte(char(m_accumulator & 0xFF));
        flushBlock();
        m_out.append('\0');
    }

private:
    void pushByte(char byte)
    {
        m_block[m_blockSize++] = byte;
        if (m_blockSize == MaxSubBlock)
            flushBlock();
    }
    void flushBlock()
    {
        if (m_blockSize == 0)
            return;
        m_out.append(char(m_blockSize));
        m_out.append(m_block, m_blockSize);
        m_blockSize = 0;
    }

    QByteArray &m_out;
    quint32 m_accumulator = 0;
    int m_bitCount = 0;
    char m_block[MaxSubBlock] {};
    int m_blockSize = 0;
};

// Bits of a table holding count entries: 2^bits >= count, at least 1.
int bitsFor(int count)
{
    int bits = 1;
    while ((1 << bits) < count && bits < 8)
        ++bits;
    return bits;
}

void putWord(QByteArray &out, int value)
{
    const int clamped = std::clamp(value, 0, 0xFFFF);
    out.append(char(clamped & 0xFF));
    out.append(char(clamped >> 8));
}

void putTable(QByteArray &out, const gifScanner::ColorTable &table, int bits)
{
    for (int k = 0; k < (1 << bits); ++k) {
        const quint32 rgb = k < table.count ? table.entries[size_t(k)] : 0;
        out.append(char(rgb >> 16));
        out.append(char(rgb >> 8));
        out.append(char(rgb));
    }
}

} // namespace

QByteArray compress(QByteArrayView indices, int minCodeSize)
{
    minCodeSize = std::clamp(minCodeSize, 2, 8);
    QByteArray out;
    out.append(char(minCodeSize));
    CodeWriter writer(out);

    const int clearCode = 1 << minCodeSize;
    const int endCode = clearCode + 1;
    int bits = minCodeSize + 1;
    int next = clearCode + 2;
    std::vector<qint32> keys(HashSize, -1);
    std::vector<quint16> codes(HashSize, 0);

    writer.put(clearCode, bits);
    if (!indices.isEmpty()) {
        int prefix = quint8(indices[0]);
        for (qsizetype i = 1; i < indices.size(); ++i) {
            const int pixel = quint8(indices[i]);
            const qint32 key = (pixel << 12) + prefix;
            int slot = (pixel << HashShift) ^ prefix;
            bool found = keys[size_t(slot)] == key;
            if (!found && keys[size_t(slot)] >= 0) {
                const int step = slot == 0 ? 1 : HashSize - slot;
                do {
                    slot -= step;
                    if (slot < 0)
                        slot += HashSize;
                    found = keys[size_t(slot)] == key;
                } while (!found && keys[size_t(slot)] >= 0);
            }
            if (found) {
                prefix = codes[size_t(slot)];
                continue;
            }
            writer.put(prefix, bits);
            prefix = pixel;
            if (next < MaxCode) {
                keys[size_t(slot)] = key;
                codes[size_t(slot)] = quint16(next++);
                // The decoder widens its codes once the next code no longer fits.
                if (next > (1 << bits) && bits < 12)
                    ++bits;
            } else {
                writer.put(clearCode, bits);
                std::fill(keys.begin(), keys.end(), -1);
                next = clearCode + 2;
                bits = minCodeSize + 1;
            }
        }
        writer.put(prefix, bits);
    }
    writer.put(endCode, bits);
    writer.finish();
    return out;
}

QByteArray encode(const Animation &animation)
{
    QByteArray out("GIF89a");
    putWord(out, animation.width);
    putWord(out, animation.height);
    const gifScanner::ColorTable global = animation.colorTables.value(0);
    const int globalBits = bitsFor(global.count);
    out.append(char(global.count > 0 ? 0xF0 | (globalBits - 1) : 0x70));
    out.append('\0'); // background colour index
    out.append('\0'); // pixel aspect ratio
    if (global.count > 0)
        putTable(out, global, globalBits);

    if (animation.frames.size() > 1) {
        out.append("\x21\xFF\x0BNETSCAPE2.0\x03\x01", 16);
        putWord(out, animation.loopCount);
        out.append('\0');
    }

    for (const Frame &frame : animation.frames) {
        const gifScanner::FrameRecord &r = frame.record;
        const qsizetype area = qsizetype(std::clamp(r.Width, 0, 0xFFFF)) * std::clamp(r.Height, 0, 0xFFFF);
        QByteArray indices = frame.indices.left(area);
        if (indices.size() < area)
            indices.append(area - indices.size(), '\0');

        out.append("\x21\xF9\x04", 3);
        out.append(char((r.Disposal & 7) << 2 | (r.HasTransparency ? 1 : 0)));
        putWord(out, r.Delay / 10);
        out.append(char(r.TransparentIndex));
        out.append('\0');

        const bool local = r.ColorTable > 0 && r.ColorTable < animation.colorTables.size();
        const gifScanner::ColorTable &table = local ? animation.colorTables[r.ColorTable] : global;
        const int tableBits = bitsFor(table.count);
        out.append(char(0x2C));
        putWord(out, r.Left);
        putWord(out, r.Top);
        putWord(out, r.Width);
        putWord(out, r.Height);
        out.append(char(local ? 0x80 | (tableBits - 1) : 0));
        if (local)
            putTable(out, table, tableBits);

        const int highest = indices.isEmpty() ? 0
                                              : quint8(*std::max_element(indices.begin(), indices.end(),
                                                  [](char a, char b) { return quint8(a) < quint8(b); }));
        out.append(compress(indices, std::max({ 2, tableBits, bitsFor(highest + 1) })));
    }
    out.append(char(0x3B));
    return out;
}

} // namespace zelctl::gifEncoder
