#include "zubase/ZuStyleFactory.h"

#include "zubase/ZuCheck_p.h"
#include "zubase/ZuStyle.h"
#include "zubase/styles/ZuStyleFactory_p.h"

#include <QApplication>
#include <QDir>
#include <QDomDocument>
#include <QDomElement>
#include <QEvent>
#include <QFile>
#include <QStyle>
#include <QStyleFactory>
#include <QWidget>

namespace {

// The roles a scheme file can set, in the order the Inactive fallback copies them.
const struct
{
    const char* id;
    QPalette::ColorRole role;
} kFileRoles[] = {
    {"WindowText", QPalette::WindowText},
    {"Button", QPalette::Button},
    {"Light", QPalette::Light},
    {"Midlight", QPalette::Midlight},
    {"Dark", QPalette::Dark},
    {"Mid", QPalette::Mid},
    {"ButtonText", QPalette::ButtonText},
    {"HighlightedText", QPalette::HighlightedText},
    {"Shadow", QPalette::Shadow},
    {"Text", QPalette::Text},
    {"BrightText", QPalette::BrightText},
    {"Base", QPalette::Base},
    {"Window", QPalette::Window},
    {"Highlight", QPalette::Highlight},
    {"AlternateBase", QPalette::AlternateBase},
    {"Link", QPalette::Link},
};

bool roleForId(const QString& inId, QPalette::ColorRole& outRole)
{
    for (const auto& entry : kFileRoles) {
        if (inId == QLatin1String(entry.id)) {
            outRole = entry.role;
            return true;
        }
    }
    return false;
}

// Missing or unreadable components count as 0; out-of-range ones make Qt's colour invalid.
QColor colorOf(const QDomElement& inEntry)
{
    QColor color;
    color.setRgb(inEntry.attribute(QStringLiteral("Red")).toInt(),
                 inEntry.attribute(QStringLiteral("Green")).toInt(),
                 inEntry.attribute(QStringLiteral("Blue")).toInt());
    return color;
}

// The first element of that name anywhere below the root, or a null element.
QDomElement firstBelow(const QDomElement& inRoot, const QString& inName)
{
    return inRoot.elementsByTagName(inName).item(0).toElement();
}

void applyGroup(const QDomElement& inGroup, QPalette::ColorGroup inColorGroup, QPalette& ioPalette)
{
    for (QDomElement entry = inGroup.firstChildElement(); !entry.isNull();
         entry = entry.nextSiblingElement()) {
        QPalette::ColorRole role;
        if (roleForId(entry.attribute(QStringLiteral("Id")), role))
            ioPalette.setBrush(inColorGroup, role, QBrush(colorOf(entry), Qt::SolidPattern));
    }
}

void applyToTree(QWidget* inWidget, QStyle* inStyle, const QPalette& inPalette)
{
    inWidget->setStyle(inStyle);
    inWidget->setPalette(inPalette);
    for (QObject* child : inWidget->children()) {
        if (auto* childWidget = qobject_cast<QWidget*>(child))
            applyToTree(childWidget, inStyle, inPalette);
    }
}

// A copy of the application palette marks no role as set, so a widget given it would simply
// follow the application palette again; every role is marked so the tree keeps these colours.
QPalette allRolesSet(QPalette inPalette)
{
    inPalette.resolve((1u << QPalette::NColorRoles) - 1);
    return inPalette;
}

} // namespace

QStyle* ZuStyleFactoryPrivate::widgetStyle(ZuStyleFactory& ioFactory, const QString& inClassName)
{
    // "Native" and the native class name are one class, as are spellings in other case.
    QString key = inClassName.toLower();
    if (key == QLatin1String("native"))
        key = nativeStyleClass.toLower();
    QPointer<QStyle>& style = widgetStyles[key];
    if (!style) {
        style = ioFactory.createStyleFromClass(inClassName);
        if (style)
            style->setParent(&ioFactory);
    }
    return style;
}

ThemeChangeObserver::~ThemeChangeObserver() = default;

void ThemeChangeObserver::beforeNotify(QObject*, QEvent* inEvent)
{
    if (inEvent && inEvent->type() == QEvent::ThemeChange)
        QApplication::setPalette(ZuStyleFactory::instance().standardPalette());
}

void ThemeChangeObserver::afterNotify(QObject*, QEvent*) {}

ZuStyleFactory& ZuStyleFactory::instance()
{
    static ZuStyleFactory sInstance;
    return sInstance;
}

ZuStyleFactory::ZuStyleFactory() : d(new ZuStyleFactoryPrivate)
{
    d->nativePalette = QGuiApplication::palette();
    if (QStyle* style = QApplication::style())
        d->nativeStyleClass = style->objectName();
    ZuApplication::installHookNotify(&d->themeChangeObserver);
}

ZuStyleFactory::~ZuStyleFactory()
{
    ZuApplication::deInstallHookNotify(&d->themeChangeObserver);
}

bool ZuStyleFactory::addStyle(const QString& inFileName)
{
    RkLogFile& log = getTheLogInstance();
    QFile file(inFileName);
    if (!file.open(QIODevice::ReadOnly)) {
        log.warnf("ZuStyle: couldn't open file '%s'\n", Q2M(inFileName).constData());
        return false;
    }
    QDomDocument document(inFileName);
    QString parseError;
    int errorLine = 0;
    const bool parsed = document.setContent(&file, &parseError, &errorLine);
    file.close();
    if (!parsed) {
        log.warnf("ZuStyle: '%s' is no valid xml - document : %s in line %d\n",
                  Q2M(inFileName).constData(), Q2M(parseError).constData(), errorLine);
        return false;
    }
    const QDomElement root = document.documentElement();
    if (root.isNull()) {
        log.warnf("ZuStyle: empty xml - document\n");
        return false;
    }
    bool versionRead = false;
    float version = root.attribute(QStringLiteral("Version")).toFloat(&versionRead);
    if (!versionRead)
        version = 0.0f;
    if (version < 1.0f) {
        log.warnf("ZuStyle: version < %lf is not supported\n", double(version));
        return false;
    }
    if (root.tagName() != QLatin1String("ColorScheme")) {
        log.warnf("ZuStyle: document is no color scheme\n");
        return false;
    }

    ZuColorScheme scheme;
    const QString name = root.attribute(QStringLiteral("Name"));
    const QString translateName = root.attribute(QStringLiteral("TranslateName"));
    scheme.translateName = translateName == QLatin1String("on") ||
                           translateName == QLatin1String("true") ||
                           translateName == QLatin1String("1");
    scheme.styleClass = root.attribute(QStringLiteral("Class"));
    scheme.priority = root.attribute(QStringLiteral("Priority"), QStringLiteral("0")).toInt();

    // Roles the file leaves out keep the colours in force right now.
    scheme.palette = QGuiApplication::palette();
    if (scheme.styleClass.isEmpty())
        scheme.styleClass = QStringLiteral("ZuStyle");
    else if (scheme.styleClass.toLower() == QLatin1String("native"))
        scheme.styleClass = d->nativeStyleClass;

    const QDomElement active = firstBelow(root, QStringLiteral("Active"));
    const QDomElement disabled = firstBelow(root, QStringLiteral("Disabled"));
    const QDomElement inactive = firstBelow(root, QStringLiteral("Inactive"));
    if (!active.isNull())
        applyGroup(active, QPalette::Active, scheme.palette);
    if (!disabled.isNull())
        applyGroup(disabled, QPalette::Disabled, scheme.palette);
    if (!inactive.isNull()) {
        applyGroup(inactive, QPalette::Inactive, scheme.palette);
    } else {
        for (const auto& entry : kFileRoles) {
            scheme.palette.setBrush(
                QPalette::Inactive, entry.role,
                QBrush(scheme.palette.color(QPalette::Active, entry.role), Qt::SolidPattern));
        }
    }

    const QDomElement userDefined = firstBelow(root, QStringLiteral("UserDefined"));
    for (QDomElement entry = userDefined.firstChildElement(); !entry.isNull();
         entry = entry.nextSiblingElement()) {
        const QString id = entry.attribute(QStringLiteral("Id"));
        if (!scheme.userDefinedColors.contains(id))
            scheme.userDefinedColors.insert(id, colorOf(entry));
    }

    d->schemes.insert(name, scheme);
    return true;
}

int ZuStyleFactory::addStylesFromPath(const QString& inPath)
{
    const QDir dir(inPath);
    if (!dir.exists())
        return 0;
    int stored = 0;
    const QStringList files =
        dir.entryList(QStringList(QStringLiteral("*.xml")), QDir::Files, QDir::Unsorted);
    for (const QString& file : files) {
        if (addStyle(dir.filePath(file)))
            ++stored;
    }
    return stored;
}

unsigned int ZuStyleFactory::count() const
{
    return static_cast<unsigned int>(d->schemes.size());
}

QStringList ZuStyleFactory::styleNames()
{
    return d->schemes.keys();
}

const QString& ZuStyleFactory::currentStyle() const
{
    return d->currentName;
}

void ZuStyleFactory::setCurrentStyle(const QString& inName)
{
    if (inName == d->currentName)
        return;
    QStyle* style = createStyleFromName(inName);
    if (!style)
        return;
    d->currentName = inName;
    QApplication::setPalette(d->schemes.value(inName).palette);
    QApplication::setStyle(style);
    Q_EMIT paletteChanged();
}

QStyle* ZuStyleFactory::createStyleFromClass(const QString& inClassName)
{
    if (inClassName.compare(QLatin1String("ZuStyle"), Qt::CaseInsensitive) == 0)
        return new ZuStyle;
    if (inClassName.compare(QLatin1String("Native"), Qt::CaseInsensitive) == 0)
        return QStyleFactory::create(d->nativeStyleClass);
    return QStyleFactory::create(inClassName);
}

QStyle* ZuStyleFactory::createStyleFromName(const QString& inSchemeName)
{
    const auto scheme = d->schemes.constFind(inSchemeName);
    if (scheme == d->schemes.constEnd())
        return nullptr;
    return createStyleFromClass(scheme->styleClass);
}

bool ZuStyleFactory::setStyleForWidget(const QString& inSchemeName, QWidget* inWidget)
{
    const auto scheme = d->schemes.constFind(inSchemeName);
    if (scheme == d->schemes.constEnd() || !inWidget)
        return false;
    QStyle* style = d->widgetStyle(*this, scheme->styleClass);
    if (!style)
        return false;
    applyToTree(inWidget, style, allRolesSet(scheme->palette));
    return true;
}

bool ZuStyleFactory::setNativeStyleForWidget(QWidget* inWidget)
{
    if (!inWidget)
        return false;
    QStyle* style = d->widgetStyle(*this, d->nativeStyleClass);
    if (!style)
        return false;
    applyToTree(inWidget, style, allRolesSet(d->nativePalette));
    return true;
}

QPalette ZuStyleFactory::standardPalette()
{
    const auto scheme = d->schemes.constFind(d->currentName);
    if (scheme == d->schemes.constEnd())
        return QPalette();
    return scheme->palette;
}

QColor ZuStyleFactory::userDefinedColor(const QString& inId, const QColor& inFallback)
{
    const auto scheme = d->schemes.constFind(d->currentName);
    if (scheme == d->schemes.constEnd())
        return inFallback;
    return scheme->userDefinedColors.value(inId, inFallback);
}

bool ZuStyleFactory::currentStyleIsOSNative() const
{
    const auto scheme = d->schemes.constFind(d->currentName);
    return scheme != d->schemes.constEnd() && scheme->styleClass == d->nativeStyleClass;
}

bool ZuStyleFactory::currentStyleIsTesselNative() const
{
    const auto scheme = d->schemes.constFind(d->currentName);
    const QPalette palette = scheme == d->schemes.constEnd() ? QPalette() : scheme->palette;
    const QColor midlight = palette.color(QPalette::Active, QPalette::Midlight);
    return ((11 * midlight.red() + 16 * midlight.green() + 5 * midlight.blue()) >> 5) > 200;
}

bool ZuStyleFactory::showToolCardChooserButton() const
{
    return !currentStyleIsOSNative();
}

bool ZuStyleFactory::showSplitterButton() const
{
    return true;
}
