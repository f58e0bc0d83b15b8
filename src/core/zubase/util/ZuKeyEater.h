#pragma once

#include "zubase/zubase_export.h"

#include <QObject>

#include <memory>

// Swallows one key for the object it watches: its presses (auto-repeats included) and
// releases never reach that object or its parents. Shortcuts on the key still work.
class ZUBASE_EXPORT ZuKeyEater : public QObject
{
    Q_OBJECT
public:
    // inWatched is also the parent; null watches nothing. inKey is a Qt::Key value.
    ZuKeyEater(QObject* inWatched, int inKey);
    ~ZuKeyEater() override;

protected:
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;

private:
    class Private;
    std::unique_ptr<Private> const d;
};
