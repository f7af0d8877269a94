#include "selection/clsGFXSelection.h"
#include "selection/frmSelector.h"

#include "common/modFuncs.h"
#include "companion/CommandButton.h"
#include "platform/WindowHandles.h"
#include "support/TestSupport.h"

#include <QGuiApplication>
#include <QScreen>
#include <QTemporaryDir>
#include <QTest>

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>

using namespace zelctl;

namespace {

QList<GFXItem> numberedItems(int count)
{
    QList<GFXItem> items;
    for (int i = 0; i < count; ++i) {
        GFXItem item;
        item.Title = QStringLiteral("Item %1").arg(i);
        item.Value = i;
        items.append(item);
    }
    return items;
}

// The first button of a control array that `wanted` picks.
CommandButton *element(QDialog &dialog, const char *array, const std::function<bool(CommandButton *)> &wanted)
{
    const auto buttons = dialog.findChildren<CommandButton *>(QLatin1String(array));
    const auto found = std::find_if(buttons.begin(), buttons.end(), wanted);
    return found == buttons.end() ? nullptr : *found;
}

CommandButton *item(QDialog &dialog, int index)
{
    return element(dialog, "btnSelector", [&](CommandButton *b) { return b->Index() == index; });
}

CommandButton *itemTitled(QDialog &dialog, const QString &title)
{
    return element(dialog, "btnSelector", [&](CommandButton *b) { return b->Caption() == title; });
}

CommandButton *okButton(QDialog &dialog)
{
    return element(dialog, "btn_Handle", [](CommandButton *b) { return b->Index() == 0; });
}

CommandButton *cancelButton(QDialog &dialog)
{
    return element(dialog, "btn_Handle", [](CommandButton *b) { return b->Index() == 1; });
}

// Every event of the class, in the order raised.
QStringList *recordEvents(clsGFXSelection &selection)
{
    auto *log = new QStringList;
    QObject::connect(&selection, &QObject::destroyed, [log] { delete log; });
    QObject::connect(&selection, &clsGFXSelection::Opening, [log] { log->append(QStringLiteral("Opening")); });
    QObject::connect(&selection, &clsGFXSelection::ItemChecked,
        [log](GFXItem &item) { log->append(QStringLiteral("ItemChecked ") + item.Title); });
    QObject::connect(&selection, &clsGFXSelection::ItemUnchecked,
        [log](GFXItem &item) { log->append(QStringLiteral("ItemUnchecked ") + item.Title); });
    QObject::connect(&selection, &clsGFXSelection::ItemChanged,
        [log](GFXItem &item) { log->append(QStringLiteral("ItemChanged ") + item.Title); });
    QObject::connect(&selection, &clsGFXSelection::Closing, [log](qint32 &count, QList<GFXItem> &items, bool &) {
        log->append(QStringLiteral("Closing %1 %2").arg(count).arg(items.isEmpty() ? QString() : items[0].Title));
    });
    QObject::connect(&selection, &clsGFXSelection::Closed, [log] { log->append(QStringLiteral("Closed")); });
    return log;
}

class SelectionTest : public ::testing::Test
{
protected:
    void SetUp() override { frmSelector::setZoomStepInterval(0); }

    // Runs `call` with `user` acting on each dialog it shows.
    template <typename Call> auto driven(const std::function<void(QDialog &)> &user, Call call)
    {
        test::ModalDriver driver([&](QDialog &dialog) {
            dialog.show();
            user(dialog);
            return dialog.result();
        });
        auto answer = call();
        shown = driver.shownCount();
        return answer;
    }

    GFXResult select(const GFXSelection &s, const QList<GFXItem> &items, const std::function<void(QDialog &)> &user)
    {
        return driven(user, [&] { return selection.SelectFrom(s, items); });
    }

    QString selectCountry(GSEL_CountryFilterList mode, QString &filter, const std::function<void(QDialog &)> &user)
    {
        return driven(user, [&] { return selection.SelectCountry({}, mode, filter); });
    }

    clsGFXSelection selection;
    QStringList *log = recordEvents(selection);
    int shown = 0;
};

} // namespace

TEST_F(SelectionTest, emptyItemsShowNoDialogAndAnswerEmpty)
{
    EXPECT_EQ(select({}, {}, [](QDialog &) {}), GFXResult());
    EXPECT_EQ(shown, 0);
    EXPECT_TRUE(log->isEmpty());
    EXPECT_EQ(selection.RecomendedView({}, {}), GFXViewButtons);
    EXPECT_EQ(selection.RecomendedView({}, numberedItems(3)), GFXViewButtons);
}

TEST_F(SelectionTest, okReportsTheLastClickedItemAndTheEventsInOrder)
{
    const GFXResult result = select({}, numberedItems(3), [](QDialog &dialog) {
        QTest::mouseClick(item(dialog, 1), Qt::LeftButton);
        QTest::mouseClick(item(dialog, 2), Qt::LeftButton);
        // A click on the pressed item keeps it pressed and changes nothing.
        QTest::mouseClick(item(dialog, 2), Qt::LeftButton);
        EXPECT_FALSE(item(dialog, 1)->Value());
        EXPECT_TRUE(item(dialog, 2)->Value());
        QTest::mouseClick(okButton(dialog), Qt::LeftButton);
        EXPECT_FALSE(dialog.isVisible());
    });
    EXPECT_TRUE(result.Accepted);
    EXPECT_FALSE(result.Canceled);
    EXPECT_EQ(result.NumberOfSelectedItems, 1);
    EXPECT_EQ(result.SelectedItem.Title, "Item 2");
    EXPECT_EQ(result.SelectedItem.Value, 2);
    EXPECT_EQ(result.SelectedItems, QList<GFXItem> { result.SelectedItem });
    EXPECT_EQ(result.ViewType, GFXViewButtons);
    EXPECT_EQ(*log,
        QStringList({ "Opening", "ItemChecked Item 1", "ItemChanged Item 1", "ItemUnchecked Item 1",
            "ItemChecked Item 2", "ItemChanged Item 2", "Closing 1 Item 2", "Closed" }));
}

TEST_F(SelectionTest, cancelEscapeAndTheCloseBoxCancel)
{
    const std::function<void(QDialog &)> ways[] = {
        [](QDialog &dialog) { QTest::mouseClick(cancelButton(dialog), Qt::LeftButton); },
        [](QDialog &dialog) { QTest::keyClick(item(dialog, 0), Qt::Key_Escape); },
        [](QDialog &dialog) { dialog.close(); },
    };
    for (const auto &way : ways) {
        log->clear();
        const GFXResult result = select({}, numberedItems(2), [&](QDialog &dialog) {
            item(dialog, 1)->click();
            way(dialog);
            EXPECT_FALSE(dialog.isVisible());
        });
        EXPECT_TRUE(result.Canceled);
        EXPECT_FALSE(result.Accepted);
        EXPECT_EQ(result.NumberOfSelectedItems, 0);
        EXPECT_EQ(result.SelectedItem, GFXItem());
        EXPECT_EQ(result.ViewType, GFXViewButtons);
        EXPECT_EQ(log->mid(3), QStringList({ "Closing 1 Item 1", "Closed" }));
    }
}

TEST_F(SelectionTest, aDoubleClickChoosesAndAccepts)
{
    const GFXResult result
        = select({}, numberedItems(3), [](QDialog &dialog) { QTest::mouseDClick(item(dialog, 2), Qt::LeftButton); });
    EXPECT_TRUE(result.Accepted);
    EXPECT_EQ(result.SelectedItem.Title, "Item 2");
    EXPECT_EQ(log->count(QStringLiteral("Closing 1 Item 2")), 1);
    EXPECT_EQ(log->last(), "Closed");
}

TEST_F(SelectionTest, cancelCloseKeepsTheDialogOpen)
{
    int refusals = 1;
    QObject::connect(&selection, &clsGFXSelection::Closing,
        [&](qint32 &, QList<GFXItem> &, bool &cancelClose) { cancelClose = refusals-- > 0; });
    const GFXResult result = select({}, numberedItems(2), [](QDialog &dialog) {
        item(dialog, 0)->click();
        okButton(dialog)->click();
        EXPECT_TRUE(dialog.isVisible());
        okButton(dialog)->click();
        EXPECT_FALSE(dialog.isVisible());
    });
    EXPECT_TRUE(result.Accepted);
    EXPECT_EQ(log->count(QStringLiteral("Closing 1 Item 0")), 2);
}

TEST_F(SelectionTest, theFormShowsTheItemsAsGivenInTheLaidOutGrid)
{
    QList<GFXItem> items = numberedItems(4);
    items[1].Disabled = true;
    items[1].Selected = true;
    items[2].Selected = true;
    items[3].Image = test::sourcePath(QStringLiteral("data/images/flags_iso/16/PT.png"));
    items[0].Image = QStringLiteral("/no/such/flag.png");
    GFXSelection s;
    s.Subtitle = QStringLiteral("Escolha um");
    s.DisableCancel = true;
    const GFXResult result = select(s, items, [](QDialog &dialog) {
        EXPECT_FALSE(cancelButton(dialog)->isVisible());
        EXPECT_FALSE(item(dialog, 1)->isEnabled());
        // Only the first item marked selected starts pressed.
        EXPECT_TRUE(item(dialog, 1)->Value());
        EXPECT_FALSE(item(dialog, 2)->Value());
        EXPECT_TRUE(item(dialog, 0)->Picture().isNull());
        EXPECT_EQ(item(dialog, 3)->Picture().image().size(), QSize(16, 16));

        // 6000 x 3855 twips inside, less the subtitle: the four items fill one column of 5880 x 675.
        dialog.resize(400, 257);
        EXPECT_EQ(item(dialog, 0)->Width(), 5880);
        EXPECT_EQ(item(dialog, 0)->Height(), 675);
        EXPECT_EQ(item(dialog, 3)->Top(), 60 + 300 + 3 * 735);
        okButton(dialog)->click();
    });
    EXPECT_EQ(result.SelectedItem.Title, "Item 1");
}

TEST_F(SelectionTest, theDialogIsPlacedAgainstItsParent)
{
    const QRect screen = QGuiApplication::primaryScreen()->availableGeometry();
    struct Case
    {
        GFXPositioning relation;
        QRect parent;
        QPoint expected;
    };
    const QSize size = frmSelector().size();
    const Case cases[] = {
        { GFXPositionDefault, { 400, 300, 50, 20 }, { 400 - size.width() / 2, 300 - size.height() / 2 } },
        { GFXPositionCenterObject, { 300, 200, 50, 20 }, { 300 - size.width() / 2, 200 - size.height() / 2 } },
        { GFXPositionObjectBelow, { 20, 30, 120, 40 }, { 20, 70 } },
        { GFXPositionObjectAbove, { 20, size.height() + 10, 120, 40 }, { 20, 10 } },
        { GFXPositionObjectLeft, { size.width() + 20, 30, 100, 40 }, { 20, 30 } },
        { GFXPositionObjectRight, { 20, 30, 100, 40 }, { 120, 30 } },
        // Too near the bottom right corner for the dialog below it: moved onto the screen.
        { GFXPositionObjectBelow, { screen.right() - 60, screen.bottom() - 30, 50, 20 },
            { screen.right() + 1 - size.width(), screen.bottom() + 1 - size.height() } },
    };
    for (const Case &c : cases) {
        // A window whose frame covers c.parent.
        QWidget parent;
        parent.show();
        parent.resize(c.parent.size() - (parent.frameGeometry().size() - parent.size()));
        parent.move(c.parent.topLeft());
        parent.setProperty("hWnd", platform::handleOf(&parent));
        const modFuncs::RECT frame = modFuncs::GetObjectWindowRect(&parent);
        ASSERT_EQ(QRect(QPoint(frame.left, frame.top), QPoint(frame.right - 1, frame.bottom - 1)), c.parent);
        GFXSelection s;
        s.ParentObj = &parent;
        s.WindowPositionRelation = c.relation;
        QRect placed;
        QColor background;
        select(s, numberedItems(2), [&](QDialog &dialog) {
            placed = dialog.geometry();
            background = dialog.palette().color(QPalette::Window);
            okButton(dialog)->click();
        });
        EXPECT_EQ(placed, QRect(c.expected, size)) << "relation " << c.relation;
        EXPECT_EQ(background, QColor(Qt::white));
    }
}

TEST_F(SelectionTest, theUnbuiltListsAnswerEmpty)
{
    EXPECT_EQ(selection.QuickSelectFrom(QStringLiteral("a\tb\tc")), "");
    EXPECT_EQ(selection.SelectCAErev3(), "");
    EXPECT_EQ(selection.SelectCTA(), "");
    EXPECT_EQ(selection.SelectDistrito(), "");
    EXPECT_EQ(selection.SelectLocalidade(QStringLiteral("Lisboa")), "");
    EXPECT_EQ(selection.SelectFreguesia(QStringLiteral("Sintra")), "");
    EXPECT_EQ(shown, 0);
}

using SelectCountryTest = SelectionTest;

TEST_F(SelectCountryTest, onlyPortugalNeedsNoDialog)
{
    QString filter = QStringLiteral("ES,FR");
    EXPECT_EQ(selectCountry(GSEL_OnlyPT, filter, [](QDialog &) {}), "PT");
    EXPECT_EQ(filter, "PT,");
    EXPECT_EQ(shown, 0);
}

TEST_F(SelectCountryTest, theEuropeanUnionOffersItsMembersWithFlags)
{
    QString filter;
    const QString code = selectCountry(GSEL_OnlyEU, filter, [](QDialog &dialog) {
        const auto buttons = dialog.findChildren<CommandButton *>(QStringLiteral("btnSelector"));
        EXPECT_EQ(buttons.size(), 27);
        for (const CommandButton *button : buttons)
            EXPECT_FALSE(button->Picture().isNull()) << button->Caption().toStdString();
        itemTitled(dialog, QStringLiteral("Espanha"))->click();
        okButton(dialog)->click();
    });
    EXPECT_EQ(code, "ES");
    EXPECT_EQ(filter, selection.EU_CountryList());
}

TEST_F(SelectCountryTest, allCountriesAndCustomLists)
{
    QString filter = QStringLiteral("PT");
    EXPECT_EQ(selectCountry(GSEL_All, filter,
                  [](QDialog &dialog) {
                      EXPECT_GT(dialog.findChildren<CommandButton *>(QStringLiteral("btnSelector")).size(), 200);
                      item(dialog, 0)->click();
                      cancelButton(dialog)->click();
                  }),
        "");
    EXPECT_EQ(filter, "*");

    filter = QStringLiteral("PT,ES");
    const QString code = selectCountry(GSEL_Custom, filter, [](QDialog &dialog) {
        EXPECT_EQ(dialog.findChildren<CommandButton *>(QStringLiteral("btnSelector")).size(), 2);
        QTest::mouseDClick(itemTitled(dialog, QStringLiteral("Espanha")), Qt::LeftButton);
    });
    EXPECT_EQ(code, "ES");
    EXPECT_EQ(filter, "PT,ES");
}

TEST_F(SelectCountryTest, fewerThanTwoCountriesShowNoDialog)
{
    for (const QString &list : { QStringLiteral("ES"), QStringLiteral("ES,XX"), QString() }) {
        QString filter = list;
        EXPECT_EQ(selectCountry(GSEL_Custom, filter, [](QDialog &) {}), "");
        EXPECT_EQ(shown, 0);
        EXPECT_EQ(filter, list);
    }
}

TEST_F(SelectCountryTest, aMissingFileIsReported)
{
    QTemporaryDir folder;
    selection.setCountryFile(folder.filePath(QStringLiteral("iso3166.txt")));
    test::MessageBoxRecorder messages;
    QString filter;
    EXPECT_EQ(selectCountry(GSEL_OnlyEU, filter, [](QDialog &) {}), "");
    ASSERT_EQ(messages.shown().size(), 1);
    EXPECT_EQ(messages.shown()[0].title, "Ficheiro com acesso negado ou inexistente");
    EXPECT_EQ(shown, 0);
}
