#include "CommandButtonArray.h"

#include "CommandButton.h"

#include <QPointer>

#include <algorithm>
#include <map>

namespace zelctl {

class CommandButtonArrayPrivate
{
public:
    QWidget *form = nullptr;
    QString name;
    int designed = 0;
    std::map<int, QPointer<CommandButton>> elements;
};

CommandButtonArray::CommandButtonArray(const QString &name, QWidget *form, int designed)
    : QObject(form)
    , d(std::make_unique<CommandButtonArrayPrivate>())
{
    d->form = form;
    d->name = name;
    d->designed = std::max(designed, 0);
    for (int index = 0; index < d->designed; ++index)
        create(index);
}

CommandButtonArray::~CommandButtonArray() = default;

QString CommandButtonArray::name() const
{
    return d->name;
}

CommandButton *CommandButtonArray::operator()(int index) const
{
    const auto found = d->elements.find(index);
    return found == d->elements.end() ? nullptr : found->second.data();
}

CommandButton *CommandButtonArray::create(int index)
{
    auto *button = new CommandButton(d->form);
    button->setObjectName(d->name);
    button->setIndex(index);
    connect(button, &CommandButton::Click, this, &CommandButtonArray::Click);
    connect(button, &CommandButton::DblClick, this, &CommandButtonArray::DblClick);
    connect(button, &CommandButton::KeyDown, this, &CommandButtonArray::KeyDown);
    d->elements[index] = button;
    return button;
}

CommandButton *CommandButtonArray::Load(int index)
{
    if (index < 0 || (*this)(index))
        return nullptr;
    const CommandButton *model = (*this)(0);
    CommandButton *button = create(index);
    if (model) {
        button->setCaption(model->Caption());
        button->setToolTip(model->ToolTip());
        button->setPicture(model->Picture());
        button->setTag(model->Tag());
        button->setToggle(model->Toggle());
        button->setEnabled(model->Enabled());
        button->setFont(model->font());
        button->setGeometry(model->geometry());
    }
    button->hide();
    return button;
}

bool CommandButtonArray::Unload(int index)
{
    CommandButton *button = (*this)(index);
    if (!button || index < d->designed)
        return false;
    d->elements.erase(index);
    // The element may be unloaded from its own event; it goes once that has returned.
    button->hide();
    button->disconnect(this);
    button->setObjectName(QString());
    button->deleteLater();
    return true;
}

int CommandButtonArray::LBound() const
{
    for (const auto &[index, button] : d->elements) {
        if (button)
            return index;
    }
    return 0;
}

int CommandButtonArray::UBound() const
{
    for (auto it = d->elements.rbegin(); it != d->elements.rend(); ++it) {
        if (it->second)
            return it->first;
    }
    return -1;
}

int CommandButtonArray::Count() const
{
    return static_cast<int>(std::count_if(
        d->elements.begin(), d->elements.end(), [](const auto &entry) { return !entry.second.isNull(); }));
}

} // namespace zelctl
