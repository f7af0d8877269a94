#pragma once

#include <QByteArray>

#include <cstdint>
#include <memory>

namespace zelctl::png {

// The inflated IDAT stream, handed out a block of rows at a time so that each block is
// still in the cache when it is unfiltered and converted. It accepts exactly what
// uncompress would accept: a whole zlib stream, checksum included, of exactly the
// promised length.
class ImageStream
{
public:
    explicit ImageStream(const QByteArray &compressed);
    ~ImageStream();
    ImageStream(const ImageStream &) = delete;
    ImageStream &operator=(const ImageStream &) = delete;

    // Inflates the next `length` bytes into out; false when the stream is broken or ends
    // before them.
    bool read(uint8_t *out, int64_t length);
    // True when the stream ends right after what was read.
    bool finish();
    bool failed() const { return m_failed; }

private:
    class Private;
    std::unique_ptr<Private> d;
    bool m_failed = false;
};

} // namespace zelctl::png
