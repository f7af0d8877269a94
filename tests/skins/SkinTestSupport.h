#pragma once

#include "platform/OleColor.h"
#include "platform/Pointer.h"

#include <QApplication>
#include <QImage>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QWidget>

#include <gtest/gtest.h>

#include <functional>

namespace zelctl::test {

// The colour of a pixel of a control's surface, as 0x00BBGGRR.
template <typename Control> platform::OleColor pixel(Control &control, int x, int y)
{
    return platform::fromQColor(QColor(control.surface().image().pixel(x, y)));
}

// Solid blocks of colour, optionally with a transparent border, saved as PNG files.
class PictureFolder
{
public:
    QString write(const QString &name, QSize size, QColor fill, int transparentBorder = 0)
    {
        QImage image(size, QImage::Format_ARGB32);
        image.fill(Qt::transparent);
        for (int y = transparentBorder; y < size.height() - transparentBorder; ++y)
            for (int x = transparentBorder; x < size.width() - transparentBorder; ++x)
                image.setPixelColor(x, y, fill);
        EXPECT_TRUE(image.save(path(name), "PNG"));
        return path(name);
    }

    QString path(const QString &name) const { return m_dir.filePath(name); }

private:
    QTemporaryDir m_dir;
};

// Pointer events as "MouseDown 1", and `click` as "Click", or "Click, pointer held" when the
// control still holds the pointer then: a host may open a modal form from it.
template <typename Control> void recordEvents(Control *control, void (Control::*click)(), QStringList &events)
{
    QObject::connect(control, &Control::MouseIn, [&events] { events << "MouseIn"; });
    QObject::connect(control, &Control::MouseOut, [&events] { events << "MouseOut"; });
    QObject::connect(control, &Control::MouseDown,
        [&events](qint16 &b, qint16 &, float &, float &) { events << QStringLiteral("MouseDown %1").arg(b); });
    QObject::connect(control, &Control::MouseUp,
        [&events](qint16 &b, qint16 &, float &, float &) { events << QStringLiteral("MouseUp %1").arg(b); });
    QObject::connect(control, click, [&events] {
        events << (platform::capturedWidget() ? QStringLiteral("Click, pointer held") : QStringLiteral("Click"));
    });
}

// A shown form that holds the control under test, so the pointer can reach it.
class SkinForm : public ::testing::Test
{
protected:
    QWidget form;
    PictureFolder pictures;

    void showForm()
    {
        form.resize(400, 300);
        form.show();
        ASSERT_TRUE(QTest::qWaitForWindowExposed(&form));
        QTest::mouseMove(&form, QPoint(390, 290));
    }
    // Out of the control and on, as a pointer leaving it moves.
    void moveAway()
    {
        QTest::mouseMove(&form, QPoint(300, 200));
        QTest::mouseMove(&form, QPoint(301, 201));
    }
    // Resting on `control` raises MouseIn once; leaving, by moving away or by the window's Leave,
    // raises MouseOut once and frees the pointer. `whileIn` and `afterwards` check the looks.
    template <typename Control>
    void expectHoverInAndOut(
        Control *control, QPoint at, const std::function<void()> &whileIn, const std::function<void()> &afterwards)
    {
        for (const bool byLeave : { false, true }) {
            SCOPED_TRACE(byLeave ? "Leave" : "moved away");
            QSignalSpy in(control, &Control::MouseIn);
            QSignalSpy out(control, &Control::MouseOut);
            QTest::mouseMove(control, at);
            QTest::mouseMove(control, at + QPoint(1, 1));
            EXPECT_EQ(in.count(), 1);
            EXPECT_EQ(platform::capturedWidget(), control);
            whileIn();
            if (byLeave) {
                QEvent leave(QEvent::Leave);
                QApplication::sendEvent(control, &leave);
            } else {
                moveAway();
            }
            EXPECT_EQ(in.count(), 1);
            EXPECT_EQ(out.count(), 1);
            EXPECT_EQ(platform::capturedWidget(), nullptr);
            afterwards();
        }
    }
    void TearDown() override { platform::releaseCapture(); }
};

} // namespace zelctl::test
