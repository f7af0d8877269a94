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
    connect(add("mnu_undo", QStringLiteral("&Desfazer"), QKeySequence(Qt::CTRL | Qt::Key_Z)), &QAction::triggered, this,
        &NifPopupMenu::Undo);
    separator("mnu_blank00");
    connect(add("mnu_cut", QStringLiteral("&Cortar"), QKeySequence(Qt::CTRL | Qt::Key_X)), &QAction::triggered, this,
        &NifPopupMenu::Cut);
    connect(add("mnu_Copy", QStringLiteral("&Copiar"), QKeySequence(Qt::CTRL | Qt::Key_C)), &QAction::triggered, this,
        &NifPopupMenu::Copy);
    QAction *paste = add("mnu_paste", QStringLiteral("&Colar"), QKeySequence(Qt::CTRL | Qt::Key_V));
    connect(paste, &QAction::triggered, this, &NifPopupMenu::Paste);
    m_popup->setDefaultAction(paste);
    connect(add("mnu_Delete", QStringLiteral("&Apagar")), &QAction::triggered, this, &NifPopupMenu::Delete);
    separator("mnu_blank01");
    connect(add("mnu_selectall", QStringLiteral("&Escolher tudo"), QKeySequence(Qt::CTRL | Qt::Key_A)),
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

QAction *NifPopupMenu::add(const char *name, const QString &caption, const QKeySequence &shortcut)
{
    QAction *action = m_popup->addAction(caption);
    action->setObjectName(QString::fromLatin1(name));
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

void NifPopupMenu::updateEntries()
{
    const bool editable = !m_box.isReadOnly();
    entry("mnu_undo")->setEnabled(editable && m_box.isUndoAvailable());
    entry("mnu_cut")->setEnabled(editable);
    entry("mnu_paste")->setEnabled(editable);
    entry("mnu_Delete")->setEnabled(editable);
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
        if (action->shortcut().isEmpty() || action->shortcut() != pressed)
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
    if (!m_box.isReadOnly())
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
    if (m_box.isReadOnly())
        return;
    Copy();
    if (m_box.hasSelectedText())
        m_box.del();
    else
        replaceText(QString());
}

void NifPopupMenu::Paste()
{
    if (m_box.isReadOnly())
        return;
    QString text = QGuiApplication::clipboard()->text().left(PasteLimit);
    // A code in front of the number chooses the country: any two characters before a
    // number, or a member state's code before any number of its own form ("ES12345678Z").
    const QString code = text.left(2).toUpper();
    const bool coded = text.size() > 2 && !nifValidator::IsNumericFrom(text, 1, 2)
        && (nifValidator::IsNumericFrom(text, 3, 0) || nifValidator::CountryIndex(code) >= 0);
    if (coded) {
        m_control.setCountryID(code);
        text = text.sliced(2);
    } else {
        m_control.setCountryID(QStringLiteral("PT"));
    }
    replaceText(text);
}

void NifPopupMenu::Delete()
{
    if (!m_box.isReadOnly())
        replaceText(QString());
}

void NifPopupMenu::SelectAll()
{
    m_box.setSelection(0, int(m_box.text().size()));
}

} // namespace zelctl
