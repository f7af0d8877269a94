#include "GifFiles.h"

#include "gif/GifFrameDecoder.h"
#include "gif/GifScanner.h"

#include <QRandomGenerator>

#include <gtest/gtest.h>

using namespace zelctl;
using test::gifOf;

namespace {

const QList<quint32> fourColours = { 0x000000, 0xFF0000, 0x00FF00, 0x0000FF };

} // namespace

TEST(GifScanner, toleratesOddButHarmlessBytesAndRefusesWhatIsNotAGifOrHasNoColours)
{
    const QByteArray frame = QByteArray("\x2C\0\0\0\0\4\0\4\0\0", 10) + gifEncoder::compress(QByteArray(16, '\1'), 2);
    const auto netscape
        = [](char loops) { return QByteArray("\x21\xFF\x0Bnetscape2.0\x03\x01", 16) + loops + QByteArray(2, '\0'); };
    // Signature and extension in lower case, stray zero bytes, a comment, no trailer.
    const QByteArray odd = QByteArray("gIf87A\4\0\4\0\x81\0\0", 13) + QByteArray(12, '\x40') + netscape(0)
        + QByteArray(3, '\0')
        + QByteArray("\x21\xFE\x03"
                     "abc\0",
            7)
        + frame + QByteArray(2, '\0') + netscape(7) + frame;
    EXPECT_EQ(gifScanner::scan(odd).LoopCount, 7);
    const QByteArray plain = gifOf(4, 4, fourColours, { { 0, 0, 4, 4, QByteArray(16, '\1') } });
    // The second frame has no table of its own and there is no global one: nothing loads.
    const QByteArray noTable = gifOf(4, 4, {},
        { { 0, 0, 4, 4, QByteArray(16, '\1'), 0, 10, -1, { 0, 0xFFFFFF } }, { 0, 0, 4, 4, QByteArray(16, '\1') } });
    const std::pair<QByteArray, int> cases[] = { { odd, 2 }, { plain, 1 }, { QByteArray(), 0 },
        { QByteArray("GIF88a"), 0 }, { QByteArray(plain).replace(0, 6, "GIF90a"), 0 }, { noTable, 0 },
        { gifOf(4, 4, fourColours, {}).left(20), 0 } }; // a colour table cut short
    for (const auto &[bytes, frames] : cases) {
        const gifScanner::GifLayout layout = gifScanner::scan(bytes);
        EXPECT_EQ(layout.Frames.size(), frames) << bytes.toHex().toStdString();
        EXPECT_EQ(layout.CanvasWidth, frames ? 4 : 0);
    }
}

// Disposal 3 on the first frame has nothing to restore; the second frame reaches past the screen.
TEST(GifScanner, readsTheFramesAndTheCanvasAndATruncatedFileKeepsItsCompleteFrames)
{
    const QByteArray whole = gifOf(
        8, 8, fourColours, { { 0, 0, 8, 8, QByteArray(64, '\1'), 3, 50 }, { 6, 1, 4, 8, QByteArray(32, '\2') } });
    const gifScanner::GifLayout full = gifScanner::scan(whole);
    ASSERT_EQ(full.Frames.size(), 2);
    EXPECT_EQ(QList<int>({ full.Frames[0].Disposal, full.Frames[0].Delay, full.CanvasWidth, full.CanvasHeight }),
        QList<int>({ 0, 50, 10, 9 }));
    for (int cut = 0; cut < whole.size(); ++cut) {
        const gifScanner::GifLayout layout = gifScanner::scan(whole.left(cut));
        int complete = 0;
        while (complete < 2 && cut >= full.BlockList[complete].Start + full.BlockList[complete].Length)
            ++complete;
        ASSERT_EQ(layout.Frames.size(), complete) << "cut at " << cut;
        EXPECT_EQ(layout.BlockList.size(), complete);
    }
}

TEST(GifFrameDecoder, putsIndicesInTheirRowsAndInterlacedOrder)
{
    QByteArray indices;
    for (int i = 0; i < 6 * 11; ++i)
        indices.append(char((i * 7 + i / 6) % 4));
    constexpr int stride = 9;
    const auto decoded = [](const QByteArray &gif) {
        const gifScanner::GifLayout layout = gifScanner::scan(gif);
        QByteArray target(stride * 11, '\x7F');
        if (layout.Frames.size() != 1)
            return QByteArray();
        EXPECT_TRUE(gifFrameDecoder::decode(
            gif, layout.BlockList[0], layout.Frames[0], reinterpret_cast<uchar *>(target.data()), stride));
        return target;
    };
    QByteArray target = decoded(gifOf(6, 11, fourColours, { { 0, 0, 6, 11, indices } }));
    for (int y = 0; y < 11; ++y) {
        EXPECT_EQ(target.mid(y * stride, 6), indices.mid(y * 6, 6)) << "row " << y;
        EXPECT_EQ(target.mid(y * stride + 6, 3), QByteArray(3, '\x7F')) << "past the row is untouched";
    }

    // The same rows stored interlaced (0, 8, 4, 2, 6, 10, 1, 3, 5, 7, 9) come back in order.
    QByteArray interlaced;
    for (int row : { 0, 8, 4, 2, 6, 10, 1, 3, 5, 7, 9 })
        interlaced.append(indices.mid(row * 6, 6));
    QByteArray gif = gifOf(6, 11, fourColours, { { 0, 0, 6, 11, interlaced } });
    gif[gifScanner::scan(gif).BlockList[0].Start + 9] = char(0x40); // the descriptor's interlace flag
    target = decoded(gif);
    for (int y = 0; y < 11; ++y)
        EXPECT_EQ(target.mid(y * stride, 6), indices.mid(y * 6, 6)) << "row " << y;
}

TEST(GifFrameDecoder, damagedDataFailsWithoutWritingOutside)
{
    QByteArray gif = gifOf(8, 8, fourColours, { { 0, 0, 8, 8, QByteArray(64, '\3') } });
    const gifScanner::GifLayout layout = gifScanner::scan(gif);
    ASSERT_EQ(layout.Frames.size(), 1);
    gifScanner::FrameRecord wrongSize = layout.Frames[0];
    wrongSize.Width = 9;
    QByteArray target(9 * 9, '\0');
    auto *bits = reinterpret_cast<uchar *>(target.data());
    EXPECT_FALSE(gifFrameDecoder::decode(gif, layout.BlockList[0], wrongSize, bits, 9));
    gifScanner::BlockEntry outside = layout.BlockList[0];
    outside.Length = int(gif.size());
    EXPECT_FALSE(gifFrameDecoder::decode(gif, outside, layout.Frames[0], bits, 8));

    // LZW data cut to its first sub-block of one byte: the rows it reaches stand.
    gif[layout.BlockList[0].Start + 11] = '\x01';
    EXPECT_FALSE(gifFrameDecoder::decode(gif, layout.BlockList[0], layout.Frames[0], bits, 8));
}

// Noise fills the code table many times over; runs and a single colour make long codes.
// (The control's written picture checks the rest of the encoder.)
TEST(GifEncoder, theDecoderReadsBackTheSameIndices)
{
    struct Case
    {
        int width, height, colours, runLength;
    };
    for (const Case &c : { Case { 1, 1, 2, 1 }, Case { 7, 3, 2, 1 }, Case { 300, 200, 256, 1 },
             Case { 300, 200, 256, 40 }, Case { 64, 64, 16, 3 }, Case { 500, 100, 1, 1 }, Case { 2000, 1, 5, 7 } }) {
        SCOPED_TRACE(testing::Message() << c.width << "x" << c.height << " colours " << c.colours);
        QByteArray indices;
        while (indices.size() < c.width * c.height) {
            const char index = char(QRandomGenerator::global()->bounded(c.colours));
            indices.append(QByteArray(1 + QRandomGenerator::global()->bounded(c.runLength), index));
        }
        indices.truncate(c.width * c.height);
        const QByteArray gif = gifOf(
            c.width, c.height, QList<quint32>(std::max(2, c.colours)), { { 0, 0, c.width, c.height, indices } });
        const QStringList decoded = test::framesOf(gif);
        ASSERT_EQ(decoded.size(), 1);
        EXPECT_EQ(decoded[0].section(" indices ", 1), QString::fromLatin1(indices.toHex()));
    }
}
