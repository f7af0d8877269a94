#include "SkinTestSupport.h"

#include "companion/CommandButton.h"
#include "skins/cSlider.h"

#include <QLabel>
#include <QSignalSpy>

using namespace zelctl;

namespace {

constexpr int ButtonWidth = 240;

class Slider : public zelctl::test::SkinForm
{
protected:
    cSlider *slider = new cSlider(&form);
    CommandButton *cc = slider->findChild<CommandButton *>(QStringLiteral("cc"));

    void SetUp() override
    {
        ASSERT_NE(cc, nullptr);
        slider->extender().setHeight(600);
        showForm();
        QCoreApplication::processEvents();
    }

    int width() const { return slider->extender().Width(); }
};

} // namespace

TEST(SliderCreation, raisesSlidedOnceAndStartsClosed)
{
    QWidget form;
    auto *slider = new cSlider(&form);
    QSignalSpy slided(slider, &cSlider::Slided);
    QCoreApplication::processEvents();
    QCoreApplication::processEvents();
    EXPECT_EQ(slided.count(), 1);
    EXPECT_FALSE(slider->SlideOpen());
    EXPECT_EQ(slider->extender().Width(), ButtonWidth);
    EXPECT_EQ(slider->button()->Caption(), QStringLiteral("è"));
}

TEST_F(Slider, anEmptySliderOpensToButtonWidthPlus300)
{
    QSignalSpy slided(slider, &cSlider::Slided);
    slider->setSlideOpen(true);
    EXPECT_EQ(slided.count(), 1);
    EXPECT_EQ(width(), ButtonWidth + 300);
    EXPECT_EQ(cc->Left(), 300);
    EXPECT_EQ(cc->Caption(), QStringLiteral("ç"));

    slider->setSlideOpen(true);
    EXPECT_EQ(slided.count(), 1) << "setting the current value does nothing";
}

TEST_F(Slider, opensWideEnoughForItsContentsAndClosesToTheButton)
{
    auto *field = new QLabel(QStringLiteral("NIF"), slider);
    field->setGeometry(30, 5, 104, 20); // ends at 134 px, 2010 twips
    auto *other = new QLabel(QStringLiteral("Nome"), slider);
    other->setGeometry(20, 25, 50, 20);
    slider->setSlideOpen(true);
    EXPECT_EQ(width(), 2010 + ButtonWidth + 300);
    EXPECT_EQ(cc->Left(), width() - ButtonWidth);
    EXPECT_EQ(cc->Top(), 0);
    EXPECT_EQ(cc->Height(), 600) << "the button spans the full height";

    slider->setSlideOpen(false);
    EXPECT_EQ(width(), ButtonWidth);
    EXPECT_EQ(cc->Left(), 0);
    EXPECT_EQ(cc->Caption(), QStringLiteral("è"));
}

TEST_F(Slider, resizeKeepsTheButtonOnTheRightEdgeWhenOpen)
{
    slider->setSlideOpen(true);
    slider->extender().setHeight(900);
    slider->extender().setWidth(3000);
    EXPECT_EQ(cc->Left(), 3000 - ButtonWidth);
    EXPECT_EQ(cc->Height(), 900);
    EXPECT_EQ(cc->Width(), ButtonWidth);
    slider->setSlideOpen(false);
    slider->extender().setHeight(450);
    EXPECT_EQ(cc->Left(), 0);
    EXPECT_EQ(cc->Height(), 450);
}

TEST_F(Slider, theButtonTogglesShowsArrowsAndItsHoverRestylesIt)
{
    QSignalSpy slided(slider, &cSlider::Slided);
    QTest::mouseClick(cc, Qt::LeftButton);
    EXPECT_TRUE(slider->SlideOpen());
    // The symbol font's arrow left, as Unicode where the font is missing.
    EXPECT_EQ(cc->text(), QString(QChar(0x2B05)));
    QTest::mouseClick(cc, Qt::LeftButton);
    EXPECT_FALSE(slider->SlideOpen());
    EXPECT_EQ(cc->text(), QString(QChar(0x27A1)));
    EXPECT_EQ(slided.count(), 2);

    struct Look
    {
        qint32 style;
        qint32 bevel;
        quint32 caption;
        bool operator==(const Look &) const = default;
    };
    const auto look = [this] { return Look { cc->ButtonStyle(), cc->BevelWidth(), cc->ForeColor() }; };
    EXPECT_EQ(look(), (Look { CommandButton::FlatStyle, 0, 0x404040u }));
    Q_EMIT cc->MouseHover(true);
    EXPECT_EQ(look(), (Look { 2, 3, 0xC00000u }));
    Q_EMIT cc->MouseHover(false);
    EXPECT_EQ(look(), (Look { CommandButton::FlatStyle, 0, 0x404040u }));
}
