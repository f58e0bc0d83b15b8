#include "zubase/ZuCheckBox.h"

#include <QCheckBox>
#include <QEvent>
#include <QHBoxLayout>
#include <QLabel>
#include <QTextDocument>

// The label beside a ZuCheckBox: any mouse button on it works the box.
class CheckBoxLabel : public QLabel
{
public:
    CheckBoxLabel(const QString& inText, QCheckBox* inCheckBox, QWidget* inParent)
        : QLabel(inText, inParent), mCheckBox(inCheckBox)
    {}
    ~CheckBoxLabel() override = default;

protected:
    void mousePressEvent(QMouseEvent*) override { mCheckBox->setDown(true); }
    // Clicks even when the pointer has left the label, like the box's own text did.
    void mouseReleaseEvent(QMouseEvent*) override
    {
        mCheckBox->setDown(false);
        mCheckBox->click();
    }

private:
    QCheckBox* mCheckBox;
};

// Keeps the box's accessible name on the label's text: the box's own text is a blank, which a
// screen reader would read as the whole name. The label has no signal for a new text, but a new
// text is repainted, and a box that gets the focus is read at once.
class ZuCheckBox::Private : public QObject
{
public:
    QCheckBox* checkBox = nullptr;
    CheckBoxLabel* label = nullptr;
    QString nameSet; // the last name given here; a name the caller chose is kept

    void syncAccessibleName();
    bool eventFilter(QObject* inWatched, QEvent* inEvent) override;
};

namespace {

QString plainText(const QLabel& inLabel)
{
    QString text = inLabel.text();
    const Qt::TextFormat format = inLabel.textFormat();
    if (format == Qt::RichText || (format == Qt::AutoText && Qt::mightBeRichText(text))) {
        QTextDocument document;
        document.setHtml(text);
        return document.toPlainText().simplified();
    }
    // With the box as buddy a single '&' marks the mnemonic and is not shown.
    text.replace(QLatin1String("&&"), QStringLiteral("\x01"));
    text.remove(QLatin1Char('&'));
    text.replace(QLatin1Char('\x01'), QLatin1Char('&'));
    return text.simplified();
}

} // namespace

void ZuCheckBox::Private::syncAccessibleName()
{
    if (checkBox->accessibleName() != nameSet)
        return;
    const QString name = plainText(*label);
    if (name == nameSet)
        return;
    nameSet = name;
    checkBox->setAccessibleName(name);
}

bool ZuCheckBox::Private::eventFilter(QObject* inWatched, QEvent* inEvent)
{
    if ((inWatched == label && inEvent->type() == QEvent::Paint) ||
        (inWatched == checkBox && inEvent->type() == QEvent::FocusIn))
        syncAccessibleName();
    return false;
}

ZuCheckBox::ZuCheckBox(const QString& inText, QWidget* inParent) : QWidget(inParent), d(new Private)
{
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::MinimumExpanding);
    auto* layout = new QHBoxLayout(this);
    d->checkBox = new QCheckBox(QStringLiteral(" "), this);
    d->label = new CheckBoxLabel(inText, d->checkBox, this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    layout->addWidget(d->checkBox, 0);
    layout->addWidget(d->label, 1);
    layout->addStretch(0);

    d->label->setBuddy(d->checkBox);
    d->syncAccessibleName();
    d->label->installEventFilter(d.get());
    d->checkBox->installEventFilter(d.get());
}

ZuCheckBox::ZuCheckBox(QWidget* inParent) : ZuCheckBox(QString(), inParent) {}

ZuCheckBox::~ZuCheckBox() = default;

QCheckBox* ZuCheckBox::checkBox()
{
    return d->checkBox;
}

const QCheckBox* ZuCheckBox::checkBox() const
{
    return d->checkBox;
}

QLabel* ZuCheckBox::label()
{
    return d->label;
}

const QLabel* ZuCheckBox::label() const
{
    return d->label;
}

QSize ZuCheckBox::sizeHint() const
{
    const QSize box = d->checkBox->sizeHint();
    const QSize text = d->label->sizeHint();
    return QSize(box.width() + text.width(), qMax(box.height(), text.height()));
}

QSize ZuCheckBox::minimumSizeHint() const
{
    const QSize box = d->checkBox->minimumSizeHint();
    const QSize text = d->label->minimumSizeHint();
    return QSize(box.width() + text.width(), qMax(box.height(), text.height()));
}
