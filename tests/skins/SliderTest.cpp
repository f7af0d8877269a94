#include "SkinTestSupport.h"

#include "companion/CommandButton.h"
#include "skins/cSlider.h"

#include <QLabel>

using namespace zelctl;

namespace {

constexpr int ButtonWidth = 240;

// How the slider looks open and closed, and the arrow its button shows, is in the golden pictures.
class Slider : public zelctl::test::SkinForm
{
protected:
    cSlider *slider = new cSlider(&form);
    CommandButton *cc = slider->findChild<CommandButton *>(QStringLiteral("cc"));
    QSignalSpy slided { slider, &cSlider::Slided };

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

TEST_F(Slider, startsClosedAndItsButtonOpensItWideEnoughForItsContentsWithTheButtonAtTheRightEdge)
{
    EXPECT_EQ(slided.count(), 1) << "raised once on creation";
    EXPECT_FALSE(slider->SlideOpen());
    EXPECT_EQ(width(), ButtonWidth);
    QTest::mouseClick(cc, Qt::LeftButton);
    slider->setSlideOpen(true);
    EXPECT_EQ(slided.count(), 2) << "setting the current value does nothing";
    EXPECT_EQ(width(), ButtonWidth + 300) << "an empty slider";
    QTest::mouseClick(cc, Qt::LeftButton);
    EXPECT_FALSE(slider->SlideOpen());

    auto *field = new QLabel(QStringLiteral("NIF"), slider);
    field->setGeometry(30, 5, 104, 20); // ends at 134 px, 2010 twips
    (new QLabel(QStringLiteral("Nome"), slider))->setGeometry(20, 25, 50, 20);
    slider->setSlideOpen(true);
    EXPECT_EQ(width(), 2010 + ButtonWidth + 300);
    EXPECT_EQ(cc->Left(), width() - ButtonWidth);
    EXPECT_EQ(cc->Height(), 600) << "the button spans the full height";
    slider->extender().setWidth(3000);
    EXPECT_EQ(cc->Left(), 3000 - ButtonWidth);
    slider->setSlideOpen(false);
    EXPECT_EQ(width(), ButtonWidth);
}
