#include "zubase/ZuKeyEater.h"

#include <QKeyEvent>

class ZuKeyEater::Private
{
public:
    int key = 0;
};

ZuKeyEater::ZuKeyEater(QObject* inWatched, int inKey) : QObject(inWatched), d(new Private)
{
    d->key = inKey;
    if (inWatched)
        inWatched->installEventFilter(this);
}

ZuKeyEater::~ZuKeyEater() = default;

bool ZuKeyEater::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    if ((inEvent->type() == QEvent::KeyPress || inEvent->type() == QEvent::KeyRelease) &&
        static_cast<QKeyEvent*>(inEvent)->key() == d->key)
        return true;
    return QObject::eventFilter(inWatched, inEvent);
}
