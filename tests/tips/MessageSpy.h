#pragma once

#include "tips/TooltipControl.h"

#include <QStringList>

namespace zelctl::test {

// Records every message sent to tooltip windows while it lives, each as one line:
// "add <text>", "title <icon> <title>", "text <text>", "delay <kind> <ms>", "fore <colour>",
// "back <colour>", "activate <wParam>"; the last tool record sent is kept whole.
class MessageSpy
{
public:
    MessageSpy();
    ~MessageSpy();
    MessageSpy(const MessageSpy &) = delete;
    MessageSpy &operator=(const MessageSpy &) = delete;

    const QStringList &sent() const { return m_sent; }
    const tooltipControl::TOOLINFOA &tool() const { return m_tool; }
    void clear() { m_sent.clear(); }

private:
    QStringList m_sent;
    tooltipControl::TOOLINFOA m_tool;
    tooltipControl::MessageHook m_previous;
};

} // namespace zelctl::test
