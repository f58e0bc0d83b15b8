// The language selector over real translation folders, stored settings and locale variables.
#include "TestSupport.h"
#include "pnresources/PnResourceLayer.h"
#include "zubase/PnLanguageSelector.h"
#include "zubase/PnResource.h"

#include <QApplication>
#include <QDir>
#include <QFile>
#include <QSettings>
#include <QTemporaryDir>
#include <QTextCodec>
#include <QtTest>

class TestLanguageSelector : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void choice_data();
    void choice();
    void setLanguageAndStore();

private:
    QTemporaryDir mDir;
    int mCount = 0;
};

void TestLanguageSelector::initTestCase()
{
    QVERIFY(mDir.isValid());
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
    QTest::addColumn<QStringList>("items");  // "text:code"
    QTest::addColumn<QString>("current");

    const QStringList deEn{"tessel_de.qm", "tessel_en.qm"};
    const QStringList c{"-", "-", "C"};
    QTest::newRow("empty folder") << "inst" << QStringList() << "-" << c
                                  << QStringList{"English:en"} << "en";
    QTest::newRow("de and en") << "inst" << deEn << "-" << c
                               << QStringList{"Deutsch:de", "English:en"} << "en";
    QTest::newRow("German user, German file")
        << "inst" << QStringList{"tessel_de.qm"} << "-" << QStringList{"-", "-", "de_DE.UTF-8"}
        << QStringList{"English:en", "Deutsch:de"} << "de";
    QTest::newRow("German user, no German file")
        << "inst" << QStringList{"tessel_en.qm"} << "-" << QStringList{"-", "-", "de_DE"}
        << QStringList{"English:en"} << "en";
    QTest::newRow("stored wins") << "inst" << deEn << "de" << QStringList{"en_US", "-", "-"}
                                 << QStringList{"Deutsch:de", "English:en"} << "de";
    QTest::newRow("LC_ALL first") << "inst" << deEn << "-" << QStringList{"de_CH", "en_US", "en_US"}
                                  << QStringList{"Deutsch:de", "English:en"} << "de";
    QTest::newRow("LC_MESSAGES before LANG")
        << "inst" << deEn << "-" << QStringList{"-", "de_AT", "en_GB"}
        << QStringList{"Deutsch:de", "English:en"} << "de";
    QTest::newRow("French user, French file")
        << "inst" << QStringList{"tessel_de.qm", "tessel_en.qm", "tessel_fr.qm"} << "-"
        << QStringList{"-", "-", "fr_FR"} << QStringList{"Deutsch:de", "English:en"} << "en";
    QTest::newRow("stored code without a name")
        << "inst" << QStringList{"tessel_de.qm", "tessel_fr.qm"} << "fr" << c
        << QStringList{"English:en", "Deutsch:de"} << "en";
    QTest::newRow("whole names only")
        << "inst"
        << QStringList{"tessel_deu.qm", "tessel_de.qm.bak", "xtessel_de.qm", "Tessel_de.qm",
                       "tessel_de.qm"}
        << "-" << QStringList{"-", "-", "de_DE"} << QStringList{"English:en", "Deutsch:de"} << "de";
    QTest::newRow("root with non-ASCII characters")
        << "Installation f\u00fcr Bl\u00f6cke" << deEn << "de" << c
        << QStringList{"Deutsch:de", "English:en"} << "de";
}

void TestLanguageSelector::choice()
{
    QFETCH(QString, root);
    QFETCH(QStringList, files);
    QFETCH(QString, stored);
    QFETCH(QStringList, locale);
    QFETCH(QStringList, items);
    QFETCH(QString, current);
    if (root.toLocal8Bit() != root.toUtf8())
        QSKIP("the local 8-bit encoding is not UTF-8 here");

    const QString folder = mDir.path() + "/" + QString::number(++mCount) + "/" + root;
    QVERIFY(QDir().mkpath(folder + "/share/translations"));
    for (const QString& name : files) {
        QFile file(folder + "/share/translations/" + name);
        QVERIFY(file.open(QIODevice::WriteOnly));
    }
    PnResource::setApplicationFolder(QFile::encodeName(folder));
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
    QCOMPARE(shown, items);
    QCOMPARE(selector.language(), current);
}

void TestLanguageSelector::setLanguageAndStore()
{
    const QString folder = mDir.path() + "/store";
    QVERIFY(QDir().mkpath(folder + "/share/translations"));
    QFile(folder + "/share/translations/tessel_de.qm").open(QIODevice::WriteOnly);
    PnResource::setApplicationFolder(QFile::encodeName(folder));
    PnResource::applicationSettings().remove("language");
    qputenv("LANG", "C");

    PnLanguageSelector selector;
    QCOMPARE(selector.language(), "en");
    selector.setLanguage("fr");
    QCOMPARE(selector.language(), "en");
    selector.setLanguage("de");
    QCOMPARE(selector.currentText(), "Deutsch");
    // Choosing is not storing.
    QCOMPARE(PnLanguageSelector::loadFromRegistry(), QString());

    PnLanguageSelector::saveToRegistry(selector.language());
    PnResource::applicationSettings().sync();
    QSettings onDisk(PnResource::applicationSettings().fileName(), QSettings::IniFormat);
    QCOMPARE(onDisk.value("language").toString(), "de");
    QCOMPARE(PnLanguageSelector(nullptr).language(), "de");
}

QTEST_MAIN(TestLanguageSelector)
#include "tst_languageselector.moc"
