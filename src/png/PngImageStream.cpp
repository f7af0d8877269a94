#include "PngImageStream.h"

#include <libdeflate.h>
#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>

namespace zelctl::png {

namespace {

std::unique_ptr<uint8_t[]> allocate(int64_t size)
{
    return std::unique_ptr<uint8_t[]>(new (std::nothrow) uint8_t[size_t(std::max<int64_t>(size, 1))]);
}

} // namespace

// zlib's streaming inflate over the compressed data, which it reads in place.
class ImageStream::Inflater
{
public:
    explicit Inflater(std::vector<QByteArrayView> parts)
        : m_parts(std::move(parts))
    {
        m_ready = inflateInit(&m_stream) == Z_OK;
    }
    ~Inflater()
    {
        if (m_ready)
            inflateEnd(&m_stream);
    }

    bool ready() const { return m_ready; }

    // Fills out with exactly length bytes; false when the stream is broken or ends first.
    bool read(uint8_t *out, int64_t length)
    {
        while (length > 0) {
            if (m_ended)
                return false; // the stream ended before the image did
            feed();
            const uInt part = uInt(std::min<int64_t>(length, std::numeric_limits<uInt>::max()));
            m_stream.next_out = out;
            m_stream.avail_out = part;
            const int result = inflate(&m_stream, Z_NO_FLUSH);
            const uInt produced = part - m_stream.avail_out;
            out += produced;
            length -= produced;
            if (result == Z_STREAM_END)
                m_ended = true;
            else if (result != Z_OK && !(result == Z_BUF_ERROR && produced > 0))
                return false;
        }
        return true;
    }

    // True when the stream ends here: anything else means it is longer than the image.
    bool end()
    {
        if (m_ended)
            return true;
        uint8_t spare = 0;
        feed();
        m_stream.next_out = &spare;
        m_stream.avail_out = 1;
        const int result = inflate(&m_stream, Z_FINISH);
        m_ended = result == Z_STREAM_END && m_stream.avail_out == 1;
        return m_ended;
    }

private:
    // Gives zlib the next piece of input once it has used the last; zlib counts in 32-bit
    // units, so a longer part is fed in pieces.
    void feed()
    {
        while (m_stream.avail_in == 0 && m_next < m_parts.size()) {
            QByteArrayView &part = m_parts[m_next];
            const uInt piece = uInt(std::min<qsizetype>(part.size(), std::numeric_limits<uInt>::max()));
            m_stream.next_in = reinterpret_cast<Bytef *>(const_cast<char *>(part.data()));
            m_stream.avail_in = piece;
            part = part.sliced(piece);
            if (part.isEmpty())
                ++m_next;
        }
    }

    z_stream m_stream {};
    std::vector<QByteArrayView> m_parts;
    size_t m_next = 0;
    bool m_ready = false;
    bool m_ended = false;
};

ImageStream::ImageStream(std::vector<QByteArrayView> compressed, int64_t inflatedSize, Mode mode)
{
    const bool whole = mode == Mode::Whole || (mode == Mode::Automatic && inflatedSize <= WholeLimit);
    if (!whole) {
        m_inflater = std::make_unique<Inflater>(std::move(compressed));
        m_failed = !m_inflater->ready();
        return;
    }
    QByteArrayView input = compressed.empty() ? QByteArrayView() : compressed.front();
    std::unique_ptr<uint8_t[]> joined;
    if (compressed.size() > 1) {
        qsizetype total = 0;
        for (const QByteArrayView part : compressed)
            total += part.size();
        joined = allocate(total);
        if (joined) {
            uint8_t *end = joined.get();
            for (const QByteArrayView part : compressed)
                end = std::copy(part.begin(), part.end(), end);
            input = QByteArrayView(joined.get(), total);
        }
    }
    m_buffer = allocate(inflatedSize);
    libdeflate_decompressor *decompressor = libdeflate_alloc_decompressor();
    // Without an actual-size pointer, libdeflate refuses a stream of any other length.
    m_failed = inflatedSize < 0 || !m_buffer || !decompressor || (compressed.size() > 1 && !joined)
        || libdeflate_zlib_decompress(
               decompressor, input.data(), size_t(input.size()), m_buffer.get(), size_t(inflatedSize), nullptr)
            != LIBDEFLATE_SUCCESS;
    libdeflate_free_decompressor(decompressor);
    m_size = m_failed ? 0 : inflatedSize;
    m_capacity = m_size;
}

ImageStream::~ImageStream() = default;

bool ImageStream::whole() const
{
    return !m_inflater;
}

uint8_t *ImageStream::next(int64_t length, int64_t keep)
{
    if (m_failed || length < 0 || keep < 0)
        return nullptr;
    if (!m_inflater) {
        if (length > m_size - m_position) {
            m_failed = true;
            return nullptr;
        }
        uint8_t *block = m_buffer.get() + m_position;
        m_position += length;
        return block;
    }
    // The kept bytes are the last ones handed out, at the end of the used part of the buffer.
    keep = std::min(keep, m_position);
    if (keep + length > m_capacity) {
        std::unique_ptr<uint8_t[]> larger = allocate(keep + length);
        if (!larger) {
            m_failed = true;
            return nullptr;
        }
        if (keep > 0)
            std::memcpy(larger.get(), m_buffer.get() + m_position - keep, size_t(keep));
        m_buffer = std::move(larger);
        m_capacity = keep + length;
    } else if (keep > 0) {
        std::memmove(m_buffer.get(), m_buffer.get() + m_position - keep, size_t(keep));
    }
    uint8_t *block = m_buffer.get() + keep;
    m_position = keep + length;
    if (!m_inflater->read(block, length)) {
        m_failed = true;
        return nullptr;
    }
    return block;
}

bool ImageStream::finish()
{
    if (m_failed)
        return false;
    m_failed = m_inflater ? !m_inflater->end() : m_position != m_size;
    return !m_failed;
}

} // namespace zelctl::png
