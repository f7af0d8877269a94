#include "MessageSpy.h"

namespace zelctl::test {

using namespace tooltipControl;

MessageSpy::MessageSpy()
    : m_previous(setMessageHook([this](HWND, UINT message, WPARAM wParam, LPARAM lParam) {
        const QString number = QString::number(qintptr(wParam));
        const auto text = [lParam] { return QString::fromUtf8(reinterpret_cast<const char *>(lParam)); };
        if (message == TTM_ADDTOOLA || message == TTM_UPDATETIPTEXTA) {
            m_tool = *reinterpret_cast<const TOOLINFOA *>(lParam);
            m_sent << (message == TTM_ADDTOOLA ? "add " : "text ") + QString::fromUtf8(m_tool.lpszText);
        } else if (message == TTM_SETTITLEA) {
            m_sent << "title " + number + ' ' + text();
        } else if (message == TTM_SETDELAYTIME) {
            m_sent << "delay " + number + ' ' + QString::number(lParam);
        } else {
            const char *name = message == TTM_SETTIPTEXTCOLOR ? "fore "
                : message == TTM_SETTIPBKCOLOR                ? "back "
                                                              : "activate ";
            m_sent << name + number;
        }
    }))
{ }

MessageSpy::~MessageSpy()
{
    setMessageHook(std::move(m_previous));
}

} // namespace zelctl::test
