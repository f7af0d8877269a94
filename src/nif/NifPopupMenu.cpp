#include "NifPopupMenu.h"

#include "PopupMenuPresenter.h"
#include "cNIF.h"
#include "validation/nifValidator.h"

#include <QClipboard>
#include <QCursor>
#include <QGuiApplication>
#include <QKeyEvent>
#include <QLineEdit>
#include <QMenu>
#include <QPointer>

namespace zelctl {

namespace {

// More than any tax number; a longer clipboard text is cut here.
constexpr int PasteLimit = 100;

} // namespace

NifPopupMenu::NifPopupMenu(cNIF &control, QLineEdit &box)
    : QObject(&control)
    , m_control(control)
    , m_box(box)
    , m_popup(new QMenu(QStringLiteral("&MenuPopup"), &control))
{
    m_popup->setObjectName(QStringLiteral("popup"));
    connect(add("mnu_undo", QStringLiteral("&Desfazer"), QKeySequence::Undo, QKeySequence(Qt::CTRL | Qt::Key_Z)),
        &QAction::triggered, this, &NifPopupMenu::Undo);
    separator("mnu_blank00");
    connect(add("mnu_cut", QStringLiteral("&Cortar"), QKeySequence::Cut, QKeySequence(Qt::CTRL | Qt::Key_X)),
        &QAction::triggered, this, &NifPopupMenu::Cut);
    connect(add("mnu_Copy", QStringLiteral("&Copiar"), QKeySequence::Copy, QKeySequence(Qt::CTRL | Qt::Key_C)),
        &QAction::triggered, this, &NifPopupMenu::Copy);
    QAction *paste
        = add("mnu_paste", QStringLiteral("&Colar"), QKeySequence::Paste, QKeySequence(Qt::CTRL | Qt::Key_V));
    connect(paste, &QAction::triggered, this, &NifPopupMenu::Paste);
    m_popup->setDefaultAction(paste);
    connect(add("mnu_Delete", QStringLiteral("&Apagar")), &QAction::triggered, this, &NifPopupMenu::Delete);
    separator("mnu_blank01");
    connect(add("mnu_selectall", QStringLiteral("&Escolher tudo"), QKeySequence::SelectAll,
                QKeySequence(Qt::CTRL | Qt::Key_A)),
        &QAction::triggered, this, &NifPopupMenu::SelectAll);
    separator("mnu_blank02");
    connect(add("mnu_RefreshNIFInfo", QStringLiteral("&Reobter informações...")), &QAction::triggered, &control,
        &cNIF::GetNIFInformation);
    // Offered by the menu but not served by this control.
    add("mnu_search", QStringLiteral("&Pesquisar..."))->setEnabled(false);
    add("mnu_listnif", QStringLiteral("&Escolher da lista..."))->setEnabled(false);
    // The control connects the record form and enables it for a valid number.
    add("mnu_ficha", QStringLiteral("&Ficha de contribuinte"))->setEnabled(false);
}

QAction *NifPopupMenu::add(
    const char *name, const QString &caption, QKeySequence::StandardKey standard, const QKeySequence &shortcut)
{
    QAction *action = m_popup->addAction(caption);
    action->setObjectName(QString::fromLatin1(name));
    action->setProperty("standardKey", int(standard));
    if (!shortcut.isEmpty()) {
        action->setShortcut(shortcut);
        // Shown in the menu; the keys themselves reach the box, which hands them over.
        action->setShortcutContext(Qt::WidgetShortcut);
    }
    return action;
}

void NifPopupMenu::separator(const char *name)
{
    m_popup->addSeparator()->setObjectName(QString::fromLatin1(name));
}

QAction *NifPopupMenu::entry(const char *name) const
{
    return m_popup->findChild<QAction *>(QString::fromLatin1(name), Qt::FindDirectChildrenOnly);
}

bool NifPopupMenu::editable() const
{
    return !m_box.isReadOnly() && m_box.isEnabled();
}

void NifPopupMenu::updateEntries()
{
    const bool mayEdit = editable();
    entry("mnu_undo")->setEnabled(mayEdit && m_box.isUndoAvailable());
    entry("mnu_cut")->setEnabled(mayEdit);
    entry("mnu_paste")->setEnabled(mayEdit);
    entry("mnu_Delete")->setEnabled(mayEdit);
}

void NifPopupMenu::popup()
{
    if (m_control.DisablePopupMenu())
        return;
    updateEntries();
    m_popup->setDefaultAction(entry("mnu_paste"));
    showPopupMenu(*m_popup, QCursor::pos());
}

bool NifPopupMenu::handleShortcut(const QKeyEvent &event)
{
    const QKeySequence pressed(event.keyCombination());
    for (QAction *action : m_popup->actions()) {
        const auto standard = QKeySequence::StandardKey(action->property("standardKey").toInt());
        const bool matches = (!action->shortcut().isEmpty() && action->shortcut() == pressed)
            || (standard != QKeySequence::UnknownKey && event.matches(standard));
        if (!matches)
            continue;
        updateEntries();
        if (action->isEnabled())
            action->trigger();
        return true;
    }
    return false;
}

void NifPopupMenu::replaceText(const QString &text)
{
    // Through the box's own editing, so Undo can take the change back.
    m_box.selectAll();
    if (text.isEmpty())
        m_box.del();
    else
        m_box.insert(text);
}

void NifPopupMenu::Undo()
{
    if (editable())
        m_box.undo();
}

void NifPopupMenu::Copy()
{
    QClipboard *clipboard = QGuiApplication::clipboard();
    clipboard->clear();
    clipboard->setText(m_box.text());
}

void NifPopupMenu::Cut()
{
    if (!editable())
        return;
    Copy();
    if (m_box.hasSelectedText())
        m_box.del();
    else
        replaceText(QString());
}

void NifPopupMenu::Paste()
{
    PasteText(QGuiApplication::clipboard()->text());
}

void NifPopupMenu::PasteText(QString text)
{
    if (!editable())
        return;
    text.truncate(PasteLimit);
    // A code in front of the number chooses the country: any two characters before a
    // number, or a member state's code before any number of its own form ("ES12345678Z").
    const QString code = text.left(2).toUpper();
    const bool coded = text.size() > 2 && !nifValidator::IsNumericFrom(text, 1, 2)
        && (nifValidator::IsNumericFrom(text, 3, 0) || nifValidator::CountryIndex(code) >= 0);
    if (coded)
        text = text.sliced(2);
    // Choosing the country may cut the box's text, a change whose events may delete the
    // control (and this menu with it).
    const QPointer<cNIF> alive(&m_control);
    m_control.setCountryID(coded ? code : QStringLiteral("PT"));
    if (!alive)
        return;
    replaceText(text);
}

void NifPopupMenu::Delete()
{
    if (editable())
        replaceText(QString());
}

void NifPopupMenu::SelectAll()
{
    m_box.setSelection(0, int(m_box.text().size()));
}

} // namespace zelctl
