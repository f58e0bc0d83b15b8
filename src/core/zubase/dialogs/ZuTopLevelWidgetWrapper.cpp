#include "zubase/ZuTopLevelWidgetWrapper.h"

#include "zubase/ZuApplication.h"
#include "zubase/ZuCheck_p.h"

#include <QGuiApplication>
#include <QScreen>

namespace ZuTopLevelWidgetWrapperHelper {

void positionWindow(QWidget* inWindow, const QPoint& inPos, Qt::AlignmentFlag inAlign)
{
    QScreen* screen = QGuiApplication::screenAt(inPos);
    if (!screen)
        screen = QGuiApplication::primaryScreen();
    const QRect area = screen ? screen->geometry() : QRect();

    // The frame is only known once the window exists.
    if (!inWindow->testAttribute(Qt::WA_WState_Created)) {
        inWindow->setAttribute(Qt::WA_DontShowOnScreen, true);
        inWindow->show();
        inWindow->hide();
        inWindow->setAttribute(Qt::WA_DontShowOnScreen, false);
    }

    const QRect frame = inWindow->frameGeometry();
    const int fw = frame.width();
    const int fh = frame.height();
    int x = inPos.x();
    int y = inPos.y();
    if (inAlign & Qt::AlignHCenter)
        x -= fw / 2;
    else if (inAlign & Qt::AlignRight)
        x -= fw;
    if (inAlign & Qt::AlignVCenter)
        y -= fh / 2;
    else if (inAlign & Qt::AlignBottom)
        y -= fh;

    if (screen) {
        // Bottom and right are the last row and column; top and left win on a small screen.
        if (y + fh > area.bottom())
            y = area.bottom() - fh;
        if (y < area.top())
            y = area.top();
        if (x + fw > area.right())
            x = area.right() - fw;
        if (x < area.left())
            x = area.left();
    }
    inWindow->move(x, y);
}

QWidget* parentOrDefault(QWidget* inParent)
{
    if (inParent)
        return inParent;
    if (ZuApplication* app = ZuApplication::instance())
        return app->defaultParentProvider().defaultParent();
    return nullptr;
}

void setUpDialog(QWidget* inDialog)
{
    inDialog->setWindowFlags(inDialog->windowFlags() & ~Qt::WindowContextHelpButtonHint);
    inDialog->setAttribute(Qt::WA_WindowPropagation, true);
    inDialog->setWindowIcon(QApplication::windowIcon());
}

void prepareShow(QWidget* inDialog)
{
    // Placed by the caller, or a show that only creates the window: leave it alone.
    if (inDialog->testAttribute(Qt::WA_DontShowOnScreen) || inDialog->testAttribute(Qt::WA_Moved))
        return;
    if (QWidget* parent = inDialog->parentWidget()) {
        const QRect frame = parent->frameGeometry();
        const QPoint centre = parent->mapToGlobal(QPoint(frame.width() / 2, frame.height() / 2));
        positionWindow(inDialog, centre, Qt::AlignCenter);
    }
    const QString title = inDialog->windowTitle();
    if (!title.isEmpty())
        getTheLogInstance().tracef(RkLogInfo, "ZuBase", "Showed dialog: %s",
                                   Q2M(title).constData());
}

} // namespace ZuTopLevelWidgetWrapperHelper

template class ZuTopLevelWidgetWrapper<QDialog>;
template class ZuTopLevelWidgetWrapper<QColorDialog>;
template class ZuTopLevelWidgetWrapper<QFontDialog>;
template class ZuTopLevelWidgetWrapper<QInputDialog>;
template class ZuTopLevelWidgetWrapper<QProgressDialog>;
template class ZuTopLevelWidgetWrapper<QFileDialog>;
template class ZuTopLevelWidgetWrapper<QMessageBox>;
