#include "GifFiles.h"

#include <QBuffer>
#include <QRandomGenerator>

#include <gtest/gtest.h>

using namespace zelctl;
using zelctl::test::Decoded;
using zelctl::test::decodeWithGiflib;

namespace {

QByteArray randomIndices(qsizetype count, int colours, int runLength)
{
    QByteArray indices;
    while (indices.size() < count) {
        const char index = char(QRandomGenerator::global()->bounded(colours));
        indices.append(QByteArray(1 + QRandomGenerator::global()->bounded(runLength), index));
    }
    indices.truncate(count);
    return indices;
}

gifScanner::ColorTable tableOf(int count, quint32 seed)
{
    gifScanner::ColorTable table;
    table.count = count;
    for (int k = 0; k < count; ++k)
        table.entries[size_t(k)] = (seed * 2654435761u + quint32(k) * 40503u) & 0xFFFFFF;
    return table;
}

} // namespace

TEST(GifEncoder, giflibDecodesTheSameIndices)
{
    // Noise fills the code table many times over; runs and a single colour make long codes.
    struct Case
    {
        int width, height, colours, runLength;
    };
    for (const Case &c : { Case { 1, 1, 2, 1 }, Case { 7, 3, 2, 1 }, Case { 300, 200, 256, 1 },
             Case { 300, 200, 256, 40 }, Case { 64, 64, 16, 3 }, Case { 500, 100, 1, 1 }, Case { 2000, 1, 5, 7 } }) {
        SCOPED_TRACE(testing::Message() << c.width << "x" << c.height << " colours " << c.colours);
        gifEncoder::Animation animation;
        animation.width = c.width;
        animation.height = c.height;
        animation.colorTables = { tableOf(c.colours <= 2 ? 2 : c.colours, 1) };
        gifEncoder::Frame frame;
        frame.record.Width = c.width;
        frame.record.Height = c.height;
        frame.indices = randomIndices(qsizetype(c.width) * c.height, c.colours, c.runLength);
        animation.frames = { frame };
        const Decoded decoded = decodeWithGiflib(gifEncoder::encode(animation));
        ASSERT_EQ(decoded.frames.size(), 1);
        EXPECT_TRUE(decoded.frames[0] == frame.indices);
    }
}

TEST(GifEncoder, keepsFramesTablesAndTiming)
{
    gifEncoder::Animation animation;
    animation.width = 20;
    animation.height = 10;
    animation.loopCount = 4;
    animation.colorTables = { tableOf(4, 1), tableOf(2, 2), tableOf(200, 3) };
    for (int i = 0; i < 3; ++i) {
        gifEncoder::Frame frame;
        frame.record.Left = i * 3;
        frame.record.Top = i;
        frame.record.Width = 10 + i;
        frame.record.Height = 5 + i;
        frame.record.Delay = 70 * (i + 1);
        frame.record.Disposal = quint8(i + 1);
        frame.record.HasTransparency = i == 1;
        frame.record.TransparentIndex = 1;
        frame.record.ColorTable = i;
        frame.indices = randomIndices(qsizetype(frame.record.Width) * frame.record.Height, i == 2 ? 200 : 2, 2);
        animation.frames.append(frame);
    }
    const Decoded decoded = decodeWithGiflib(gifEncoder::encode(animation));
    ASSERT_EQ(decoded.frames.size(), 3);
    EXPECT_EQ(decoded.width, 20);
    for (int i = 0; i < 3; ++i) {
        SCOPED_TRACE(i);
        const gifScanner::FrameRecord &r = animation.frames[i].record;
        EXPECT_TRUE(decoded.frames[i] == animation.frames[i].indices);
        EXPECT_EQ(decoded.descriptors[i].Left, r.Left);
        EXPECT_EQ(decoded.descriptors[i].Top, r.Top);
        EXPECT_EQ(decoded.descriptors[i].Width, r.Width);
        EXPECT_EQ(decoded.controls[i].DelayTime * 10, r.Delay);
        EXPECT_EQ(decoded.controls[i].DisposalMode, r.Disposal);
        EXPECT_EQ(decoded.controls[i].TransparentColor, r.HasTransparency ? 1 : NO_TRANSPARENT_COLOR);
        const gifScanner::ColorTable &table = animation.colorTables[r.ColorTable];
        ASSERT_GE(decoded.tables[i].size(), table.count);
        for (int k = 0; k < table.count; ++k)
            EXPECT_EQ(decoded.tables[i][k], table.entries[size_t(k)]);
    }
}
