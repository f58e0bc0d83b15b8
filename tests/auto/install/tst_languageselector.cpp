// The language selector over real translation folders, stored settings and locale variables.
#include "pnresources/PnResourceLayer.h"
#include "zubase/PnLanguageSelector.h"
#include "zubase/PnResource.h"

#include <QDir>
#include <QSettings>
#include <QTemporaryDir>
#include <QtTest>

class TestLanguageSelector : public QObject
{
    Q_OBJECT

    QTemporaryDir mDir;
    // An installation below the test folder with these translation files.
    void install(const QString& inName, const QStringList& inFiles)
    {
        const QString folder = mDir.path() + "/" + inName;
        QVERIFY(QDir().mkpath(folder + "/share/translations"));
        for (const QString& file : inFiles)
            QVERIFY(QFile(folder + "/share/translations/" + file).open(QIODevice::WriteOnly));
        PnResource::setApplicationFolder(QFile::encodeName(folder));
    }

private slots:
    void initTestCase();
    void choice_data();
    void choice();
    void setAndStore();
};

void TestLanguageSelector::initTestCase()
{
    // The settings object is made once per process: point it into the test folder first.
    qputenv("XDG_CONFIG_HOME", QFile::encodeName(mDir.path() + "/config"));
    QCOMPARE(PnResource::applicationSettings().fileName(),
             mDir.path() + "/config/Pernel/Tessel.conf");
}

void TestLanguageSelector::choice_data()
{
    QTest::addColumn<QString>("root");       // folder name of the installation
    QTest::addColumn<QStringList>("files");  // in share/translations
    QTest::addColumn<QString>("stored");     // "-": nothing stored
    QTest::addColumn<QStringList>("locale"); // LC_ALL, LC_MESSAGES, LANG ("-": unset)
    QTest::addColumn<QString>("items");      // text:code ...
    QTest::addColumn<QString>("current");

    const QStringList deEn{"tessel_de.qm", "tessel_en.qm"}, c{"-", "-", "C"};
    // clang-format off
    QTest::newRow("empty folder") << "1" << QStringList() << "-" << c << "English:en" << "en";
    QTest::newRow("de and en") << "2" << deEn << "-" << c << "Deutsch:de English:en" << "en";
    QTest::newRow("German, file") << "3" << QStringList{"tessel_de.qm"} << "-" << QStringList{"-", "-", "de_DE.UTF-8"} << "English:en Deutsch:de" << "de";
    QTest::newRow("German, no file") << "4" << QStringList{"tessel_en.qm"} << "-" << QStringList{"-", "-", "de_DE"} << "English:en" << "en";
    QTest::newRow("stored wins") << "5" << deEn << "de" << QStringList{"en_US", "-", "-"} << "Deutsch:de English:en" << "de";
    QTest::newRow("LC_ALL first") << "6" << deEn << "-" << QStringList{"de_CH", "en_US", "en_US"} << "Deutsch:de English:en" << "de";
    QTest::newRow("LC_MESSAGES next") << "7" << deEn << "-" << QStringList{"-", "de_AT", "en_GB"} << "Deutsch:de English:en" << "de";
    QTest::newRow("French, file") << "8" << QStringList{"tessel_de.qm", "tessel_en.qm", "tessel_fr.qm"} << "-"
                                  << QStringList{"-", "-", "fr_FR"} << "Deutsch:de English:en" << "en";
    QTest::newRow("stored without name") << "9" << QStringList{"tessel_de.qm", "tessel_fr.qm"} << "fr" << c << "English:en Deutsch:de" << "en";
    QTest::newRow("whole names") << "10" << QStringList{"tessel_deu.qm", "tessel_de.qm.bak", "xtessel_de.qm", "Tessel_de.qm", "tessel_de.qm"}
                                 << "-" << QStringList{"-", "-", "de_DE"} << "English:en Deutsch:de" << "de";
    QTest::newRow("non-ASCII root") << "f\u00fcr Bl\u00f6cke" << deEn << "de" << c << "Deutsch:de English:en" << "de";
    // clang-format on
}

void TestLanguageSelector::choice()
{
    QFETCH(QString, root);
    QFETCH(QStringList, files);
    QFETCH(QString, stored);
    QFETCH(QStringList, locale);
    QFETCH(QString, items);
    QFETCH(QString, current);
    if (root.toLocal8Bit() != root.toUtf8())
        QSKIP("the local 8-bit encoding is not UTF-8 here");
    install(root, files);
    if (stored == "-")
        PnResource::applicationSettings().remove("language");
    else
        PnLanguageSelector::saveToRegistry(stored);
    const char* const variables[] = {"LC_ALL", "LC_MESSAGES", "LANG"};
    for (int i = 0; i < 3; ++i) {
        if (locale[i] == "-")
            qunsetenv(variables[i]);
        else
            qputenv(variables[i], locale[i].toLatin1());
    }

    PnLanguageSelector selector;
    QStringList shown;
    for (int i = 0; i < selector.count(); ++i)
        shown << selector.itemText(i) + ":" + selector.itemData(i, Qt::UserRole).toString();
    QCOMPARE(shown.join(' '), items);
    QCOMPARE(selector.language(), current);
}

void TestLanguageSelector::setAndStore()
{
    install("store", {"tessel_de.qm"});
    PnResource::applicationSettings().remove("language");
    qputenv("LANG", "C");
    PnLanguageSelector selector;
    selector.setLanguage("fr");
    QCOMPARE(selector.language(), "en");
    selector.setLanguage("de");
    QCOMPARE(selector.currentText(), "Deutsch");
    selector.setLanguage("en");
    QCOMPARE(selector.currentIndex(), 0);
    selector.setLanguage("de");
    QCOMPARE(PnLanguageSelector::loadFromRegistry(), QString()); // choosing is not storing

    PnLanguageSelector::saveToRegistry(selector.language());
    PnResource::applicationSettings().sync();
    QCOMPARE(QSettings(PnResource::applicationSettings().fileName(), QSettings::IniFormat)
                 .value("language")
                 .toString(),
             "de");
    QCOMPARE(PnLanguageSelector().language(), "de");
}

QTEST_MAIN(TestLanguageSelector)
#include "tst_languageselector.moc"
