#include "zubase/PnLanguageSelector.h"

#include "zubase/PnResource.h"
#include "zubase/install/PnResource_p.h"

#include <QDir>
#include <QIcon>
#include <QLocale>
#include <QRegularExpression>
#include <QSettings>

namespace {

const char kLanguageKey[] = "language";

// Languages with a display name, in the order they are offered when their files are missing.
struct DisplayName
{
    const char* code;
    const char* name;
};
const DisplayName kDisplayNames[] = {{"en", "English"}, {"de", "Deutsch"}};

QString displayName(const QString& inCode)
{
    for (const DisplayName& entry : kDisplayNames) {
        if (inCode == QLatin1String(entry.code))
            return QString::fromUtf8(entry.name);
    }
    return QString();
}

// The language of the messages locale, read as the C library does (LC_ALL, LC_MESSAGES, LANG):
// QLocale::system() follows the number format instead.
QString systemLanguageCode()
{
    QString name;
    for (const char* variable : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
        name = qEnvironmentVariable(variable);
        if (!name.isEmpty())
            break;
    }
    if (name.isEmpty())
        return QString();
    switch (QLocale(name).language()) {
    case QLocale::Danish:
        return QStringLiteral("da");
    case QLocale::Dutch:
        return QStringLiteral("nl");
    case QLocale::English:
        return QStringLiteral("en");
    case QLocale::French:
        return QStringLiteral("fr");
    case QLocale::German:
        return QStringLiteral("de");
    case QLocale::Italian:
        return QStringLiteral("it");
    case QLocale::NorwegianBokmal:
        return QStringLiteral("no");
    case QLocale::Portuguese:
        return QStringLiteral("pt");
    case QLocale::Spanish:
        return QStringLiteral("es");
    case QLocale::Swedish:
        return QStringLiteral("sv");
    default:
        return QString();
    }
}

} // namespace

PnLanguageSelector::PnLanguageSelector(QWidget* parent) : QComboBox(parent)
{
    QString wanted = loadFromRegistry();
    if (wanted.isEmpty())
        wanted = systemLanguageCode();

    const QStringList files =
        QDir(PnResource::rootPath() + QLatin1String("/share/translations")).entryList();
    if (!files.contains(QLatin1String("tessel_en.qm")))
        addItem(QIcon(), displayName(QStringLiteral("en")), QStringLiteral("en"));

    static const QRegularExpression pattern(
        QRegularExpression::anchoredPattern(QStringLiteral("tessel_(..)\\.qm")));
    bool chosen = false;
    for (const QString& file : files) {
        const QRegularExpressionMatch match = pattern.match(file);
        if (!match.hasMatch())
            continue;
        const QString code = match.captured(1);
        const QString name = displayName(code);
        // A translation without a display name is not offered, and so cannot be preselected.
        if (name.isEmpty())
            continue;
        addItem(QIcon(), name, code);
        if (code == wanted) {
            setCurrentIndex(count() - 1);
            chosen = true;
        }
    }
    if (!chosen)
        setLanguage(QStringLiteral("en"));
}

PnLanguageSelector::~PnLanguageSelector() = default;

QString PnLanguageSelector::language() const
{
    return currentIndex() < 0 ? QString() : currentData(Qt::UserRole).toString();
}

void PnLanguageSelector::setLanguage(const QString& inCode)
{
    for (int i = count() - 1; i >= 0; --i) {
        if (itemData(i, Qt::UserRole).toString() == inCode) {
            setCurrentIndex(i);
            return;
        }
    }
}

QString PnLanguageSelector::loadFromRegistry()
{
    return PnResource::applicationSettings().value(QLatin1String(kLanguageKey)).toString();
}

void PnLanguageSelector::saveToRegistry(const QString& inCode)
{
    PnResource::applicationSettings().setValue(QLatin1String(kLanguageKey), inCode);
}
