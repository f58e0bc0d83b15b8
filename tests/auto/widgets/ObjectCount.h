#pragma once

// Counts the QObjects created and destroyed while a LiveObjects lives, through QtCore's object
// hooks, so that a test can show that a widget leaves nothing behind when it is destroyed.
#include <QObject>
#include <QtGlobal>

extern Q_CORE_EXPORT quintptr qtHookData[];

class LiveObjects
{
public:
    LiveObjects()
    {
        sCount = 0;
        mAdd = qtHookData[kAddQObject];
        mRemove = qtHookData[kRemoveQObject];
        qtHookData[kAddQObject] = reinterpret_cast<quintptr>(&added);
        qtHookData[kRemoveQObject] = reinterpret_cast<quintptr>(&removed);
    }
    ~LiveObjects()
    {
        qtHookData[kAddQObject] = mAdd;
        qtHookData[kRemoveQObject] = mRemove;
    }
    LiveObjects(const LiveObjects&) = delete;
    LiveObjects& operator=(const LiveObjects&) = delete;

    // Objects made since construction and not yet destroyed.
    int count() const { return sCount; }

private:
    // Indices of the add and remove callbacks in QtCore's hook table (stable through Qt 5).
    static constexpr int kAddQObject = 3;
    static constexpr int kRemoveQObject = 4;
    static void added(QObject*) { ++sCount; }
    static void removed(QObject*) { --sCount; }

    static inline int sCount = 0;
    quintptr mAdd;
    quintptr mRemove;
};
