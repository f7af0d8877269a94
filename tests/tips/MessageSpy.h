#pragma once

#include "tips/TooltipControl.h"

#include <QList>
#include <QString>

namespace zelctl::test {

// One message sent to a tooltip window, with what its pointer argument named at the time.
struct SentMessage
{
    tooltipControl::UINT message = 0;
    tooltipControl::WPARAM wParam = 0;
    tooltipControl::LPARAM lParam = 0;
    tooltipControl::TOOLINFOA tool; // for TTM_ADDTOOLA and TTM_UPDATETIPTEXTA
    QString text; // the tool's text, or the title of TTM_SETTITLEA
};

// Records every message sent to tooltip windows while it lives.
class MessageSpy
{
public:
    MessageSpy();
    ~MessageSpy();
    MessageSpy(const MessageSpy &) = delete;
    MessageSpy &operator=(const MessageSpy &) = delete;

    const QList<SentMessage> &sent() const { return m_sent; }
    // The message numbers alone, in order.
    QList<tooltipControl::UINT> messages() const;
    void clear() { m_sent.clear(); }

private:
    QList<SentMessage> m_sent;
    tooltipControl::MessageHook m_previous;
};

} // namespace zelctl::test
