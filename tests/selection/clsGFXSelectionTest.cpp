#include "selection/clsGFXSelection.h"
#include "selection/frmSelector.h"

#include "companion/CommandButton.h"
#include "companion/CommandButtonArray.h"
#include "platform/Twips.h"
#include "platform/WindowHandles.h"
#include "support/TestSupport.h"

#include <QLineEdit>
#include <QScrollArea>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

#include <functional>

using namespace zelctl;

namespace {

using User = std::function<void(QDialog &)>;

QList<GFXItem> numberedItems(int count)
{
    QList<GFXItem> items(count);
    for (int i = 0; i < count; ++i) {
        items[i].Title = QStringLiteral("Item %1").arg(i);
        items[i].Value = i;
    }
    return items;
}

CommandButton *item(QDialog &dialog, int index)
{
    return qobject_cast<frmSelector *>(&dialog)->btnSelector()(index);
}

CommandButton *okButton(QDialog &dialog)
{
    return qobject_cast<frmSelector *>(&dialog)->btn_Handle()(0);
}

CommandButton *cancelButton(QDialog &dialog)
{
    return qobject_cast<frmSelector *>(&dialog)->btn_Handle()(1);
}

QList<CommandButton *> shownItems(QDialog &dialog)
{
    QList<CommandButton *> shown;
    for (CommandButton *button : dialog.findChildren<CommandButton *>(QStringLiteral("btnSelector")))
        if (!button->isHidden())
            shown.append(button);
    return shown;
}

// Each item can be scrolled to and then lies wholly in sight, none cut by the grid's edge.
void expectEveryItemInSight(QDialog &dialog)
{
    auto *grid = dialog.findChild<QScrollArea *>(QStringLiteral("grid"));
    ASSERT_NE(grid, nullptr);
    for (CommandButton *button : shownItems(dialog)) {
        grid->ensureWidgetVisible(button, 0, 0);
        const QRect place(button->mapTo(grid->viewport(), QPoint()), button->size());
        ASSERT_TRUE(grid->viewport()->rect().contains(place)) << button->Caption().toStdString();
        ASSERT_TRUE(dialog.rect().contains(QRect(button->mapTo(&dialog, QPoint()), button->size())));
    }
}

class SelectionTest : public ::testing::Test
{
protected:
    void SetUp() override
    {
        frmSelector::setZoomStepInterval(0);
        const auto record = [this](const char *name) {
            return [this, name](GFXItem &item) { log << QLatin1String(name) + item.Title; };
        };
        QObject::connect(&selection, &clsGFXSelection::Opening, [this] { log << "Opening"; });
        QObject::connect(&selection, &clsGFXSelection::ItemChecked, record("ItemChecked "));
        QObject::connect(&selection, &clsGFXSelection::ItemUnchecked, record("ItemUnchecked "));
        QObject::connect(&selection, &clsGFXSelection::ItemChanged, record("ItemChanged "));
        QObject::connect(&selection, &clsGFXSelection::Closing, [this](qint32 &count, QList<GFXItem> &items, bool &) {
            log << QStringLiteral("Closing %1 %2").arg(count).arg(items.isEmpty() ? QString() : items[0].Title);
        });
        QObject::connect(&selection, &clsGFXSelection::Closed, [this] { log << "Closed"; });
    }

    // Runs `call` with `user` acting on each dialog it shows; `shown` counts them.
    template <typename Call> auto driven(const User &user, Call call)
    {
        test::ModalDriver driver([&](QDialog &dialog) {
            dialog.show();
            user(dialog);
            return dialog.result();
        });
        auto answer = call();
        shown += driver.shownCount();
        return answer;
    }

    GFXResult select(const GFXSelection &s, const QList<GFXItem> &items, const User &user)
    {
        return driven(user, [&] { return selection.SelectFrom(s, items); });
    }

    QString selectCountry(GSEL_CountryFilterList mode, QString &filter, const User &user)
    {
        return driven(user, [&] { return selection.SelectCountry({}, mode, filter); });
    }

    clsGFXSelection selection;
    QStringList log;
    int shown = 0;
};

} // namespace

TEST_F(SelectionTest, nothingToChooseFromShowsNoDialog)
{
    EXPECT_EQ(select({}, {}, [](QDialog &) {}), GFXResult());
    EXPECT_TRUE(log.isEmpty());
    QString filter = QStringLiteral("ES,FR");
    EXPECT_EQ(selectCountry(GSEL_OnlyPT, filter, [](QDialog &) {}), "PT");
    EXPECT_EQ(filter, "PT,");
    // One known country is too few to choose from.
    filter = QStringLiteral("ES,XX");
    EXPECT_EQ(selectCountry(GSEL_Custom, filter, [](QDialog &) {}), "");
    EXPECT_EQ(filter, "ES,XX");
    // A line without a name names no country.
    QTemporaryDir folder;
    selection.setCountryFile(test::writeFile(folder.filePath("few.txt"), "620\tPT\tPRT\tPortugal\r\n724\tES\tESP\r\n"));
    EXPECT_EQ(selectCountry(GSEL_All, filter, [](QDialog &) {}), "");
    EXPECT_EQ(shown, 0);
}

// Each way in or out raises the events of one choice, once: a double click is one click, a
// click on the pressed item changes nothing. Item 1 is clicked first, then the way acts on item 2.
TEST_F(SelectionTest, okEnterAndDoubleClickChooseCancelEscapeAndTheCloseBoxDoNot)
{
    const auto click = [](CommandButton *button) { QTest::mouseClick(button, Qt::LeftButton); };
    const struct
    {
        const char *name;
        User way;
        bool accepts;
    } ways[] = {
        { "OK", [&](QDialog &d) { click(item(d, 2)), click(item(d, 2)), click(okButton(d)); }, true },
        { "double click", [](QDialog &d) { QTest::mouseDClick(item(d, 2), Qt::LeftButton); }, true },
        { "Enter on an item", [](QDialog &d) { QTest::keyClick(item(d, 2), Qt::Key_Return); }, true },
        // Enter elsewhere presses OK, the default button.
        { "Enter", [&](QDialog &d) { click(item(d, 2)), QTest::keyClick(&d, Qt::Key_Enter); }, true },
        { "Cancel", [&](QDialog &d) { click(item(d, 2)), click(cancelButton(d)); }, false },
        { "Escape", [&](QDialog &d) { click(item(d, 2)), QTest::keyClick(item(d, 0), Qt::Key_Escape); }, false },
        { "close box", [&](QDialog &d) { click(item(d, 2)), d.close(); }, false },
    };
    for (const auto &c : ways) {
        SCOPED_TRACE(c.name);
        log.clear();
        const GFXResult result = select({}, numberedItems(3), [&](QDialog &dialog) {
            click(item(dialog, 1));
            c.way(dialog);
            EXPECT_FALSE(item(dialog, 1)->Value());
            EXPECT_FALSE(dialog.isVisible());
        });
        EXPECT_EQ(result.Accepted, c.accepts);
        EXPECT_EQ(result.Canceled, !c.accepts);
        EXPECT_EQ(result.NumberOfSelectedItems, c.accepts ? 1 : 0);
        EXPECT_EQ(result.SelectedItem.Value, c.accepts ? QVariant(2) : QVariant());
        EXPECT_EQ(result.SelectedItems, c.accepts ? QList<GFXItem> { result.SelectedItem } : QList<GFXItem> {});
        EXPECT_EQ(log,
            QStringList({ "Opening", "ItemChecked Item 1", "ItemChanged Item 1", "ItemUnchecked Item 1",
                "ItemChecked Item 2", "ItemChanged Item 2", "Closing 1 Item 2", "Closed" }));
    }
}

TEST_F(SelectionTest, theFormShowsTheItemsAsGivenInTheLaidOutGridAndClosesWhenClosingAllows)
{
    int refusals = 1;
    QObject::connect(&selection, &clsGFXSelection::Closing,
        [&](qint32 &, QList<GFXItem> &, bool &cancelClose) { cancelClose = refusals-- > 0; });
    QList<GFXItem> items = numberedItems(4);
    items[1].Disabled = true;
    items[1].Selected = true;
    items[2].Selected = true;
    items[3].Default = true;
    items[0].Image = QStringLiteral("/no/such/flag.png");
    GFXSelection s;
    s.Subtitle = QStringLiteral("Escolha um");
    s.DisableCancel = true;
    const GFXResult result = select(s, items, [&](QDialog &dialog) {
        EXPECT_EQ(dialog.focusWidget(), item(dialog, 3)) << "the default item starts with the focus";
        EXPECT_FALSE(item(dialog, 1)->isEnabled());
        // Only the first item marked selected starts pressed.
        EXPECT_TRUE(item(dialog, 1)->Value());
        EXPECT_FALSE(item(dialog, 2)->Value());
        EXPECT_TRUE(item(dialog, 0)->Picture().isNull());
        // 6000 x 3855 twips inside, less the subtitle: the four items fill one column of 5880 x 675.
        dialog.resize(400, 257);
        EXPECT_EQ(item(dialog, 0)->Width(), 5880);
        EXPECT_EQ(item(dialog, 0)->Height(), 675);
        EXPECT_EQ(platform::twipsFromPixels(item(dialog, 3)->mapTo(&dialog, QPoint()).y()), 60 + 300 + 3 * 735);
        okButton(dialog)->click();
        EXPECT_TRUE(dialog.isVisible()) << "the host's Closing refused";
        okButton(dialog)->click();
    });
    EXPECT_EQ(result.SelectedItem.Title, "Item 1");
    EXPECT_EQ(log.count(QStringLiteral("Closing 1 Item 1")), 2);
}

TEST_F(SelectionTest, aLongListThatGrowsOpenIsPaintedOnceNotOncePerItemLaidOut)
{
    // Growing open shows the form before its items are laid out; painting each item as it
    // moved repainted every item it still overlapped.
    QWidget parent;
    parent.setGeometry(100, 100, 200, 50);
    parent.show();
    parent.setProperty("hWnd", platform::handleOf(&parent));
    QList<GFXItem> items = numberedItems(120);
    for (GFXItem &item : items)
        item.Title += QString(2000, u'x');
    GFXSelection s;
    s.ParentObj = &parent;

    struct PaintCounter : QObject
    {
        bool eventFilter(QObject *watched, QEvent *event) override
        {
            if (event->type() == QEvent::Paint && watched->objectName() == QLatin1String("btnSelector"))
                ++paints;
            return false;
        }
        int paints = 0;
    } counter;
    qApp->installEventFilter(&counter);
    int paintsBeforeShown = -1;
    select(s, items, [&](QDialog &dialog) {
        paintsBeforeShown = counter.paints;
        cancelButton(dialog)->click();
    });
    qApp->removeEventFilter(&counter);
    EXPECT_LT(paintsBeforeShown, 2 * int(items.size()));
}

using SelectCountryTest = SelectionTest;

// How the lists look (titles, flags, the filter box, the European Union's) is in the golden pictures.
TEST_F(SelectCountryTest, everyCountryIsInReachAndFoundByTyping)
{
    QString filter = QStringLiteral("PT");
    const QString code = selectCountry(GSEL_All, filter, [](QDialog &dialog) {
        EXPECT_GT(shownItems(dialog).size(), 240);
        expectEveryItemInSight(dialog);

        // Typing on an item searches the names, whatever their accents and case.
        auto *box = dialog.findChild<QLineEdit *>(QStringLiteral("txtFilter"));
        ASSERT_TRUE(box && box->isVisible());
        QTest::keyClicks(shownItems(dialog).first(), QStringLiteral("FEDERACAO"));
        ASSERT_EQ(shownItems(dialog).size(), 1);
        EXPECT_EQ(shownItems(dialog).first()->Caption(), QStringLiteral("Federação Russa"));
        QTest::keyClick(box, Qt::Key_Down);
        EXPECT_EQ(dialog.focusWidget(), shownItems(dialog).first()) << "Down goes from the box to the items";
        // Enter in the box takes the only one left.
        QTest::keyClick(box, Qt::Key_Return);
    });
    EXPECT_EQ(code, "RU");
    EXPECT_EQ(filter, "*");
}
