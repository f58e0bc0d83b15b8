#include "zubase/ZuPopupMenuComboBox.h"

#include "zubase/ZuOptionsButton.h"
#include "zubase/ZuStyleFactory.h"

#include <QApplication>
#include <QDesktopWidget>
#include <QKeyEvent>
#include <QMenu>
#include <QPointer>

// Also watches the combo box's keys (the keys of a QComboBox that open its list).
class ZuPopupMenuComboBox::Private : public QObject
{
public:
    explicit Private(ZuPopupMenuComboBox* inOwner) : q(inOwner) {}

    bool eventFilter(QObject* inWatched, QEvent* inEvent) override
    {
        if (inWatched == q && inEvent->type() == QEvent::KeyPress) {
            const auto* key = static_cast<QKeyEvent*>(inEvent);
            const Qt::KeyboardModifiers modifiers = key->modifiers() & ~Qt::KeypadModifier;
            if ((key->key() == Qt::Key_Down && modifiers == Qt::AltModifier) ||
                (key->key() == Qt::Key_F4 && modifiers == Qt::NoModifier)) {
                q->popup();
                return true;
            }
        }
        return QObject::eventFilter(inWatched, inEvent);
    }

    ZuPopupMenuComboBox* const q;
    QPointer<QMenu> menu; // may also be owned, and so deleted, by its parent
    ZuOptionsButton* button = nullptr;
    bool hovered = false;
};

ZuPopupMenuComboBox::ZuPopupMenuComboBox(QWidget* inParent, const char* inName)
    : ZuPopupMenuLineEdit(inParent, inName), d(new Private(this))
{
    d->button = new ZuOptionsButton(this);
    d->button->setCursor(Qt::ArrowCursor);
    connect(d->button, SIGNAL(pressed()), this, SLOT(popup()));
    // The button owns its style, so that it does not outlive the button.
    ZuPopupMenuLineEdit::skinify(d->button);
    connect(&ZuStyleFactory::instance(), SIGNAL(paletteChanged()), this, SLOT(paletteChanged()));
    installEventFilter(d.get());
}

ZuPopupMenuComboBox::~ZuPopupMenuComboBox()
{
    delete d->menu;
}

void ZuPopupMenuComboBox::setPopupMenu(QMenu* inMenu)
{
    if (d->menu == inMenu)
        return;
    if (d->menu) {
        disconnect(d->menu, SIGNAL(aboutToHide()), this, SLOT(unsetButton()));
        disconnect(d->menu, SIGNAL(triggered(QAction*)), this, SLOT(emitPopupActivated(QAction*)));
    }
    d->menu = inMenu;
    if (inMenu) {
        connect(inMenu, SIGNAL(triggered(QAction*)), this, SLOT(emitPopupActivated(QAction*)));
        connect(inMenu, SIGNAL(aboutToHide()), this, SLOT(unsetButton()));
    }
}

QMenu* ZuPopupMenuComboBox::popupMenu() const
{
    return d->menu;
}

void ZuPopupMenuComboBox::emitPopupActivated(QAction* inAction)
{
    Q_EMIT popupActivated(inAction);
}

void ZuPopupMenuComboBox::popup()
{
    if (!d->menu || d->menu->isHidden())
        Q_EMIT popupAboutToShow(); // a handler may set the menu now
    if (!d->menu || !d->menu->isHidden())
        return;
    const int menuHeight = d->menu->sizeHint().height();
    QPoint position = mapToGlobal(QPoint(0, height()));
    // The height of the whole virtual desktop, not of the screen the field is on.
    if (position.y() + menuHeight > QApplication::desktop()->height())
        position.setY(mapToGlobal(QPoint(0, 0)).y() - menuHeight);
    d->menu->popup(position);
}

void ZuPopupMenuComboBox::unsetButton()
{
    d->button->setDown(false);
}

void ZuPopupMenuComboBox::paletteChanged()
{
    const QPalette palette = ZuStyleFactory::instance().standardPalette();
    setPalette(palette);
    d->button->setPalette(palette);
    highlight(d->hovered);
}

void ZuPopupMenuComboBox::mousePressEvent(QMouseEvent* inEvent)
{
    if (!isReadOnly()) {
        ZuPopupMenuLineEdit::mousePressEvent(inEvent);
        return;
    }
    d->button->setDown(true);
    if (inEvent->button() == Qt::LeftButton)
        popup();
}

void ZuPopupMenuComboBox::mouseReleaseEvent(QMouseEvent* inEvent)
{
    if (!isReadOnly()) {
        ZuPopupMenuLineEdit::mouseReleaseEvent(inEvent);
        return;
    }
    d->button->setDown(false);
    if (inEvent->button() == Qt::LeftButton && d->menu && !d->menu->isVisible())
        popup();
}

void ZuPopupMenuComboBox::enterEvent(QEvent* inEvent)
{
    d->hovered = true;
    ZuPopupMenuLineEdit::enterEvent(inEvent); // its flag, then highlight(true)
}

void ZuPopupMenuComboBox::leaveEvent(QEvent* inEvent)
{
    ZuPopupMenuLineEdit::leaveEvent(inEvent); // highlight(false), then its flag
    d->hovered = false;
}

void ZuPopupMenuComboBox::resizeEvent(QResizeEvent* inEvent)
{
    const int side = inEvent->size().height();
    d->button->setGeometry(inEvent->size().width() - side, 0, side, side);
    ZuPopupMenuLineEdit::resizeEvent(inEvent);
}

void ZuPopupMenuComboBox::highlight(bool inOn)
{
    ZuPopupMenuLineEdit::highlight(inOn);
    const QColor viewerControl = ZuStyleFactory::instance().userDefinedColor(
        QStringLiteral("ZIVOD_ViewerControl"), QColor());
    QPalette palette = d->button->palette();
    QColor background;
    if (viewerControl.isValid())
        background = inOn ? viewerControl.lighter(130) : viewerControl;
    else
        background =
            this->palette().color(QPalette::Active, inOn ? QPalette::Light : QPalette::Window);
    palette.setBrush(QPalette::All, d->button->backgroundRole(),
                     QBrush(background, Qt::SolidPattern));
    d->button->setPalette(palette);
}
