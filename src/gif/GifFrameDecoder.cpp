#include "GifFrameDecoder.h"

#include <gif_lib.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <memory>

namespace zelctl::gifFrameDecoder {

namespace {

// A single-image GIF made of three pieces without copying the image block: a header and
// logical screen without a global table, the block itself, and the trailer.
struct FrameStream
{
    std::array<char, 13> header {};
    QByteArrayView block;
    qsizetype pos = 0;

    qsizetype size() const { return qsizetype(header.size()) + block.size() + 1; }

    int read(GifByteType *out, int wanted)
    {
        int done = 0;
        while (done < wanted && pos < size()) {
            const qsizetype headerSize = qsizetype(header.size());
            if (pos < headerSize) {
                const int n = int(std::min<qsizetype>(wanted - done, headerSize - pos));
                std::memcpy(out + done, header.data() + pos, size_t(n));
                done += n;
                pos += n;
            } else if (pos < headerSize + block.size()) {
                const int n = int(std::min<qsizetype>(wanted - done, headerSize + block.size() - pos));
                std::memcpy(out + done, block.data() + (pos - headerSize), size_t(n));
                done += n;
                pos += n;
            } else {
                out[done++] = 0x3B;
                ++pos;
            }
        }
        return done;
    }
};

int readStream(GifFileType *gif, GifByteType *out, int wanted)
{
    return static_cast<FrameStream *>(gif->UserData)->read(out, wanted);
}

struct CloseGif
{
    void operator()(GifFileType *gif) const { DGifCloseFile(gif, nullptr); }
};

} // namespace

bool decode(QByteArrayView gif, const gifScanner::BlockEntry &block, const gifScanner::FrameRecord &frame,
    uchar *target, qsizetype stride)
{
    if (block.Start < 0 || block.Length < 10 || block.Start > gif.size() - block.Length)
        return false;
    if (frame.Width <= 0 || frame.Height <= 0)
        return true;

    FrameStream stream;
    std::memcpy(stream.header.data(), "GIF89a", 6);
    stream.header[6] = char(frame.Width & 0xFF);
    stream.header[7] = char(frame.Width >> 8);
    stream.header[8] = char(frame.Height & 0xFF);
    stream.header[9] = char(frame.Height >> 8);
    stream.block = gif.sliced(block.Start, block.Length);

    int error = 0;
    std::unique_ptr<GifFileType, CloseGif> file(DGifOpen(&stream, readStream, &error));
    if (!file)
        return false;
    GifRecordType type = UNDEFINED_RECORD_TYPE;
    if (DGifGetRecordType(file.get(), &type) == GIF_ERROR || type != IMAGE_DESC_RECORD_TYPE
        || DGifGetImageDesc(file.get()) == GIF_ERROR)
        return false;
    // The descriptor is the one the scanner read, so its size is the frame's.
    if (file->Image.Width != frame.Width || file->Image.Height != frame.Height)
        return false;

    auto put
        = [&](int row) { return DGifGetLine(file.get(), target + qsizetype(row) * stride, frame.Width) == GIF_OK; };
    if (file->Image.Interlace) {
        static constexpr int start[] = { 0, 4, 2, 1 };
        static constexpr int step[] = { 8, 8, 4, 2 };
        for (int pass = 0; pass < 4; ++pass) {
            for (int row = start[pass]; row < frame.Height; row += step[pass]) {
                if (!put(row))
                    return false;
            }
        }
    } else {
        for (int row = 0; row < frame.Height; ++row) {
            if (!put(row))
                return false;
        }
    }
    return true;
}

} // namespace zelctl::gifFrameDecoder
