#include "GifFiles.h"

#include <QRandomGenerator>

#include <gtest/gtest.h>

using namespace zelctl;

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
