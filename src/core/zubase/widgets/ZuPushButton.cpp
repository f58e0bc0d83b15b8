#include "zubase/ZuPushButton.h"

#include <QCursor>
#include <QKeyEvent>
#include <QPointer>
#include <QTimer>

// Owned by the button (and with it its timer), so neither outlives the button.
class ZuPushButton::Private : public QObject
{
    Q_OBJECT
public:
    explicit Private(ZuPushButton* inButton);

    void setDelay(int inMilliseconds);

    QPointer<QTimer> menuTimer; // null while the delayed menu is off
    QPointer<ZuPushButton> button;

protected:
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;

private Q_SLOTS:
    void onClicked(bool inChecked);
    void onPressed();
    void onReleased();
    void onToggled(bool inChecked);
    void onMenuTimer();
};

ZuPushButton::Private::Private(ZuPushButton* inButton) : button(inButton)
{
    setDelay(1000);
    connect(inButton, SIGNAL(clicked(bool)), this, SLOT(onClicked(bool)));
    connect(inButton, SIGNAL(pressed()), this, SLOT(onPressed()));
    connect(inButton, SIGNAL(released()), this, SLOT(onReleased()));
    connect(inButton, SIGNAL(toggled(bool)), this, SLOT(onToggled(bool)));
    inButton->installEventFilter(this);
}

void ZuPushButton::Private::setDelay(int inMilliseconds)
{
    if (inMilliseconds > 0) {
        if (!menuTimer) {
            menuTimer = new QTimer(this);
            menuTimer->setSingleShot(true);
            // A coarse timer may run out up to 5 % early, and a long press is measured in
            // whole milliseconds by the user's finger, not by the system's convenience.
            menuTimer->setTimerType(Qt::PreciseTimer);
            connect(menuTimer, SIGNAL(timeout()), this, SLOT(onMenuTimer()));
        }
        menuTimer->setInterval(inMilliseconds);
    } else if (menuTimer) {
        delete menuTimer;
    }
}

bool ZuPushButton::Private::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    if (inEvent->type() == QEvent::KeyPress && inWatched == button && menuTimer) {
        const auto* key = static_cast<QKeyEvent*>(inEvent);
        const bool menuKey = key->key() == Qt::Key_Menu && key->modifiers() == Qt::NoModifier;
        const bool shiftF10 = key->key() == Qt::Key_F10 && key->modifiers() == Qt::ShiftModifier;
        if (menuKey || shiftF10) {
            menuTimer->stop();
            Q_EMIT button->delayedPopupMenuRequested(button->mapToGlobal(button->rect().center()));
            return true;
        }
    }
    return QObject::eventFilter(inWatched, inEvent);
}

void ZuPushButton::Private::onClicked(bool)
{
    if (menuTimer)
        menuTimer->stop();
}

void ZuPushButton::Private::onPressed()
{
    if (menuTimer)
        menuTimer->start();
}

void ZuPushButton::Private::onReleased()
{
    if (menuTimer)
        menuTimer->stop();
}

void ZuPushButton::Private::onToggled(bool)
{
    if (menuTimer)
        menuTimer->stop();
}

void ZuPushButton::Private::onMenuTimer()
{
    if (!button)
        return;
    // Once up, the real release that follows produces no click.
    if (button->isDown()) {
        button->setDown(false);
        Q_EMIT button->released();
    }
    Q_EMIT button->delayedPopupMenuRequested(QCursor::pos());
}

ZuPushButton::ZuPushButton(QWidget* inParent) : QPushButton(inParent), d(new Private(this)) {}

ZuPushButton::~ZuPushButton() = default;

void ZuPushButton::setPopupMenuDelay(int inMilliseconds)
{
    d->setDelay(inMilliseconds);
}

#include "ZuPushButton.moc"
