#include "GifAnimator.h"

#include <QPointer>

#include <algorithm>

namespace zelctl {

GifAnimator::GifAnimator(QObject *parent)
    : QObject(parent)
{
    m_timer.setSingleShot(true);
    m_timer.setTimerType(Qt::PreciseTimer);
    connect(&m_timer, &QTimer::timeout, this, &GifAnimator::tick);
}

void GifAnimator::setDelays(QList<qint32> delays)
{
    stop();
    m_delays = std::move(delays);
    m_current = m_delays.isEmpty() ? 0 : 1;
    m_loopsDone = 0;
}

void GifAnimator::setMinFrameDelay(int milliseconds)
{
    m_minFrameDelay = std::clamp(milliseconds, 10, 32700);
}

int GifAnimator::frameInterval() const
{
    if (m_current < 1 || m_current > frameCount())
        return m_minFrameDelay;
    return std::max(m_delays[m_current - 1], m_minFrameDelay);
}

bool GifAnimator::start()
{
    if (m_state == Playing || frameCount() < 2)
        return false;
    m_state = Playing;
    arm();
    return true;
}

void GifAnimator::stop()
{
    m_timer.stop();
    m_state = Stopped;
}

void GifAnimator::pause()
{
    if (m_state == Stopped)
        return;
    m_timer.stop();
    m_state = Paused;
}

void GifAnimator::forward()
{
    m_timer.stop();
    if (frameCount() > 0)
        m_current = m_current % frameCount() + 1;
    m_state = Paused;
    Q_EMIT advanced();
}

void GifAnimator::rewind()
{
    m_loopsDone = 0;
    m_current = frameCount() > 0 ? 1 : 0;
}

void GifAnimator::arm()
{
    m_timer.start(frameInterval());
}

void GifAnimator::tick()
{
    if (m_state != Playing || frameCount() == 0)
        return;
    bool ended = frameCount() < 2;
    m_current = m_current % frameCount() + 1;
    if (m_current == 1 && m_loopCount != 0 && !ended) {
        if (++m_loopsDone >= m_loopCount) {
            ended = true;
            m_loopsDone = 0;
        }
    }
    if (ended)
        m_state = Stopped;
    // The host may delete the control, and this animator with it, while the frame is drawn.
    const QPointer<GifAnimator> alive(this);
    Q_EMIT advanced();
    if (!alive)
        return;
    if (ended)
        Q_EMIT loopsEnded();
    else if (m_state == Playing)
        arm();
}

} // namespace zelctl
