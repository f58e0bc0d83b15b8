#pragma once

#include "zubase/zubase_export.h"

#include <QColorDialog>
#include <QDialog>
#include <QFileDialog>
#include <QFontDialog>
#include <QInputDialog>
#include <QMessageBox>
#include <QPoint>
#include <QPointer>
#include <QProgressDialog>
#include <QShowEvent>

namespace ZuTopLevelWidgetWrapperHelper {

// Moves inWindow so that inPos is its frame's centre (Qt::AlignHCenter/AlignVCenter), right
// or bottom edge (AlignRight/AlignBottom) or top-left corner, kept on the screen that holds
// inPos (the primary screen when none does); when the window is larger than that screen, its
// top-left corner wins. A window not created yet is created off screen first.
ZUBASE_EXPORT void positionWindow(QWidget* inWindow, const QPoint& inPos,
                                  Qt::AlignmentFlag inAlign);

// The parts of ZuTopLevelWidgetWrapper that do not depend on the dialog class.
// inParent, or the application's default parent when it is null.
ZUBASE_EXPORT QWidget* parentOrDefault(QWidget* inParent);
// No help button, font and palette from the parent window, the application's icon.
ZUBASE_EXPORT void setUpDialog(QWidget* inDialog);
// Before the first show: centre over the parent unless the caller placed the dialog, and log
// "Showed dialog: <title>" (category "ZuBase", level 1) for a titled one.
ZUBASE_EXPORT void prepareShow(QWidget* inDialog);

} // namespace ZuTopLevelWidgetWrapperHelper

// Base of every dialog of the library: parented to the application's default parent when
// the caller gives none, without the help button, with the application's icon, centred over
// its parent when first shown, raised and activated when shown, and never deleted by its own
// exec() (WA_DeleteOnClose is cleared first; the caller owns the dialog). exec() also returns
// safely when the dialog is deleted while it runs, e.g. together with its parent window.
template <class T> class ZuTopLevelWidgetWrapper : public T
{
public:
    explicit ZuTopLevelWidgetWrapper(QWidget* inParent = nullptr)
        : T(ZuTopLevelWidgetWrapperHelper::parentOrDefault(inParent))
    {
        ZuTopLevelWidgetWrapperHelper::setUpDialog(this);
    }
    ~ZuTopLevelWidgetWrapper() override {}

    void setVisible(bool inVisible) override
    {
        if (inVisible)
            ZuTopLevelWidgetWrapperHelper::prepareShow(this);
        T::setVisible(inVisible);
    }

    int exec() override
    {
        const bool showModal = this->testAttribute(Qt::WA_ShowModal);
        if (this->testAttribute(Qt::WA_DeleteOnClose))
            this->setAttribute(Qt::WA_DeleteOnClose, false);
        const QPointer<QWidget> self(this);
        const int result = T::exec();
        if (self.isNull() || result < 0)
            return result;
        if (this->isVisible()) {
            this->setAttribute(Qt::WA_ShowModal, true);
            this->hide();
            this->setAttribute(Qt::WA_ShowModal, showModal);
        }
        return result;
    }

    void positionWindow(const QPoint& inPos, Qt::AlignmentFlag inAlign)
    {
        ZuTopLevelWidgetWrapperHelper::positionWindow(this, inPos, inAlign);
    }

protected:
    void showEvent(QShowEvent* inEvent) override
    {
        T::showEvent(inEvent);
        this->raise();
        this->activateWindow();
    }
};

extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QDialog>;
extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QColorDialog>;
extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QFontDialog>;
extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QInputDialog>;
extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QProgressDialog>;
extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QFileDialog>;
extern template class ZUBASE_EXPORT ZuTopLevelWidgetWrapper<QMessageBox>;
