#include "zubase/ZuPopupMenuLineEdit.h"

#include "zubase/ZuStyle.h"
#include "zubase/ZuStyleFactory.h"

#include <QKeyEvent>
#include <QStyle>
#include <QToolButton>

namespace {

const QString kViewerControl = QStringLiteral("ZIVOD_ViewerControl");
const QString kWhite = QStringLiteral("ZIVOD_White");

void setRoleColor(QPalette& ioPalette, QPalette::ColorRole inRole, const QColor& inColor)
{
    ioPalette.setBrush(QPalette::All, inRole, QBrush(inColor, Qt::SolidPattern));
}

} // namespace

class ZuPopupMenuLineEdit::Private
{
public:
    bool inFocusOut = false; // also set while a context-menu event is handled
    bool hovered = false;
};

ZuPopupMenuLineEdit::ZuPopupMenuLineEdit(QWidget* inParent, const char* inName)
    : QLineEdit(inParent), d(new Private)
{
    setObjectName(QString::fromLatin1(inName));
    setAcceptDrops(false);
    setContextMenuPolicy(Qt::NoContextMenu);
    skinify(this);
    connect(this, SIGNAL(returnPressed()), this, SLOT(acceptText()));
    connect(&ZuStyleFactory::instance(), SIGNAL(paletteChanged()), this, SLOT(paletteChanged()));
}

ZuPopupMenuLineEdit::~ZuPopupMenuLineEdit() = default;

void ZuPopupMenuLineEdit::acceptText()
{
    Q_EMIT textAccepted(text());
}

void ZuPopupMenuLineEdit::paletteChanged()
{
    QPalette palette = ZuStyleFactory::instance().standardPalette();
    setRoleColor(palette, backgroundRole(), palette.color(QPalette::Active, QPalette::Window));
    setPalette(palette);
    highlight(d->hovered);
}

void ZuPopupMenuLineEdit::activateEditing()
{
    Q_EMIT startEditingAtPosition(cursorPosition());
    setFocus(Qt::MouseFocusReason);
}

void ZuPopupMenuLineEdit::skinify(QLineEdit* inLineEdit)
{
    if (!inLineEdit)
        return;
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QPalette palette = inLineEdit->palette();
    setRoleColor(
        palette, inLineEdit->foregroundRole(),
        factory.userDefinedColor(kWhite, palette.color(QPalette::Active, QPalette::WindowText)));
    setRoleColor(palette, inLineEdit->backgroundRole(),
                 factory.userDefinedColor(kViewerControl,
                                          palette.color(QPalette::Active, QPalette::Window)));
    inLineEdit->setPalette(palette);
    inLineEdit->setFrame(false);
    inLineEdit->setDragEnabled(false);
}

void ZuPopupMenuLineEdit::skinify(QToolButton* inButton)
{
    if (!inButton)
        return;
    // A style of ours the button already owns is kept: calls must not pile up styles.
    QStyle* current = inButton->style();
    if (current->parent() != inButton || !dynamic_cast<ZuStyle*>(current)) {
        QStyle* style = ZuStyleFactory::instance().createStyleFromClass(QStringLiteral("ZuStyle"));
        style->setParent(inButton); // widgets do not own their style
        inButton->setStyle(style);
    }
    inButton->setAutoRaise(true);
}

bool ZuPopupMenuLineEdit::event(QEvent* inEvent)
{
    if (inEvent->type() == QEvent::KeyPress &&
        static_cast<QKeyEvent*>(inEvent)->key() == Qt::Key_Tab) {
        // Tab accepts the text and keeps the focus here.
        Q_EMIT returnPressed();
        return true;
    }
    if (inEvent->type() == QEvent::ContextMenu) {
        const bool wasGuarded = d->inFocusOut;
        d->inFocusOut = true;
        const bool handled = QLineEdit::event(inEvent);
        d->inFocusOut = wasGuarded;
        return handled;
    }
    return QLineEdit::event(inEvent);
}

void ZuPopupMenuLineEdit::mousePressEvent(QMouseEvent* inEvent)
{
    QLineEdit::mousePressEvent(inEvent);
    Q_EMIT startEditingAtPosition(cursorPosition());
    setFocus(Qt::MouseFocusReason);
}

void ZuPopupMenuLineEdit::focusOutEvent(QFocusEvent* inEvent)
{
    if (d->inFocusOut) {
        QLineEdit::focusOutEvent(inEvent);
        return;
    }
    d->inFocusOut = true;
    Q_EMIT returnPressed();
    QLineEdit::focusOutEvent(inEvent);
    d->inFocusOut = false;
}

void ZuPopupMenuLineEdit::enterEvent(QEvent* inEvent)
{
    d->hovered = true;
    highlight(true);
    QLineEdit::enterEvent(inEvent);
}

void ZuPopupMenuLineEdit::leaveEvent(QEvent* inEvent)
{
    highlight(false);
    d->hovered = false;
    QLineEdit::leaveEvent(inEvent);
}

void ZuPopupMenuLineEdit::highlight(bool inOn)
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    const QColor viewerControl = factory.userDefinedColor(kViewerControl, QColor());
    QPalette palette = this->palette();
    if (viewerControl.isValid()) {
        // A scheme with the background but without the text colour keeps the palette's text
        // colour rather than an invalid one, which would paint black on the viewer colour.
        setRoleColor(palette, foregroundRole(),
                     factory.userDefinedColor(
                         kWhite, palette.color(QPalette::Active, QPalette::WindowText)));
        setRoleColor(palette, backgroundRole(), inOn ? viewerControl.lighter(130) : viewerControl);
    } else {
        setRoleColor(palette, foregroundRole(),
                     palette.color(QPalette::Active, QPalette::WindowText));
        setRoleColor(palette, backgroundRole(),
                     palette.color(QPalette::Active, inOn ? QPalette::Light : QPalette::Window));
    }
    setPalette(palette);
}
