#include "zubase/ZuQuickSearchWidget.h"

#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLineEdit>
#include <QPointer>
#include <QPushButton>
#include <QTimer>

class ZuQuickSearchWidget::Private : public QObject
{
    Q_OBJECT
public:
    explicit Private(ZuQuickSearchWidget* inOwner);

    void report();

    QPointer<ZuQuickSearchWidget> owner;
    QLineEdit* lineEdit = nullptr; // child of the owner
    QTimer* delayTimer = nullptr;  // child of this part

protected:
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;

private Q_SLOTS:
    void onLineEditChanged(const QString& inText);
    void onClearButton();
    void onDelayTimeout();
};

ZuQuickSearchWidget::Private::Private(ZuQuickSearchWidget* inOwner)
    : owner(inOwner), delayTimer(new QTimer(this))
{
    delayTimer->setSingleShot(true);
    delayTimer->setInterval(400);
    connect(delayTimer, SIGNAL(timeout()), this, SLOT(onDelayTimeout()));
}

void ZuQuickSearchWidget::Private::report()
{
    if (lineEdit && owner)
        Q_EMIT owner->searchStringChanged(lineEdit->text());
}

bool ZuQuickSearchWidget::Private::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    // Escape empties a filled field; in an empty one it stays the window's (closing a dialog).
    const QEvent::Type type = inEvent->type();
    if (inWatched == lineEdit && (type == QEvent::KeyPress || type == QEvent::ShortcutOverride)) {
        auto* key = static_cast<QKeyEvent*>(inEvent);
        if (key->key() == Qt::Key_Escape && key->modifiers() == Qt::NoModifier &&
            !lineEdit->text().isEmpty()) {
            if (type == QEvent::ShortcutOverride) {
                key->accept(); // the field, not a window shortcut, gets this Escape
                return false;
            }
            onClearButton();
            return true;
        }
    }
    return QObject::eventFilter(inWatched, inEvent);
}

void ZuQuickSearchWidget::Private::onLineEditChanged(const QString&)
{
    if (delayTimer->interval() < 1)
        report();
    else
        delayTimer->start(); // restarts a running wait
}

void ZuQuickSearchWidget::Private::onClearButton()
{
    lineEdit->clear();
    report();
}

void ZuQuickSearchWidget::Private::onDelayTimeout()
{
    report();
}

ZuQuickSearchWidget::ZuQuickSearchWidget(QWidget* inParent)
    : QWidget(inParent, Qt::WindowFlags()), d(new Private(this))
{
    d->lineEdit = new QLineEdit(this);
    d->lineEdit->setPlaceholderText(tr("Enter Search Filter"));
    // The placeholder is gone once something is typed; the name stays for a screen reader.
    d->lineEdit->setAccessibleName(tr("Search filter"));
    d->lineEdit->installEventFilter(d.get());
    auto* clearButton = new QPushButton(tr("Clear"), this);
    auto* layout = new QHBoxLayout;
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(d->lineEdit);
    layout->addWidget(clearButton);
    setLayout(layout);
    connect(d->lineEdit, SIGNAL(textEdited(const QString&)), d.get(),
            SLOT(onLineEditChanged(const QString&)));
    connect(clearButton, SIGNAL(pressed()), d.get(), SLOT(onClearButton()));
}

ZuQuickSearchWidget::~ZuQuickSearchWidget() = default;

int ZuQuickSearchWidget::searchDelay() const
{
    return d->delayTimer->interval();
}

void ZuQuickSearchWidget::setSearchDelay(int inMilliseconds)
{
    d->delayTimer->setInterval(inMilliseconds);
}

#include "ZuQuickSearchWidget.moc"
