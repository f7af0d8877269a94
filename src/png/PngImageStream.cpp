#include "PngImageStream.h"

#include <zlib.h>

#include <algorithm>
#include <limits>

namespace zelctl::png {

class ImageStream::Private
{
public:
    z_stream stream {};
    bool ready = false;
    bool ended = false;
    const Bytef *input = nullptr;
    int64_t inputLeft = 0;

    // zlib counts in 32-bit units; longer input is fed in parts.
    void feed()
    {
        if (stream.avail_in == 0 && inputLeft > 0) {
            const uInt part = uInt(std::min<int64_t>(inputLeft, std::numeric_limits<uInt>::max()));
            stream.next_in = const_cast<Bytef *>(input);
            stream.avail_in = part;
            input += part;
            inputLeft -= part;
        }
    }
};

ImageStream::ImageStream(const QByteArray &compressed)
    : d(std::make_unique<Private>())
{
    d->input = reinterpret_cast<const Bytef *>(compressed.constData());
    d->inputLeft = compressed.size();
    d->ready = inflateInit(&d->stream) == Z_OK;
    m_failed = !d->ready;
}

ImageStream::~ImageStream()
{
    if (d->ready)
        inflateEnd(&d->stream);
}

bool ImageStream::read(uint8_t *out, int64_t length)
{
    while (!m_failed && length > 0) {
        if (d->ended) {
            m_failed = true; // the stream ended before the image did
            break;
        }
        d->feed();
        const uInt part = uInt(std::min<int64_t>(length, std::numeric_limits<uInt>::max()));
        d->stream.next_out = out;
        d->stream.avail_out = part;
        const int result = inflate(&d->stream, Z_NO_FLUSH);
        const uInt produced = part - d->stream.avail_out;
        out += produced;
        length -= produced;
        if (result == Z_STREAM_END)
            d->ended = true;
        else if (result != Z_OK && !(result == Z_BUF_ERROR && produced > 0))
            m_failed = true;
    }
    return !m_failed;
}

bool ImageStream::finish()
{
    if (m_failed)
        return false;
    if (!d->ended) {
        // Anything but the end of the stream here means it is longer than the image.
        uint8_t spare = 0;
        d->feed();
        d->stream.next_out = &spare;
        d->stream.avail_out = 1;
        const int result = inflate(&d->stream, Z_FINISH);
        d->ended = result == Z_STREAM_END && d->stream.avail_out == 1;
        m_failed = !d->ended;
    }
    return d->ended;
}

} // namespace zelctl::png
