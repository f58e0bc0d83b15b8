#include "zubase/ZuCheckBoxGroup.h"

#include <QCheckBox>
#include <QList>
#include <QPointer>

class ZuCheckBoxGroup::Private
{
public:
    QPointer<QCheckBox> parentCheckBox;
    // Held as plain objects: a child announcing its destruction is no longer a QCheckBox,
    // so it must be found without casting.
    QList<QPointer<QObject>> children; // in the order added, duplicates kept
    QList<bool> recordedStates;        // index for index with the children
    bool updating = false;             // the group itself is changing check states

    // A destroyed child must not stay listed: the next click of the parent would reach it.
    void dropChild(QObject* inDestroyed)
    {
        for (int i = children.size() - 1; i >= 0; --i) {
            const QObject* child = children.at(i).data();
            if (child && child != inDestroyed)
                continue;
            children.removeAt(i);
            if (i < recordedStates.size())
                recordedStates.removeAt(i);
        }
    }

    static QCheckBox* box(const QPointer<QObject>& inChild)
    {
        return static_cast<QCheckBox*>(inChild.data());
    }
};

ZuCheckBoxGroup::ZuCheckBoxGroup(QObject* inParent) : QObject(inParent), d(new Private)
{
    qRegisterMetaType<QCheckBox*>("QCheckBox*");
}

ZuCheckBoxGroup::~ZuCheckBoxGroup() = default;

void ZuCheckBoxGroup::addCheckBox(QCheckBox* inCheckBox)
{
    if (!inCheckBox)
        return;
    d->children.append(inCheckBox);
    connect(inCheckBox, &QAbstractButton::clicked, this, &ZuCheckBoxGroup::slot_checkBoxClicked);
    connect(inCheckBox, &QAbstractButton::toggled, this, &ZuCheckBoxGroup::slot_checkBoxToggled);
    connect(inCheckBox, &QObject::destroyed, this, [this](QObject* inDestroyed) {
        d->dropChild(inDestroyed);
        updateParentCheckBoxState();
    });
    updateParentCheckBoxState();
}

void ZuCheckBoxGroup::removeCheckBox(QCheckBox* inCheckBox)
{
    if (!inCheckBox)
        return;
    disconnect(inCheckBox, nullptr, this, nullptr);
    d->children.removeAll(QPointer<QObject>(inCheckBox));
    updateParentCheckBoxState();
}

void ZuCheckBoxGroup::setParentCheckBox(QCheckBox* inCheckBox)
{
    if (d->parentCheckBox)
        disconnect(d->parentCheckBox, &QCheckBox::stateChanged, this,
                   &ZuCheckBoxGroup::slot_parentCheckBoxStateChanged);
    d->parentCheckBox = inCheckBox;
    updateParentCheckBoxState();
    if (inCheckBox)
        connect(inCheckBox, &QCheckBox::stateChanged, this,
                &ZuCheckBoxGroup::slot_parentCheckBoxStateChanged);
}

void ZuCheckBoxGroup::setCheckedAll(bool inChecked)
{
    d->updating = true;
    const QList<QPointer<QObject>> children = d->children; // slots may change the list
    for (const QPointer<QObject>& child : children) {
        if (QCheckBox* box = Private::box(child))
            box->setChecked(inChecked);
    }
    d->updating = false;
    if (!d->children.isEmpty())
        updateParentCheckBoxState();
    else if (d->parentCheckBox)
        d->parentCheckBox->setChecked(inChecked);
}

void ZuCheckBoxGroup::slot_checkBoxClicked()
{
    Q_EMIT checkBoxClicked(qobject_cast<QCheckBox*>(sender()));
}

void ZuCheckBoxGroup::slot_checkBoxToggled()
{
    if (d->parentCheckBox)
        updateParentCheckBoxState();
    Q_EMIT checkBoxToggled(qobject_cast<QCheckBox*>(sender()));
}

void ZuCheckBoxGroup::slot_parentCheckBoxStateChanged()
{
    if (d->updating || !d->parentCheckBox)
        return;
    const Qt::CheckState state = d->parentCheckBox->checkState();
    d->updating = true;
    if (state != Qt::PartiallyChecked) {
        const bool checked = d->parentCheckBox->isChecked();
        const QList<QPointer<QObject>> children = d->children; // slots may change the list
        for (const QPointer<QObject>& child : children) {
            if (QCheckBox* box = Private::box(child))
                box->setChecked(checked);
        }
    } else {
        // A slot may take children away meanwhile: never index past either list.
        for (int i = 0; i < d->recordedStates.size() && i < d->children.size(); ++i) {
            if (QCheckBox* child = Private::box(d->children.at(i)))
                child->setChecked(d->recordedStates.at(i));
        }
    }
    d->updating = false;
}

void ZuCheckBoxGroup::updateParentCheckBoxState()
{
    if (d->updating || !d->parentCheckBox)
        return;
    d->recordedStates.clear();
    int checkedCount = 0;
    for (const QPointer<QObject>& child : qAsConst(d->children)) {
        const QCheckBox* box = Private::box(child);
        const bool checked = box && box->isChecked();
        d->recordedStates.append(checked);
        if (checked)
            ++checkedCount;
    }
    const bool agree = checkedCount == 0 || checkedCount == d->children.size();
    QCheckBox* parentBox = d->parentCheckBox;
    d->updating = true;
    if (agree) {
        parentBox->setTristate(false);
        parentBox->setChecked(checkedCount != 0);
    } else {
        parentBox->setTristate(true);
        parentBox->setCheckState(Qt::PartiallyChecked);
    }
    d->updating = false;
    if (d->parentCheckBox) // a slot of the parent's may have deleted it
        d->parentCheckBox->update();
}
