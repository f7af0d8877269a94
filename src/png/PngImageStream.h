#pragma once

#include "zelctl_export.h"

#include <QByteArrayView>

#include <cstdint>
#include <memory>
#include <vector>

namespace zelctl::png {

// The inflated IDAT stream, handed out a block of rows at a time. It accepts exactly what
// uncompress would accept: a whole zlib stream, checksum included, of exactly the promised
// length (bytes after the stream's end are ignored).
//
// A stream whose inflated size is at most WholeLimit is inflated at once, with libdeflate,
// into one buffer whose blocks are handed out in place; the compressed data may then be
// released (a stream in several parts is joined first: callers that can join it in place
// save that copy). Larger streams are inflated by zlib, part after part, as the blocks are
// asked for, into a buffer of a few rows, so that a huge image costs little more than its
// bitmap.
class ZELCTL_EXPORT ImageStream
{
public:
    enum class Mode { Automatic, Whole, Streaming };
    static constexpr int64_t WholeLimit = int64_t(64) << 20;

    // The compressed stream in parts, in order. In streaming mode they must stay valid for as
    // long as the stream is read.
    ImageStream(std::vector<QByteArrayView> compressed, int64_t inflatedSize, Mode mode = Mode::Automatic);
    ~ImageStream();
    ImageStream(const ImageStream &) = delete;
    ImageStream &operator=(const ImageStream &) = delete;

    // True when the whole stream was inflated by the constructor.
    bool whole() const;
    // The next `length` inflated bytes, writable; the `keep` bytes handed out just before
    // them stay readable right in front of them. nullptr when the stream is broken or ends
    // before them.
    uint8_t *next(int64_t length, int64_t keep);
    // True when the stream ends right after what was handed out.
    bool finish();
    bool failed() const { return m_failed; }

private:
    class Inflater;
    std::unique_ptr<Inflater> m_inflater; // streaming only
    std::unique_ptr<uint8_t[]> m_buffer; // the whole stream, or the last blocks handed out
    int64_t m_capacity = 0;
    int64_t m_size = 0; // whole mode: bytes inflated
    int64_t m_position = 0; // end of what was handed out, in the buffer
    bool m_failed = false;
};

} // namespace zelctl::png
