#include "zubase/ZuMessageBox.h"

#include "zubase/ZuApplication.h"

#include <QCoreApplication>
#include <QLabel>
#include <QLayout>
#include <QPushButton>
#include <QScreen>

#include <algorithm>

namespace {

QMessageBox::StandardButton showBox(QMessageBox::Icon inIcon, QWidget* inParent,
                                    const QString& inTitle, const QString& inText,
                                    QMessageBox::StandardButtons inButtons,
                                    QMessageBox::StandardButton inDefaultButton)
{
    ZuMessageBox box(inParent);
    box.setIcon(inIcon);
    box.setWindowTitle(inTitle.isEmpty() ? QCoreApplication::applicationName() : inTitle);
    box.setText(inText);
    box.setStandardButtons(inButtons);
    box.setDefaultButton(inDefaultButton);
    return QMessageBox::StandardButton(box.exec());
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
    if (ZuApplication* app = ZuApplication::instance())
        app->setSplashScreen(nullptr);
    ZuApplication::Busy arrow(false);
    return ZuTopLevelWidgetWrapper<QMessageBox>::exec();
}

QMessageBox::StandardButton ZuMessageBox::critical(QWidget* inParent, const QString& inTitle,
                                                   const QString& inText,
                                                   QMessageBox::StandardButtons inButtons,
                                                   QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Critical, inParent, inTitle, inText, inButtons, inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::critical(const QString& inText,
                                                   QMessageBox::StandardButtons inButtons,
                                                   QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Critical, nullptr, QString(), inText, inButtons, inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::information(QWidget* inParent, const QString& inTitle,
                                                      const QString& inText,
                                                      QMessageBox::StandardButtons inButtons,
                                                      QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Information, inParent, inTitle, inText, inButtons, inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::information(const QString& inText,
                                                      QMessageBox::StandardButtons inButtons,
                                                      QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Information, nullptr, QString(), inText, inButtons,
                   inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::question(QWidget* inParent, const QString& inTitle,
                                                   const QString& inText,
                                                   QMessageBox::StandardButtons inButtons,
                                                   QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Question, inParent, inTitle, inText, inButtons, inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::question(const QString& inText,
                                                   QMessageBox::StandardButtons inButtons,
                                                   QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Question, nullptr, QString(), inText, inButtons, inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::warning(QWidget* inParent, const QString& inTitle,
                                                  const QString& inText,
                                                  QMessageBox::StandardButtons inButtons,
                                                  QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Warning, inParent, inTitle, inText, inButtons, inDefaultButton);
}

QMessageBox::StandardButton ZuMessageBox::warning(const QString& inText,
                                                  QMessageBox::StandardButtons inButtons,
                                                  QMessageBox::StandardButton inDefaultButton)
{
    return showBox(QMessageBox::Warning, nullptr, QString(), inText, inButtons, inDefaultButton);
}

bool ZuMessageBox::overwrite(QWidget* inParent, const QString& inFileName)
{
    ZuMessageBox box(inParent);
    box.setIcon(QMessageBox::Information);
    box.setWindowTitle(QCoreApplication::applicationName());
    box.setText(QCoreApplication::translate("DvMessage", "%1 already exists.").arg(inFileName));
    box.setStandardButtons(QMessageBox::Ok | QMessageBox::Cancel);
    box.setDefaultButton(QMessageBox::Cancel);
    box.button(QMessageBox::Ok)->setText(tr("Overwrite"));
    return box.exec() == QMessageBox::Ok;
}
