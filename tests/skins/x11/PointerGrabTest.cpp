// On a real X server: a control that holds the pointer while hovered gives it back before
// it raises its click, so a form the host opens from the click takes the mouse.

#include "skins/skSubMenu.h"

#include <QCursor>
#include <QDialog>
#include <QPushButton>
#include <QTest>

#include <gtest/gtest.h>

#include <xcb/xcb.h>

#include <cstdlib>

using namespace zelctl;

namespace {

// Whether some client holds the pointer: the server refuses a grab by another client then.
bool pointerGrabbedOnServer()
{
    xcb_connection_t *connection = xcb_connect(nullptr, nullptr);
    if (xcb_connection_has_error(connection)) {
        xcb_disconnect(connection);
        return false;
    }
    const xcb_window_t root = xcb_setup_roots_iterator(xcb_get_setup(connection)).data->root;
    xcb_grab_pointer_reply_t *reply = xcb_grab_pointer_reply(connection,
        xcb_grab_pointer(
            connection, false, root, 0, XCB_GRAB_MODE_ASYNC, XCB_GRAB_MODE_ASYNC, XCB_NONE, XCB_NONE, XCB_CURRENT_TIME),
        nullptr);
    const bool grabbed = reply && reply->status == XCB_GRAB_STATUS_ALREADY_GRABBED;
    std::free(reply);
    xcb_ungrab_pointer(connection, XCB_CURRENT_TIME);
    xcb_flush(connection);
    xcb_disconnect(connection);
    return grabbed;
}

} // namespace

TEST(PointerGrab, aFormOpenedFromSubMenuClickedTakesTheMouse)
{
    QWidget form;
    form.resize(320, 200);
    auto *control = new skSubMenu(&form);
    control->InitNew();
    control->setGeometry(20, 20, 160, 40);
    form.show();
    ASSERT_TRUE(QTest::qWaitForWindowExposed(&form));
    QCursor::setPos(control->mapToGlobal(QPoint(30, 15)));
    ASSERT_TRUE(QTest::qWaitFor([] { return pointerGrabbedOnServer(); })) << "hovering takes the pointer";

    bool grabbedInHandler = true, formClicked = false;
    QObject::connect(control, &skSubMenu::Clicked, control, [&] {
        grabbedInHandler = pointerGrabbedOnServer();
        QDialog dialog(&form);
        dialog.setModal(true);
        auto *ok = new QPushButton(QStringLiteral("OK"), &dialog);
        ok->setGeometry(10, 10, 80, 30);
        QObject::connect(ok, &QPushButton::clicked, &dialog, [&] { formClicked = true; });
        dialog.show();
        EXPECT_TRUE(QTest::qWaitForWindowExposed(&dialog));
        QTest::mouseClick(dialog.windowHandle(), Qt::LeftButton, {}, ok->geometry().center());
    });
    QTest::mouseClick(form.windowHandle(), Qt::LeftButton, {}, control->mapTo(&form, QPoint(30, 15)));
    EXPECT_FALSE(grabbedInHandler);
    EXPECT_TRUE(formClicked);
}
