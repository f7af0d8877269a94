#pragma once

#include "platform/OleColor.h"
#include "platform/Pointer.h"

#include <QImage>
#include <QTemporaryDir>
#include <QTest>
#include <QWidget>

#include <gtest/gtest.h>

namespace zelctl::test {

// The colour of a pixel of a control's surface, as 0x00BBGGRR.
template <typename Control> platform::OleColor pixel(Control &control, int x, int y)
{
    return platform::fromQColor(QColor(control.surface().image().pixel(x, y)));
}

struct PixelAt
{
    int x;
    int y;
    platform::OleColor colour;
};

// Checks the colours at the given positions, naming each position that differs.
template <typename Control> void expectPixels(Control &control, std::initializer_list<PixelAt> expected)
{
    for (const PixelAt &p : expected)
        EXPECT_EQ(pixel(control, p.x, p.y), p.colour) << "at " << p.x << "," << p.y;
}

// Pictures written for one test: solid blocks of colour, optionally with a transparent
// border, saved as PNG files in a private folder.
class PictureFolder
{
public:
    PictureFolder() { EXPECT_TRUE(m_dir.isValid()); }

    QString write(const QString &name, QSize size, QColor fill, int transparentBorder = 0)
    {
        QImage image(size, QImage::Format_ARGB32);
        image.fill(Qt::transparent);
        for (int y = transparentBorder; y < size.height() - transparentBorder; ++y)
            for (int x = transparentBorder; x < size.width() - transparentBorder; ++x)
                image.setPixelColor(x, y, fill);
        const QString path = m_dir.filePath(name);
        EXPECT_TRUE(image.save(path, "PNG"));
        return path;
    }

    QString path(const QString &name) const { return m_dir.filePath(name); }

private:
    QTemporaryDir m_dir;
};

// A shown form that holds the control under test, so the pointer can reach it.
class SkinForm : public ::testing::Test
{
protected:
    QWidget form;

    void showForm()
    {
        form.resize(400, 300);
        form.show();
        ASSERT_TRUE(QTest::qWaitForWindowExposed(&form));
        QTest::mouseMove(&form, QPoint(390, 290));
    }
    void TearDown() override { platform::releaseCapture(); }
};

} // namespace zelctl::test
