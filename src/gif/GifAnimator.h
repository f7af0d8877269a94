#pragma once

#include "zelctl_export.h"

#include <QList>
#include <QObject>
#include <QTimer>

namespace zelctl {

// The frame clock of an animated GIF: which frame shows, how long it stays, how many loops
// are done. One one-shot timer per frame, set again after each frame has been drawn.
class ZELCTL_EXPORT GifAnimator : public QObject
{
    Q_OBJECT

public:
    enum State { Stopped = 0, Playing = 1, Paused = 2 };

    static constexpr int DefaultMinFrameDelay = 50;

    explicit GifAnimator(QObject *parent = nullptr);

    // A new GIF: the frames' delays in milliseconds (empty for none). Stops, goes to the
    // first frame and forgets the loops done.
    void setDelays(QList<qint32> delays);
    int frameCount() const { return int(m_delays.size()); }

    // 1-based; 0 without frames.
    int currentFrame() const { return m_current; }
    int loopCount() const { return m_loopCount; }
    // 0 = endless.
    void setLoopCount(int loops) { m_loopCount = loops; }
    int loopsDone() const { return m_loopsDone; }
    int minFrameDelay() const { return m_minFrameDelay; }
    // Clamped to 10..32700.
    void setMinFrameDelay(int milliseconds);
    State state() const { return m_state; }
    // How long the current frame stays: its delay, but not less than the minimum.
    int frameInterval() const;

    // Plays from the current frame; false (and nothing changes) when already playing or
    // with fewer than two frames.
    bool start();
    void stop();
    // A playing or paused animation stops its timer and becomes paused.
    void pause();
    // Shows the next frame (the first after the last) and stays paused.
    void forward();
    // Back to the first frame with no loops done; the state is kept.
    void rewind();

Q_SIGNALS:
    // The current frame changed; the control draws it now.
    void advanced();
    // The last loop has been shown and the animation stopped.
    void loopsEnded();

private:
    void tick();
    void arm();

    QTimer m_timer;
    QList<qint32> m_delays;
    int m_current = 0;
    int m_loopCount = 0;
    int m_loopsDone = 0;
    int m_minFrameDelay = DefaultMinFrameDelay;
    State m_state = Stopped;
};

} // namespace zelctl
