#include "gif/GifAnimator.h"

#include <QElapsedTimer>
#include <QSignalSpy>
#include <QTest>

#include <gtest/gtest.h>

using namespace zelctl;

TEST(GifAnimator, minimumFrameDelayIsApplied)
{
    GifAnimator clock;
    clock.setMinFrameDelay(50);

    clock.setDelays({ 0, 100, 30 });
    EXPECT_EQ(clock.frameInterval(), 50) << "a delay of 0 shows for the minimum";
    clock.forward();
    EXPECT_EQ(clock.frameInterval(), 100);
    clock.forward();
    EXPECT_EQ(clock.frameInterval(), 50);
}

TEST(GifAnimator, loopsEndOnTheFirstFrameAfterTheLastLoop)
{
    GifAnimator clock;
    clock.setMinFrameDelay(10);
    clock.setDelays({ 10, 10, 10 });
    clock.setLoopCount(2);
    QList<int> shown;
    QObject::connect(&clock, &GifAnimator::advanced, [&] { shown.append(clock.currentFrame()); });
    QSignalSpy ended(&clock, &GifAnimator::loopsEnded);
    ASSERT_TRUE(clock.start());
    EXPECT_FALSE(clock.start()) << "already playing";
    ASSERT_TRUE(QTest::qWaitFor([&] { return ended.count() == 1; }, 5000));
    EXPECT_EQ(shown, QList<int>({ 2, 3, 1, 2, 3, 1 }));
    EXPECT_EQ(clock.state(), GifAnimator::Stopped);
    EXPECT_EQ(clock.loopsDone(), 0) << "the count starts again";
    EXPECT_EQ(clock.currentFrame(), 1);
    QTest::qWait(40);
    EXPECT_EQ(shown.size(), 6) << "no timer runs after the end";
}

TEST(GifAnimator, pauseForwardAndSingleFrames)
{
    GifAnimator clock;
    clock.setDelays({ 20, 20, 20 });
    clock.pause();
    EXPECT_EQ(clock.state(), GifAnimator::Stopped) << "a stopped animation does not become paused";
    clock.forward();
    clock.forward();
    EXPECT_EQ(clock.currentFrame(), 3);
    clock.forward();
    EXPECT_EQ(clock.currentFrame(), 1) << "after the last comes the first";
    EXPECT_EQ(clock.state(), GifAnimator::Paused);

    QSignalSpy advanced(&clock, &GifAnimator::advanced);
    ASSERT_TRUE(clock.start());
    clock.pause();
    QTest::qWait(60);
    EXPECT_EQ(advanced.count(), 0) << "a paused clock does not tick";
    EXPECT_EQ(clock.state(), GifAnimator::Paused);

    clock.setDelays({ 20 });
    EXPECT_FALSE(clock.start()) << "one frame does not animate";
    clock.setDelays({});
    EXPECT_EQ(clock.currentFrame(), 0);
    EXPECT_FALSE(clock.start());
}
