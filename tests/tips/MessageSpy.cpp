#include "MessageSpy.h"

namespace zelctl::test {

using namespace tooltipControl;

MessageSpy::MessageSpy()
    : m_previous(setMessageHook([this](HWND, UINT message, WPARAM wParam, LPARAM lParam) {
        SentMessage sent { message, wParam, lParam, {}, {} };
        if (message == TTM_ADDTOOLA || message == TTM_UPDATETIPTEXTA) {
            sent.tool = *reinterpret_cast<const TOOLINFOA *>(lParam);
            sent.text = QString::fromUtf8(sent.tool.lpszText);
        } else if (message == TTM_SETTITLEA) {
            sent.text = QString::fromUtf8(reinterpret_cast<const char *>(lParam));
        }
        m_sent.append(sent);
    }))
{ }

MessageSpy::~MessageSpy()
{
    setMessageHook(std::move(m_previous));
}

QList<UINT> MessageSpy::messages() const
{
    QList<UINT> numbers;
    for (const SentMessage &sent : m_sent)
        numbers.append(sent.message);
    return numbers;
}

} // namespace zelctl::test
