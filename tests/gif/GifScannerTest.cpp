#include "GifFiles.h"

#include "gif/GifFrameDecoder.h"
#include "gif/GifScanner.h"

#include <QRandomGenerator>

#include <gtest/gtest.h>

using namespace zelctl;
using zelctl::test::GifBuilder;

namespace {

const QList<quint32> fourColours = { 0x000000, 0xFF0000, 0x00FF00, 0x0000FF };

} // namespace

// What the control's written picture, compared with giflib, cannot show.
TEST(GifScanner, readsTheCanvasAndTheFirstFramesDisposal)
{
    const gifScanner::GifLayout layout
        = gifScanner::scan(GifBuilder(16, 8, fourColours)
                               .control(3, 5) // disposal 3 on the first frame has nothing to restore
                               .solid(0, 0, 4, 4, 1)
                               .solid(10, 2, 20, 6, 2)
                               .bytes());
    ASSERT_EQ(layout.Frames.size(), 2);
    EXPECT_EQ(layout.Frames[0].Disposal, 0);
    EXPECT_EQ(layout.Frames[0].Delay, 50);
    EXPECT_EQ(layout.CanvasWidth, 30) << "the frame reaches past the logical screen";
    EXPECT_EQ(layout.CanvasHeight, 8);
}

TEST(GifScanner, toleratesOddButHarmlessBytesAndRefusesWhatIsNotAGifOrHasNoColours)
{
    const QByteArray odd = GifBuilder(4, 4, fourColours, "gIf87A")
                               .netscape(0, "netscape2.0")
                               .raw(QByteArray(3, '\0')) // stray zero bytes between blocks
                               .raw(QByteArray("\x21\xFE\x03"
                                               "abc\x00",
                                   7)) // a comment
                               .solid(0, 0, 4, 4, 1)
                               .raw(QByteArray(2, '\0'))
                               .netscape(7, "netscape2.0")
                               .solid(0, 0, 4, 4, 2)
                               .withoutTrailer(); // a missing trailer loses nothing
    EXPECT_EQ(gifScanner::scan(odd).LoopCount, 7) << "the extension is recognised in lower case";
    // The second frame has no table of its own and there is no global one: nothing loads.
    const QByteArray noTable = GifBuilder(4, 4)
                                   .solid(0, 0, 4, 4, 1, { 0, 0xFFFFFF })
                                   .solid(0, 0, 4, 4, 1)
                                   .solid(0, 0, 4, 4, 1, { 0, 1 })
                                   .bytes();
    const std::pair<QByteArray, int> cases[] = { { odd, 2 }, { QByteArray(), 0 }, { QByteArray("GIF88a"), 0 },
        { GifBuilder(4, 4, fourColours, "GIF90a").solid(0, 0, 4, 4, 1).bytes(), 0 }, { noTable, 0 },
        { GifBuilder(4, 4, fourColours).bytes().left(20), 0 } }; // a colour table cut short
    for (const auto &[bytes, frames] : cases) {
        const gifScanner::GifLayout layout = gifScanner::scan(bytes);
        EXPECT_EQ(layout.Frames.size(), frames) << bytes.toHex().toStdString();
        EXPECT_EQ(layout.CanvasWidth, frames ? 4 : 0);
    }
}

TEST(GifScanner, truncatedFileKeepsItsCompleteFrames)
{
    const QByteArray whole
        = GifBuilder(8, 8, fourColours).control(0, 2).solid(0, 0, 8, 8, 1).control(0, 2).solid(0, 0, 8, 8, 2).bytes();
    const gifScanner::GifLayout full = gifScanner::scan(whole);
    ASSERT_EQ(full.Frames.size(), 2);
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
    QByteArray target = decoded(GifBuilder(6, 11, fourColours).image(0, 0, 6, 11, indices).bytes());
    for (int y = 0; y < 11; ++y) {
        EXPECT_EQ(target.mid(y * stride, 6), indices.mid(y * 6, 6)) << "row " << y;
        EXPECT_EQ(target.mid(y * stride + 6, 3), QByteArray(3, '\x7F')) << "past the row is untouched";
    }

    // The same rows stored interlaced (0, 8, 4, 2, 6, 10, 1, 3, 5, 7, 9) come back in order.
    QByteArray interlaced;
    for (int row : { 0, 8, 4, 2, 6, 10, 1, 3, 5, 7, 9 })
        interlaced.append(indices.mid(row * 6, 6));
    QByteArray gif = GifBuilder(6, 11, fourColours).image(0, 0, 6, 11, interlaced).bytes();
    gif[13 + 12 + 9] = char(0x40); // the descriptor's interlace flag
    target = decoded(gif);
    for (int y = 0; y < 11; ++y)
        EXPECT_EQ(target.mid(y * stride, 6), indices.mid(y * 6, 6)) << "row " << y;
}

TEST(GifFrameDecoder, damagedDataFailsWithoutWritingOutside)
{
    QByteArray gif = GifBuilder(8, 8, fourColours).solid(0, 0, 8, 8, 3).bytes();
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
    const int data = layout.BlockList[0].Start + 11;
    gif[data] = '\x01';
    EXPECT_FALSE(gifFrameDecoder::decode(gif, layout.BlockList[0], layout.Frames[0], bits, 8));
}

// Noise fills the code table many times over; runs and a single colour make long codes.
// (The control's written picture checks the rest of the encoder against giflib.)
TEST(GifEncoder, giflibDecodesTheSameIndices)
{
    struct Case
    {
        int width, height, colours, runLength;
    };
    for (const Case &c : { Case { 1, 1, 2, 1 }, Case { 7, 3, 2, 1 }, Case { 300, 200, 256, 1 },
             Case { 300, 200, 256, 40 }, Case { 64, 64, 16, 3 }, Case { 500, 100, 1, 1 }, Case { 2000, 1, 5, 7 } }) {
        SCOPED_TRACE(testing::Message() << c.width << "x" << c.height << " colours " << c.colours);
        gifEncoder::Frame frame;
        frame.record.Width = c.width;
        frame.record.Height = c.height;
        while (frame.indices.size() < c.width * c.height) {
            const char index = char(QRandomGenerator::global()->bounded(c.colours));
            frame.indices.append(QByteArray(1 + QRandomGenerator::global()->bounded(c.runLength), index));
        }
        frame.indices.truncate(c.width * c.height);
        gifEncoder::Animation animation;
        animation.width = c.width;
        animation.height = c.height;
        animation.colorTables = { {} };
        animation.colorTables[0].count = std::max(2, c.colours);
        animation.frames = { frame };
        const QStringList decoded = test::decodeWithGiflib(gifEncoder::encode(animation));
        ASSERT_EQ(decoded.size(), 1);
        EXPECT_EQ(decoded[0].section(" indices ", 1), QString::fromLatin1(frame.indices.toHex()));
    }
}
