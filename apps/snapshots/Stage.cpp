#include "Stage.h"

#include "platform/ModalPresenter.h"
#include "platform/Pointer.h"

#include <QApplication>
#include <QTest>

namespace zelctl::snapshots {

Stage::Stage(QSize size)
{
    m_form.resize(size);
}

void Stage::show()
{
    // Shown once the controls are on it, so they are shown with it.
    if (m_form.isVisible())
        return;
    m_form.show();
    if (!QTest::qWaitForWindowExposed(&m_form))
        qWarning("snapshots: the form was not exposed");
    // The pointer starts away from every control.
    QTest::mouseMove(&m_form, QPoint(m_form.width() - 1, m_form.height() - 1));
    settle();
}

Stage::~Stage()
{
    if (!m_form.isVisible())
        return;
    const QPoint away(m_form.width() - 1, m_form.height() - 1);
    // A button left held would keep the next form from hearing the pointer come in.
    if (m_pressed)
        QTest::mouseRelease(&m_form, Qt::LeftButton, {}, away);
    QTest::mouseMove(&m_form, away);
    platform::releaseCapture();
    settle();
}

void Stage::settle()
{
    for (int i = 0; i < 3; ++i)
        QApplication::processEvents();
}

void Stage::hover(QWidget *control, QPoint at)
{
    show();
    // Two moves: the first one enters, the second one is a move on the control.
    QTest::mouseMove(control, at - QPoint(1, 0));
    QTest::mouseMove(control, at);
    settle();
}

void Stage::hover(QWidget *control)
{
    hover(control, control->rect().center());
}

void Stage::press(QWidget *control)
{
    hover(control);
    QTest::mousePress(control, Qt::LeftButton, {}, control->rect().center());
    m_pressed = true;
    settle();
}

QImage Stage::shoot(const QWidget *control, int margin)
{
    return shoot(control->geometry().adjusted(-margin, -margin, margin, margin));
}

QImage Stage::shoot(const QRect &area)
{
    show();
    settle();
    return m_form.grab(area & m_form.rect()).toImage().convertToFormat(QImage::Format_RGB32);
}

QImage shootModal(const std::function<void()> &open, const std::function<void(QDialog &)> &drive)
{
    QImage picture;
    platform::ModalPresenter previous = platform::setModalPresenter([&](QDialog &dialog) {
        dialog.show();
        if (!QTest::qWaitForWindowExposed(&dialog))
            qWarning("snapshots: the dialog was not exposed");
        Stage::settle();
        if (drive)
            drive(dialog);
        Stage::settle();
        picture = dialog.grab().toImage().convertToFormat(QImage::Format_RGB32);
        return int(QDialog::Rejected);
    });
    open();
    platform::setModalPresenter(std::move(previous));
    return picture;
}

} // namespace zelctl::snapshots
