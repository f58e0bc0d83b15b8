#include "zubase/ZuMessageBox.h"

#include "zubase/ZuApplication.h"
#include "zubase/dialogs/ZuTopLevelWidgetWrapper_p.h"

#include <QCoreApplication>
#include <QLabel>
#include <QLayout>
#include <QPushButton>
#include <QScreen>
#include <QSplashScreen>

#include <algorithm>

namespace {

void setUpBox(ZuMessageBox* inBox, QMessageBox::Icon inIcon, const QString& inTitle,
              const QString& inText, QMessageBox::StandardButtons inButtons,
              QMessageBox::StandardButton inDefaultButton)
{
    inBox->setIcon(inIcon);
    inBox->setWindowTitle(inTitle.isEmpty() ? QCoreApplication::applicationName() : inTitle);
    inBox->setText(inText);
    inBox->setStandardButtons(inButtons);
    inBox->setDefaultButton(inDefaultButton);
}

QMessageBox::StandardButton showBox(QMessageBox::Icon inIcon, QWidget* inParent,
                                    const QString& inTitle, const QString& inText,
                                    QMessageBox::StandardButtons inButtons,
                                    QMessageBox::StandardButton inDefaultButton)
{
    ZuDialogHolder<ZuMessageBox> box(new ZuMessageBox(inParent));
    setUpBox(box.get(), inIcon, inTitle, inText, inButtons, inDefaultButton);
    const int result = box->exec();
    // Gone with its parent window while it ran: as if closed without an answer.
    return box.alive() ? QMessageBox::StandardButton(result) : QMessageBox::NoButton;
}

} // namespace

ZuMessageBox::ZuMessageBox(QWidget* inParent) : ZuTopLevelWidgetWrapper<QMessageBox>(inParent)
{
    setWindowFlags(windowFlags() | Qt::WindowStaysOnTopHint);
}

ZuMessageBox::~ZuMessageBox() = default;

QLabel* ZuMessageBox::findLabel() const
{
    return findChild<QLabel*>(QStringLiteral("qt_msgbox_label"));
}

void ZuMessageBox::setVisible(bool inVisible)
{
    if (inVisible && !testAttribute(Qt::WA_DontShowOnScreen)) {
        // Long texts: keep the box within half the work area, and within 1000 pixels.
        if (QLabel* label = findLabel()) {
            QWidget* reference = parentWidget() ? parentWidget() : this;
            QScreen* screen = reference->screen();
            const QRect available = screen ? screen->availableGeometry() : QRect();
            const int w = available.right() - available.left();
            label->setWordWrap(false);
            label->setMinimumWidth(0);
            int total = 0;
            if (QLayout* boxLayout = layout()) {
                boxLayout->activate();
                total = boxLayout->totalMinimumSize().width();
            }
            const int limit = std::min({(w + 1) / 2, w - 479, 1000});
            int minimum = label->sizeHint().width();
            if (total > limit)
                minimum -= total - limit;
            label->setMinimumWidth(minimum);
        }
    }
    ZuTopLevelWidgetWrapper<QMessageBox>::setVisible(inVisible);
}

int ZuMessageBox::exec()
{
    if (ZuApplication* app = ZuApplication::instance()) {
        // A box below a splash screen (its parent, or the default parent during start-up) would
        // be deleted with it; it moves off the splash first, as a window of its own.
        for (QWidget* ancestor = parentWidget(); ancestor; ancestor = ancestor->parentWidget()) {
            if (qobject_cast<QSplashScreen*>(ancestor)) {
                setParent(ancestor->parentWidget(), windowFlags());
                break;
            }
        }
        app->setSplashScreen(nullptr);
    }
    ZuApplication::Busy arrow(false);
    return ZuTopLevelWidgetWrapper<QMessageBox>::exec();
}

// Both forms of one box kind; the form without a parent takes the default parent and the
// application name as title.
#define ZU_MESSAGEBOX_KIND(inName, inIcon)                                                         \
    QMessageBox::StandardButton ZuMessageBox::inName(                                              \
        QWidget* inParent, const QString& inTitle, const QString& inText,                          \
        QMessageBox::StandardButtons inButtons, QMessageBox::StandardButton inDefaultButton)       \
    {                                                                                              \
        return showBox(inIcon, inParent, inTitle, inText, inButtons, inDefaultButton);             \
    }                                                                                              \
    QMessageBox::StandardButton ZuMessageBox::inName(const QString& inText,                        \
                                                     QMessageBox::StandardButtons inButtons,       \
                                                     QMessageBox::StandardButton inDefaultButton)  \
    {                                                                                              \
        return showBox(inIcon, nullptr, QString(), inText, inButtons, inDefaultButton);            \
    }

ZU_MESSAGEBOX_KIND(critical, QMessageBox::Critical)
ZU_MESSAGEBOX_KIND(information, QMessageBox::Information)
ZU_MESSAGEBOX_KIND(question, QMessageBox::Question)
ZU_MESSAGEBOX_KIND(warning, QMessageBox::Warning)

#undef ZU_MESSAGEBOX_KIND

bool ZuMessageBox::overwrite(QWidget* inParent, const QString& inFileName)
{
    ZuDialogHolder<ZuMessageBox> box(new ZuMessageBox(inParent));
    setUpBox(box.get(), QMessageBox::Information, QString(),
             QCoreApplication::translate("DvMessage", "%1 already exists.").arg(inFileName),
             QMessageBox::Ok | QMessageBox::Cancel, QMessageBox::Cancel);
    box->button(QMessageBox::Ok)->setText(tr("Overwrite"));
    return box->exec() == QMessageBox::Ok && box.alive();
}
