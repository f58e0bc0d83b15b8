#include "zubase/ZuStyle.h"

#include <QAbstractButton>
#include <QApplication>
#include <QIcon>
#include <QImage>
#include <QLinearGradient>
#include <QPainter>
#include <QPixmapCache>
#include <QStyleFactory>
#include <QStyleOption>
#include <QTabBar>

// The resource tree must be registered also where the library's objects come from a static
// archive, which drops the initialiser nobody references.
static void registerZuBaseResources()
{
    Q_INIT_RESOURCE(zubase);
}

namespace {

float unitScaling(const QWidget*)
{
    return 1.0f;
}

// Shared by every ZuStyle of the process.
struct StyleState
{
    QIcon checkDark;  // for light backgrounds
    QIcon checkLight; // for dark backgrounds and menu items
    QIcon radioDot;
    ZuStyle::IconScalingFunction scaling = &unitScaling;
    int menuIconSize = 32; // of the menu most recently measured or drawn
};

StyleState& state()
{
    static StyleState* sState = new StyleState; // lives until the process ends
    return *sState;
}

// The check mark shows only in the On state: its Off state is a blank image of the same size,
// so painting the icon with the box's state never shows a mark in an unchecked box.
QIcon makeCheckMark(const QString& inPath)
{
    const QPixmap mark(inPath);
    QIcon icon;
    if (mark.isNull())
        return icon;
    icon.addPixmap(mark, QIcon::Normal, QIcon::On);
    QPixmap blank(mark.size());
    blank.fill(Qt::transparent);
    icon.addPixmap(blank, QIcon::Normal, QIcon::Off);
    return icon;
}

QStyle* createBaseStyle()
{
    if (QStyle* cleanlooks = QStyleFactory::create(QStringLiteral("Cleanlooks")))
        return cleanlooks;
    return QStyleFactory::create(QStringLiteral("Fusion"));
}

bool isLight(const QColor& inColor)
{
    return inColor.value() > 128;
}

bool isLargeIconMenu(const QWidget* inWidget)
{
    return dynamic_cast<const ZuStyle::QLargeIconMenu*>(inWidget) != nullptr;
}

int largeIconSize(const QWidget* inWidget)
{
    return static_cast<int>(32.0 * state().scaling(inWidget));
}

// Tabs are sized with the bar's font; a label drawn bold needs the extra width of bold text.
// The option names no index: the tab is the one under its rectangle from the last layout, or,
// for a tab not laid out yet, the first one with this text.
int boldTabExtraWidth(const QStyleOption* inOption, const QWidget* inWidget)
{
    const auto* tabBar = qobject_cast<const QTabBar*>(inWidget);
    const auto* tab = qstyleoption_cast<const QStyleOptionTab*>(inOption);
    if (!tabBar || !tab || tab->text.isEmpty())
        return 0;
    int index = tab->rect.isValid() ? tabBar->tabAt(tab->rect.center()) : -1;
    if (index < 0 || tabBar->tabText(index) != tab->text) {
        index = -1;
        for (int i = 0; i < tabBar->count() && index < 0; ++i) {
            if (tabBar->tabText(i) == tab->text)
                index = i;
        }
    }
    if (index < 0 || !tabBar->tabData(index).toBool())
        return 0;
    QFont bold = tabBar->font();
    bold.setWeight(75);
    const int extra = QFontMetrics(bold).horizontalAdvance(tab->text) -
                      tabBar->fontMetrics().horizontalAdvance(tab->text);
    return qMax(0, extra);
}

bool hasTabButtons(const QStyleOption* inOption)
{
    const auto* tab = qstyleoption_cast<const QStyleOptionTab*>(inOption);
    if (!tab || tab->version < 3)
        return false;
    auto atLeastOne = [](const QSize& size) {
        return size.width() >= 1 && size.height() >= 1;
    };
    return atLeastOne(tab->leftButtonSize) || atLeastOne(tab->rightButtonSize);
}

// Check box and radio button indicators: a Dark frame around Base, or around Button while
// pressed. Saves the painter; the caller restores it.
void beginIndicator(QPainter* inPainter, const QStyleOption* inOption, bool inAntialiased)
{
    inPainter->save();
    inPainter->setRenderHint(QPainter::Antialiasing, inAntialiased);
    const bool pressed =
        (inOption->state & QStyle::State_Sunken) && (inOption->state & QStyle::State_Enabled);
    inPainter->setPen(inOption->palette.color(QPalette::Dark));
    inPainter->setBrush(inOption->palette.brush(pressed ? QPalette::Button : QPalette::Base));
}

} // namespace

ZuStyle::QLargeIconMenu::QLargeIconMenu(QWidget* inParent) : QMenu(inParent) {}

ZuStyle::QLargeIconMenu::QLargeIconMenu(const QString& inTitle, QWidget* inParent)
    : QMenu(inTitle, inParent)
{}

ZuStyle::QLargeIconMenu::~QLargeIconMenu() = default;

ZuStyle::ZuStyle() : QProxyStyle(createBaseStyle())
{
    registerZuBaseResources();
    StyleState& s = state();
    if (s.checkDark.isNull())
        s.checkDark = makeCheckMark(QStringLiteral(":/CheckBoxCheckBlack"));
    if (s.checkLight.isNull())
        s.checkLight = makeCheckMark(QStringLiteral(":/CheckBoxCheckWhite"));
    if (s.radioDot.isNull())
        s.radioDot = QIcon(QStringLiteral(":/RadioBoxCheck"));
}

ZuStyle::~ZuStyle() = default;

void ZuStyle::setIconScalingFunction(IconScalingFunction inFunction)
{
    state().scaling = inFunction ? inFunction : &unitScaling;
}

void ZuStyle::polish(QApplication*)
{
    QPixmapCache::clear();
}

QStyle* ZuStyle::innerStyle() const
{
    QStyle* base = baseStyle();
    if (auto* proxyBase = qobject_cast<QProxyStyle*>(base))
        return proxyBase->baseStyle();
    return base;
}

QString ZuStyle::pixmapCacheKey(const QString& inBaseKey, const QStyleOption* inOption,
                                const QSize& inPixmapSize)
{
    QString key = QString::asprintf(
        "%s-%d-%d-%lld-%dx%d", inBaseKey.toLatin1().constData(), static_cast<int>(inOption->state),
        static_cast<int>(inOption->direction), static_cast<long long>(inOption->palette.cacheKey()),
        inPixmapSize.width(), inPixmapSize.height());
    if (const auto* spin = qstyleoption_cast<const QStyleOptionSpinBox*>(inOption)) {
        key += QLatin1Char('-') + QString::number(spin->buttonSymbols) + QLatin1Char('-') +
               QString::number(static_cast<int>(spin->stepEnabled)) + QLatin1Char('-') +
               QLatin1Char(spin->frame ? '1' : '0');
    }
    return key;
}

int ZuStyle::pixelMetric(PixelMetric inMetric, const QStyleOption* inOption,
                         const QWidget* inWidget) const
{
    switch (inMetric) {
    case PM_TabBarTabHSpace:
        if (hasTabButtons(inOption))
            return 8;
        break;
    case PM_TabBarTabVSpace:
        if (hasTabButtons(inOption))
            return 4;
        break;
    case PM_ToolBarIconSize:
        return 32;
    case PM_SmallIconSize:
        if (!inWidget)
            return state().menuIconSize;
        if (isLargeIconMenu(inWidget)) {
            state().menuIconSize = largeIconSize(inWidget);
            return state().menuIconSize;
        }
        return 16;
    default:
        break;
    }
    return QProxyStyle::pixelMetric(inMetric, inOption, inWidget);
}

QSize ZuStyle::sizeFromContents(ContentsType inType, const QStyleOption* inOption,
                                const QSize& inContentsSize, const QWidget* inWidget) const
{
    // The base measures the item's icon with PM_SmallIconSize without a widget, i.e. with the
    // current menu icon size set here.
    if (inType == CT_MenuItem)
        state().menuIconSize = isLargeIconMenu(inWidget) ? largeIconSize(inWidget) : 16;
    QSize size = QProxyStyle::sizeFromContents(inType, inOption, inContentsSize, inWidget);
    if (inType == CT_TabBarTab)
        size.rwidth() += boldTabExtraWidth(inOption, inWidget);
    return size;
}

QRect ZuStyle::subElementRect(SubElement inElement, const QStyleOption* inOption,
                              const QWidget* inWidget) const
{
    QRect rect = QProxyStyle::subElementRect(inElement, inOption, inWidget);
    if (inElement == SE_TabBarTabText && hasTabButtons(inOption)) {
        // Cleanlooks lays the text out with its own, wider tab spacing; Fusion asks this style.
        // The padding the base really used shows on a plain tab with a button on the right,
        // whose text starts and ends one padding inside the tab.
        QStyleOptionTab probe;
        probe.rect = QRect(0, 0, 200, 40);
        probe.rightButtonSize = QSize(1, 1);
        const QRect used = baseStyle()->subElementRect(SE_TabBarTabText, &probe, inWidget);
        const int dh = used.left() - pixelMetric(PM_TabBarTabHSpace, &probe, inWidget) / 2;
        const int dv = used.bottom() - probe.rect.bottom() -
                       pixelMetric(PM_TabBarTabVSpace, &probe, inWidget) / 2;
        // Vertical tabs too: Qt gives their rectangle in the tab's rotated frame.
        rect.adjust(-dh, dv, dh, -dv);
    }
    return rect;
}

int ZuStyle::styleHint(StyleHint inHint, const QStyleOption* inOption, const QWidget* inWidget,
                       QStyleHintReturn* outReturnData) const
{
    switch (inHint) {
    case SH_DialogButtonLayout:
        return 0; // QDialogButtonBox::WinLayout
    case SH_DialogButtonBox_ButtonsHaveIcons:
        return 0;
    default:
        return QProxyStyle::styleHint(inHint, inOption, inWidget, outReturnData);
    }
}

QStyle::SubControl ZuStyle::hitTestComplexControl(ComplexControl inControl,
                                                  const QStyleOptionComplex* inOption,
                                                  const QPoint& inPos,
                                                  const QWidget* inWidget) const
{
    if (inControl == CC_TitleBar)
        return SC_TitleBarLabel;
    return QProxyStyle::hitTestComplexControl(inControl, inOption, inPos, inWidget);
}

void ZuStyle::drawComplexControl(ComplexControl inControl, const QStyleOptionComplex* inOption,
                                 QPainter* inPainter, const QWidget* inWidget) const
{
    QProxyStyle::drawComplexControl(inControl, inOption, inPainter, inWidget);
}

QPixmap ZuStyle::generatedIconPixmap(QIcon::Mode inIconMode, const QPixmap& inPixmap,
                                     const QStyleOption* inOption) const
{
    const QPalette palette = inOption ? inOption->palette : QGuiApplication::palette();
    if (inIconMode != QIcon::Disabled || isLight(palette.color(QPalette::Base)))
        return QProxyStyle::generatedIconPixmap(inIconMode, inPixmap, inOption);

    // Dark scheme: a flat grey that stays readable on the dark background; the lightness comes
    // from the button colour. Very light buttons would push it past 8 bits, so it is clamped.
    QImage image = inPixmap.toImage().convertToFormat(QImage::Format_ARGB32);
    const QColor button = QGuiApplication::palette().color(QPalette::Active, QPalette::Button);
    const int base = (button.red() + button.green() + button.blue()) / 3;
    for (int y = 0; y < image.height(); ++y) {
        auto* line = reinterpret_cast<QRgb*>(image.scanLine(y));
        for (int x = 0; x < image.width(); ++x) {
            const QRgb pixel = line[x];
            const int grey = qMin(255, (qRed(pixel) + qGreen(pixel) + qBlue(pixel)) / 15 + base);
            line[x] = qRgba(grey, grey, grey, qAlpha(pixel));
        }
    }
    QPixmap result = QPixmap::fromImage(image);
    result.setDevicePixelRatio(inPixmap.devicePixelRatio());
    return result;
}

void ZuStyle::drawPrimitive(PrimitiveElement inElement, const QStyleOption* inOption,
                            QPainter* inPainter, const QWidget* inWidget) const
{
    const QRect r = inOption->rect;
    const QPalette& pal = inOption->palette;
    const bool enabled = inOption->state & State_Enabled;

    switch (inElement) {
    case PE_FrameTabWidget: {
        inPainter->save();
        inPainter->setPen(pal.color(QPalette::Dark));
        inPainter->setBrush(Qt::NoBrush);
        inPainter->drawRect(r.adjusted(0, 0, -1, -1));
        inPainter->setPen(pal.color(QPalette::Light));
        inPainter->drawLine(r.left() + 1, r.top() + 1, r.right() - 1, r.top() + 1);
        inPainter->drawLine(r.left() + 1, r.top() + 1, r.left() + 1, r.bottom() - 1);
        inPainter->restore();
        return;
    }
    case PE_PanelButtonCommand: {
        const auto* button = qstyleoption_cast<const QStyleOptionButton*>(inOption);
        const bool isDefault = button && (button->features & QStyleOptionButton::DefaultButton);
        const qreal ratio = inPainter->device() ? inPainter->device()->devicePixelRatioF() : 1.0;
        const QSize pixmapSize = r.size() * ratio;
        if (pixmapSize.isEmpty())
            return;
        const QString key = pixmapCacheKey(QStringLiteral("pushbutton-%1").arg(isDefault ? 1 : 0),
                                           inOption, pixmapSize);
        QPixmap panel;
        if (!QPixmapCache::find(key, &panel)) {
            panel = QPixmap(pixmapSize);
            panel.setDevicePixelRatio(ratio);
            panel.fill(Qt::transparent);
            QPainter panelPainter(&panel);
            drawButtonPanel(&panelPainter, QRect(QPoint(0, 0), r.size()), inOption, isDefault);
            panelPainter.end();
            QPixmapCache::insert(key, panel);
        }
        inPainter->drawPixmap(r.topLeft(), panel);
        return;
    }
    case PE_IndicatorBranch: {
        if (!(inOption->state & State_Children))
            break;
        int side = qMin(r.width(), r.height()) - 6;
        side |= 1;
        side = qMax(side, 9);
        QRect box(0, 0, side, side);
        box.moveCenter(r.center());
        inPainter->save();
        inPainter->setRenderHint(QPainter::Antialiasing, false);
        inPainter->setBrush(Qt::NoBrush);
        inPainter->setPen(pal.color(QPalette::Dark));
        inPainter->drawRect(box.adjusted(0, 0, -1, -1));
        inPainter->setPen(pal.color(QPalette::Text));
        const int midY = box.top() + side / 2;
        const int midX = box.left() + side / 2;
        inPainter->drawLine(box.left() + 2, midY, box.right() - 2, midY);
        if (!(inOption->state & State_Open))
            inPainter->drawLine(midX, box.top() + 2, midX, box.bottom() - 2);
        inPainter->restore();
        return;
    }
    case PE_IndicatorCheckBox: {
        beginIndicator(inPainter, inOption, false);
        inPainter->drawRect(r.adjusted(0, 0, -1, -1));
        if (inOption->state & State_NoChange) {
            inPainter->fillRect(r.adjusted(3, r.height() / 2 - 1, -3, -(r.height() / 2 - 1)),
                                pal.brush(QPalette::Text));
        }
        const QIcon& mark =
            isLight(pal.color(QPalette::Base)) ? state().checkDark : state().checkLight;
        mark.paint(inPainter, r.adjusted(1, 1, -1, -1), Qt::AlignCenter,
                   enabled ? QIcon::Normal : QIcon::Disabled,
                   (inOption->state & State_On) ? QIcon::On : QIcon::Off);
        inPainter->restore();
        return;
    }
    case PE_IndicatorRadioButton: {
        beginIndicator(inPainter, inOption, true);
        inPainter->drawEllipse(QRectF(r).adjusted(0.5, 0.5, -0.5, -0.5));
        if (inOption->state & State_On)
            state().radioDot.paint(inPainter, r, Qt::AlignCenter, QIcon::Normal, QIcon::Off);
        inPainter->restore();
        return;
    }
    default:
        break;
    }
    QProxyStyle::drawPrimitive(inElement, inOption, inPainter, inWidget);
}

void ZuStyle::drawButtonPanel(QPainter* inPainter, const QRect& inRect,
                              const QStyleOption* inOption, bool inDefault) const
{
    const QPalette& pal = inOption->palette;
    const bool enabled = inOption->state & State_Enabled;
    const bool pressed = inOption->state & (State_Sunken | State_On);
    const bool hover = (inOption->state & State_MouseOver) && enabled;

    QColor button = pal.color(QPalette::Button);
    if (hover && !pressed)
        button = button.lighter(106);
    const QRectF frame = QRectF(inRect).adjusted(0.5, 0.5, -0.5, -0.5);
    QLinearGradient gradient(frame.topLeft(), frame.bottomLeft());
    if (pressed) {
        gradient.setColorAt(0, button.darker(118));
        gradient.setColorAt(1, button.darker(106));
    } else {
        gradient.setColorAt(0, button.lighter(112));
        gradient.setColorAt(1, button.darker(104));
    }
    inPainter->setRenderHint(QPainter::Antialiasing, true);
    inPainter->setBrush(gradient);
    QColor border = pal.color(QPalette::Dark);
    if (inDefault && enabled)
        border = pal.color(QPalette::Highlight).darker(115);
    inPainter->setPen(QPen(border, 1.0));
    inPainter->drawRoundedRect(frame, 3, 3);
    if (inDefault && enabled) {
        inPainter->setBrush(Qt::NoBrush);
        inPainter->setPen(QPen(pal.color(QPalette::Highlight), 1.0));
        inPainter->drawRoundedRect(frame.adjusted(1, 1, -1, -1), 2, 2);
    }
}

void ZuStyle::drawControl(ControlElement inElement, const QStyleOption* inOption,
                          QPainter* inPainter, const QWidget* inWidget) const
{
    switch (inElement) {
    case CE_CheckBox:
    case CE_RadioButton:
        drawCheckBoxOrRadio(inElement, inOption, inPainter, inWidget);
        return;
    case CE_TabBarTabShape:
        drawTabShape(inOption, inPainter, inWidget);
        return;
    case CE_TabBarTabLabel: {
        const auto* tabBar = qobject_cast<const QTabBar*>(inWidget);
        const auto* tab = qstyleoption_cast<const QStyleOptionTab*>(inOption);
        if (tabBar && tab && tab->version >= 3) {
            const int index = tabBar->tabAt(tab->rect.center());
            if (index >= 0 && tabBar->tabData(index).toBool()) {
                inPainter->save();
                QFont font = inPainter->font();
                font.setWeight(75);
                inPainter->setFont(font);
                QProxyStyle::drawControl(inElement, inOption, inPainter, inWidget);
                inPainter->restore();
                return;
            }
        }
        break;
    }
    case CE_ProgressBarContents:
        drawProgressContents(inOption, inPainter, inWidget);
        return;
    case CE_MenuItem:
        drawMenuItem(inOption, inPainter, inWidget);
        return;
    case CE_ToolButtonLabel: {
        // A negative icon size marks a tool button that must stay blank.
        const auto* toolButton = qstyleoption_cast<const QStyleOptionToolButton*>(inOption);
        if (toolButton && (toolButton->iconSize.width() < 0 || toolButton->iconSize.height() < 0))
            return;
        break;
    }
    default:
        break;
    }
    QProxyStyle::drawControl(inElement, inOption, inPainter, inWidget);
}

void ZuStyle::drawCheckBoxOrRadio(ControlElement inElement, const QStyleOption* inOption,
                                  QPainter* inPainter, const QWidget* inWidget) const
{
    const auto* button = qstyleoption_cast<const QStyleOptionButton*>(inOption);
    if (!button) {
        QProxyStyle::drawControl(inElement, inOption, inPainter, inWidget);
        return;
    }
    const QPalette& pal = button->palette;
    if ((button->state & State_MouseOver) && (button->state & State_Enabled)) {
        inPainter->fillRect(button->rect, pal.brush(QPalette::Button));
    } else {
        const auto* abstractButton = qobject_cast<const QAbstractButton*>(inWidget);
        const bool checked = abstractButton && abstractButton->isChecked();
        inPainter->fillRect(button->rect, pal.brush(checked ? QPalette::Active : QPalette::Inactive,
                                                    QPalette::Window));
    }
    QStyleOptionButton narrowed(*button);
    narrowed.rect.adjust(2, 0, -2, 0);
    innerStyle()->drawControl(inElement, &narrowed, inPainter, inWidget);
}

void ZuStyle::drawTabShape(const QStyleOption* inOption, QPainter* inPainter,
                           const QWidget* inWidget) const
{
    const auto* tab = qstyleoption_cast<const QStyleOptionTab*>(inOption);
    const bool north =
        tab && (tab->shape == QTabBar::RoundedNorth || tab->shape == QTabBar::TriangularNorth);
    const bool south =
        tab && (tab->shape == QTabBar::RoundedSouth || tab->shape == QTabBar::TriangularSouth);
    if (!north && !south) {
        QProxyStyle::drawControl(CE_TabBarTabShape, inOption, inPainter, inWidget);
        return;
    }
    const QPalette& pal = tab->palette;
    const bool selected = tab->state & State_Selected;
    const bool hover = (tab->state & State_MouseOver) && (tab->state & State_Enabled);
    QRect r = tab->rect;

    inPainter->save();
    if (south) {
        // Drawn as a north tab, mirrored about the rectangle's middle line.
        inPainter->translate(0, r.top() + r.bottom() + 1);
        inPainter->scale(1, -1);
    }
    if (!selected)
        r.adjust(0, 2, 0, 0);
    QColor fill = selected ? pal.color(QPalette::Window) : pal.color(QPalette::Button).darker(108);
    if (hover && !selected)
        fill = pal.color(QPalette::Button);
    QLinearGradient gradient(r.topLeft(), r.bottomLeft());
    gradient.setColorAt(0, fill.lighter(selected ? 104 : 110));
    gradient.setColorAt(1, fill);
    inPainter->fillRect(r.adjusted(1, 1, -1, 0), gradient);
    inPainter->setPen(pal.color(QPalette::Dark));
    inPainter->drawLine(r.left(), r.bottom(), r.left(), r.top() + 2);
    inPainter->drawLine(r.left() + 2, r.top(), r.right() - 2, r.top());
    inPainter->drawLine(r.right(), r.top() + 2, r.right(), r.bottom());
    inPainter->drawPoint(r.left() + 1, r.top() + 1);
    inPainter->drawPoint(r.right() - 1, r.top() + 1);
    if (selected) {
        inPainter->setPen(pal.color(QPalette::Highlight));
        inPainter->drawLine(r.left() + 2, r.top() + 1, r.right() - 2, r.top() + 1);
    } else {
        inPainter->drawLine(r.left(), r.bottom(), r.right(), r.bottom());
    }
    inPainter->restore();
}

void ZuStyle::drawProgressContents(const QStyleOption* inOption, QPainter* inPainter,
                                   const QWidget* inWidget) const
{
    const auto* bar = qstyleoption_cast<const QStyleOptionProgressBar*>(inOption);
    if (!bar || (bar->minimum == 0 && bar->maximum == 0)) {
        // The busy indicator keeps the base style's animation.
        QProxyStyle::drawControl(CE_ProgressBarContents, inOption, inPainter, inWidget);
        return;
    }
    const QRect r = bar->rect;
    const bool vertical = bar->orientation == Qt::Vertical;
    const qint64 range = qint64(bar->maximum) - bar->minimum;
    const qint64 done = qBound<qint64>(0, qint64(bar->progress) - bar->minimum, range);
    const int length = vertical ? r.height() : r.width();
    const int filled = range > 0 ? int(length * done / range) : 0;
    if (filled <= 0)
        return;

    QRect chunk;
    if (vertical) {
        const bool fromTop = bar->invertedAppearance;
        chunk = fromTop ? QRect(r.left(), r.top(), r.width(), filled)
                        : QRect(r.left(), r.bottom() - filled + 1, r.width(), filled);
    } else {
        const bool fromRight = bar->invertedAppearance != (bar->direction == Qt::RightToLeft);
        chunk = fromRight ? QRect(r.right() - filled + 1, r.top(), filled, r.height())
                          : QRect(r.left(), r.top(), filled, r.height());
    }
    const QColor highlight = bar->palette.color(QPalette::Highlight);
    QLinearGradient gradient(chunk.topLeft(), vertical ? chunk.topRight() : chunk.bottomLeft());
    gradient.setColorAt(0, highlight.lighter(120));
    gradient.setColorAt(1, highlight);
    inPainter->save();
    inPainter->fillRect(chunk, gradient);
    inPainter->setPen(highlight.darker(120));
    inPainter->drawRect(chunk.adjusted(0, 0, -1, -1));
    inPainter->restore();
}

void ZuStyle::drawMenuItem(const QStyleOption* inOption, QPainter* inPainter,
                           const QWidget* inWidget) const
{
    const auto* item = qstyleoption_cast<const QStyleOptionMenuItem*>(inOption);
    if (!item) {
        QProxyStyle::drawControl(CE_MenuItem, inOption, inPainter, inWidget);
        return;
    }
    state().menuIconSize = isLargeIconMenu(inWidget) ? largeIconSize(inWidget) : 16;
    const int iconSize = proxy()->pixelMetric(PM_SmallIconSize, item, inWidget);

    const QPalette& pal = item->palette;
    const QRect r = item->rect;
    const bool enabled = item->state & State_Enabled;
    const bool selected = (item->state & State_Selected) && enabled;
    const bool pressed = item->state & State_Sunken;

    inPainter->save();
    inPainter->fillRect(r, pal.brush(QPalette::Window));
    if (item->menuItemType == QStyleOptionMenuItem::Separator) {
        const int y = r.center().y();
        inPainter->setPen(pal.color(QPalette::Mid));
        inPainter->drawLine(r.left() + 5, y, r.right() - 5, y);
        inPainter->restore();
        return;
    }
    if (selected)
        inPainter->fillRect(r, pal.brush(QPalette::Highlight));

    const int checkColumn = qMax(qMax(item->maxIconWidth, iconSize), 20);
    const QRect checkRect =
        visualRect(item->direction, r, QRect(r.left() + 2, r.top(), checkColumn, r.height()));
    const QPalette::ColorGroup group = enabled ? pal.currentColorGroup() : QPalette::Disabled;
    const QColor textColor =
        pal.color(group, selected ? QPalette::HighlightedText : QPalette::WindowText);

    if (!item->icon.isNull()) {
        const QIcon::Mode mode =
            !enabled ? QIcon::Disabled : (selected ? QIcon::Active : QIcon::Normal);
        const QPixmap pixmap = item->icon.pixmap(QSize(iconSize, iconSize), mode,
                                                 item->checked ? QIcon::On : QIcon::Off);
        QRect pixmapRect(QPoint(0, 0), pixmap.size() / pixmap.devicePixelRatio());
        pixmapRect.moveCenter(checkRect.center());
        if (item->checkType != QStyleOptionMenuItem::NotCheckable && item->checked) {
            inPainter->setPen(pal.color(QPalette::Highlight));
            inPainter->setBrush(Qt::NoBrush);
            inPainter->drawRect(pixmapRect.adjusted(-2, -2, 1, 1));
        }
        inPainter->drawPixmap(pixmapRect.topLeft(), pixmap);
    } else if (item->checkType == QStyleOptionMenuItem::Exclusive) {
        if (item->checked || pressed) {
            inPainter->setRenderHint(QPainter::Antialiasing, true);
            inPainter->setPen(Qt::NoPen);
            inPainter->setBrush(textColor);
            QRectF dot(0, 0, 7, 7);
            dot.moveCenter(QRectF(checkRect).center());
            inPainter->drawEllipse(dot);
        }
    } else if (item->checkType == QStyleOptionMenuItem::NonExclusive) {
        if (item->checked || pressed) {
            const int side = qMin(checkRect.height(), checkRect.width()) - 4;
            QRect markRect(0, 0, side, side);
            markRect.moveCenter(checkRect.center());
            // The light mark is inverted against a light background so that it stays visible.
            const bool lightBase = isLight(pal.color(QPalette::Base));
            if (lightBase)
                inPainter->setCompositionMode(QPainter::CompositionMode_Xor);
            state().checkLight.paint(inPainter, markRect, Qt::AlignCenter,
                                     enabled ? QIcon::Normal : QIcon::Disabled, QIcon::On);
            if (lightBase)
                inPainter->setCompositionMode(QPainter::CompositionMode_SourceOver);
        }
    }

    const int textLeft = r.left() + 2 + checkColumn + 6;
    const int arrowSpace = 20;
    const QRect textRect =
        visualRect(item->direction, r,
                   QRect(textLeft, r.top(), r.right() - arrowSpace - textLeft, r.height()));
    QFont font = item->font;
    if (item->menuItemType == QStyleOptionMenuItem::DefaultItem)
        font.setBold(true);
    inPainter->setFont(font);
    inPainter->setPen(textColor);
    int flags = Qt::AlignVCenter | Qt::TextShowMnemonic | Qt::TextDontClip | Qt::TextSingleLine;
    if (!proxy()->styleHint(SH_UnderlineShortcut, item, inWidget))
        flags |= Qt::TextHideMnemonic;
    QString text = item->text;
    const int tab = text.indexOf(QLatin1Char('\t'));
    if (tab >= 0) {
        inPainter->drawText(textRect, flags | visualAlignment(item->direction, Qt::AlignRight),
                            text.mid(tab + 1));
        text.truncate(tab);
    }
    inPainter->drawText(textRect, flags | visualAlignment(item->direction, Qt::AlignLeft), text);

    if (item->menuItemType == QStyleOptionMenuItem::SubMenu) {
        const int dim = qMax(6, (r.height() - 4) / 2);
        QStyleOptionMenuItem arrow(*item);
        arrow.rect = visualRect(item->direction, r,
                                QRect(r.right() - dim - 6, r.center().y() - dim / 2, dim, dim));
        arrow.palette.setColor(QPalette::ButtonText, textColor);
        arrow.palette.setColor(QPalette::WindowText, textColor);
        proxy()->drawPrimitive(item->direction == Qt::RightToLeft ? PE_IndicatorArrowLeft
                                                                  : PE_IndicatorArrowRight,
                               &arrow, inPainter, inWidget);
    }
    inPainter->restore();
}
