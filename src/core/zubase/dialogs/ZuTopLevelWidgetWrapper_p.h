#pragma once

// Internal: the static dialog functions run their dialog through this holder.
#include <QPointer>

// Owns a dialog made on the heap for one run of a static dialog function. The dialog may die
// while it runs (its parent window is closed from a timer, a network reply, a pipe message);
// then the holder is empty afterwards and the function answers as if it had been cancelled. A
// dialog on the stack would be deleted a second time by its parent.
template <class T> class ZuDialogHolder
{
public:
    explicit ZuDialogHolder(T* inDialog) : mDialog(inDialog) {}
    ~ZuDialogHolder() { delete mDialog.data(); }
    ZuDialogHolder(const ZuDialogHolder&) = delete;
    ZuDialogHolder& operator=(const ZuDialogHolder&) = delete;

    T* operator->() const { return mDialog.data(); }
    T* get() const { return mDialog.data(); }
    // Still there after its run.
    bool alive() const { return !mDialog.isNull(); }

private:
    QPointer<T> mDialog;
};
