// Colour-scheme files, the style factory's palettes and switching, and styled widgets.
#include "zubase/ZuApplication.h"
#include "zubase/ZuStyle.h"
#include "zubase/ZuStyleFactory.h"
#include "zubase/styles/ZuStyleFactory_p.h"
#include "zubase/ZuStyledWidget.h"

#include "rklib/RkLogFile.h"

#include <QApplication>
#include <QPointer>
#include <QPushButton>
#include <QStyleFactory>
#include <QTemporaryDir>
#include <QWidget>
#include <QtTest>

#include <memory>

namespace {

const QString sDataDir = QStringLiteral(ZUBASE_TEST_DATA_DIR "/style");

QString dataFile(const char* inName)
{
    return sDataDir + QLatin1Char('/') + QLatin1String(inName);
}

QString writeFile(const QTemporaryDir& inDir, const QString& inName, const QString& inText)
{
    const QString path = inDir.filePath(inName);
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        return QString();
    file.write(inText.toUtf8());
    return path;
}

// A scheme with a name, an Active Midlight, and a Button colour that is also its user-defined
// "Panel" colour.
QString schemeText(const QString& inName, const QColor& inMidlight, const QColor& inPanel)
{
    auto rgb = [](const QColor& color) {
        return QStringLiteral("Red=\"%1\" Green=\"%2\" Blue=\"%3\"")
            .arg(color.red())
            .arg(color.green())
            .arg(color.blue());
    };
    return QStringLiteral("<ColorScheme Version=\"1.0\" Name=\"%1\"><Active>"
                          "<Color Id=\"Midlight\" %2/><Color Id=\"Button\" %3/></Active>"
                          "<UserDefined><Color Id=\"Panel\" %3/></UserDefined></ColorScheme>")
        .arg(inName, rgb(inMidlight), rgb(inPanel));
}

const ZuColorScheme* scheme(const QString& inName)
{
    const auto* d = ZuStyleFactoryPrivate::get(ZuStyleFactory::instance());
    const auto it = d->schemes.constFind(inName);
    return it == d->schemes.constEnd() ? nullptr : &*it;
}

// Counts the events it sees once installed as a notify hook.
struct ProbeHook : ZuApplication::HookNotify
{
    int seen = 0;
    void beforeNotify(QObject*, QEvent*) override { ++seen; }
    void afterNotify(QObject*, QEvent*) override {}
};

} // namespace

class tst_StyleFactory : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void rejectedFiles_data();
    void rejectedFiles();
    void schemePalettes();
    void translateName_data();
    void translateName();
    void addStylesFromPath();
    void setCurrentStyleSignalsOnce();
    void tesselNative_data();
    void tesselNative();
    void nativeClass();
    void styleForWidgetTree();
    void themeChangeObserver();
    void styledWidgetColours_data();
    void styledWidgetColours();
    void widgetsFollowSchemeSwitch();

private:
    QPalette mNativePalette;
    QString mNativeClass;
    QTemporaryDir mTemp;
};

void tst_StyleFactory::initTestCase()
{
    QVERIFY(mTemp.isValid());
    mNativePalette = QGuiApplication::palette();
    mNativeClass = QApplication::style()->objectName();
    QVERIFY(!mNativeClass.isEmpty());

    // Before any scheme.
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QCOMPARE(factory.count(), 0u);
    QVERIFY(factory.currentStyle().isEmpty());
    QCOMPARE(factory.userDefinedColor(QStringLiteral("Panel"), Qt::magenta), QColor(Qt::magenta));
    QCOMPARE(factory.standardPalette(), QPalette());
    QVERIFY(!factory.currentStyleIsOSNative());
    QVERIFY(factory.showToolCardChooserButton());
}

void tst_StyleFactory::rejectedFiles_data()
{
    QTest::addColumn<QString>("file");
    QTest::addColumn<QString>("warning");

    const QString missing = sDataDir + QStringLiteral("/does-not-exist.xml");
    const QString cannotOpen = QStringLiteral("ZuStyle: couldn't open file '%1'\n");
    const QString noXml = QStringLiteral("ZuStyle: '%1' is no valid xml - document : %2\n");
    QTest::newRow("missing file") << missing << cannotOpen.arg(missing);
    QTest::newRow("directory") << sDataDir << cannotOpen.arg(sDataDir);
    QTest::newRow("invalid xml") << dataFile("invalid.xml")
                                 << noXml.arg(dataFile("invalid.xml"), "tag mismatch in line 4");
    QTest::newRow("empty file") << dataFile("empty.xml")
                                << noXml.arg(dataFile("empty.xml"),
                                             "unexpected end of file in line 1");
    // The version is tested before the root's name.
    QTest::newRow("no version") << dataFile("missing_version.xml")
                                << QStringLiteral("ZuStyle: version < 0.000000 is not supported\n");
    QTest::newRow("old version, wrong root")
        << dataFile("old_palette.xml")
        << QStringLiteral("ZuStyle: version < 0.900000 is not supported\n");
    QTest::newRow("wrong root") << dataFile("wrong_root.xml")
                                << QStringLiteral("ZuStyle: document is no color scheme\n");
}

void tst_StyleFactory::rejectedFiles()
{
    QFETCH(QString, file);
    QFETCH(QString, warning);
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    const QStringList namesBefore = factory.styleNames();

    RkLogCapture capture;
    QVERIFY(!factory.addStyle(file));
    QCOMPARE(int(capture.entries().size()), 1);
    QCOMPARE(capture.entries().front().level, RkLogWarning);
    QCOMPARE(QString::fromStdString(capture.entries().front().text), warning);
    QCOMPARE(factory.styleNames(), namesBefore);
}

void tst_StyleFactory::schemePalettes()
{
    const QPalette start = QGuiApplication::palette();
    RkLogCapture capture;
    QVERIFY(ZuStyleFactory::instance().addStyle(dataFile("full.xml")));
    QVERIFY(ZuStyleFactory::instance().addStyle(dataFile("empty_inactive.xml")));
    QVERIFY(capture.entries().empty());

    const ZuColorScheme* full = scheme(QStringLiteral("Full"));
    QVERIFY(full);
    QCOMPARE(full->styleClass, QStringLiteral("ZuStyle"));
    QCOMPARE(full->translateName, true);
    QCOMPARE(full->priority, 7);
    const QPalette& p = full->palette;
    // The later entry of the first Active element wins; "window" and the second Active do not.
    QCOMPARE(p.color(QPalette::Active, QPalette::Window), QColor(10, 20, 30));
    QCOMPARE(p.color(QPalette::Active, QPalette::Base), QColor(250, 251, 252));
    QCOMPARE(p.color(QPalette::Active, QPalette::Text), QColor(5, 6, 0));
    QCOMPARE(p.brush(QPalette::Active, QPalette::Window).style(), Qt::SolidPattern);
    QCOMPARE(p.color(QPalette::Disabled, QPalette::Text), QColor(128, 129, 130));
    // Roles the file does not set keep the application's colours of the moment.
    for (auto role : {QPalette::Button, QPalette::ToolTipBase})
        QCOMPARE(p.color(QPalette::Active, role), start.color(QPalette::Active, role));
    QCOMPARE(p.color(QPalette::Disabled, QPalette::Window),
             start.color(QPalette::Disabled, QPalette::Window));
    // No Inactive element: Inactive copies Active in every role a file can set; the other roles
    // keep the starting colours, whose Inactive and Active agree.
    for (int role = 0; role < QPalette::NColorRoles; ++role) {
        const auto r = QPalette::ColorRole(role);
        QCOMPARE(p.color(QPalette::Inactive, r), p.color(QPalette::Active, r));
    }
    // First entry per id wins; only the first UserDefined element counts.
    QCOMPARE(full->userDefinedColors.keys(), QStringList({"", "PanelBackground", "PanelText"}));
    QCOMPARE(full->userDefinedColors.value(QStringLiteral("PanelBackground")), QColor(11, 22, 33));

    // An empty Inactive element keeps the starting Inactive colours.
    const ZuColorScheme* empty = scheme(QStringLiteral("EmptyInactive"));
    QVERIFY(empty);
    QCOMPARE(empty->palette.color(QPalette::Active, QPalette::Window), QColor(10, 20, 30));
    for (auto role : {QPalette::Window, QPalette::Base})
        QCOMPARE(empty->palette.color(QPalette::Inactive, role),
                 start.color(QPalette::Inactive, role));
    QCOMPARE(empty->translateName, false); // "TRUE" is not one of the accepted spellings
    QCOMPARE(empty->priority, 0);          // "high" is no number

    // A second file of the same name replaces the whole scheme.
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    const unsigned int before = factory.count();
    QVERIFY(factory.addStyle(dataFile("duplicate_first.xml")));
    QVERIFY(scheme(QStringLiteral("Duplicate"))->userDefinedColors.contains("OnlyInFirst"));
    QVERIFY(factory.addStyle(dataFile("duplicate_second.xml")));
    QCOMPARE(factory.count(), before + 1);
    const ZuColorScheme* duplicate = scheme(QStringLiteral("Duplicate"));
    QCOMPARE(duplicate->palette.color(QPalette::Active, QPalette::Window), QColor(0, 100, 0));
    QVERIFY(duplicate->userDefinedColors.isEmpty());
}

void tst_StyleFactory::translateName_data()
{
    QTest::addColumn<QString>("value");
    QTest::addColumn<bool>("flag");
    QTest::newRow("on") << "on" << true;
    QTest::newRow("true") << "true" << true;
    QTest::newRow("1") << "1" << true;
    QTest::newRow("On") << "On" << false;
    QTest::newRow("yes") << "yes" << false;
    QTest::newRow("empty") << "" << false;
}

void tst_StyleFactory::translateName()
{
    QFETCH(QString, value);
    QFETCH(bool, flag);
    const QString name = QStringLiteral("Translate-") + QTest::currentDataTag();
    const QString file =
        writeFile(mTemp, name + QStringLiteral(".scheme"),
                  QStringLiteral("<ColorScheme Version=\"1\" Name=\"%1\" TranslateName=\"%2\"/>")
                      .arg(name, value));
    QVERIFY(ZuStyleFactory::instance().addStyle(file));
    QVERIFY(scheme(name));
    QCOMPARE(scheme(name)->translateName, flag);
}

void tst_StyleFactory::addStylesFromPath()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QTemporaryDir dir;
    QVERIFY(dir.isValid());
    writeFile(dir, QStringLiteral("b.xml"), schemeText("bScheme", Qt::white, Qt::red));
    writeFile(dir, QStringLiteral("UPPER.XML"), schemeText("Upper", Qt::white, Qt::red));
    writeFile(dir, QStringLiteral("notes.txt"), schemeText("Ignored", Qt::white, Qt::red));
    writeFile(dir, QStringLiteral("broken.xml"), QStringLiteral("<ColorScheme"));
    QVERIFY(QDir(dir.path()).mkdir(QStringLiteral("folder.xml")));

    RkLogCapture capture;
    QCOMPARE(factory.addStylesFromPath(dir.path()), 2);
    QCOMPARE(int(capture.entries().size()), 1); // the broken file's warning only
    const QStringList names = factory.styleNames();
    QVERIFY(!names.contains(QStringLiteral("Ignored")));
    // Ordered by UTF-16 code units: upper case before lower case.
    QVERIFY(names.contains(QStringLiteral("bScheme")));
    QVERIFY(names.indexOf(QStringLiteral("Upper")) < names.indexOf(QStringLiteral("bScheme")));
    QVERIFY(std::is_sorted(names.begin(), names.end()));

    QCOMPARE(factory.addStylesFromPath(dir.filePath(QStringLiteral("nowhere"))), 0);
}

void tst_StyleFactory::setCurrentStyleSignalsOnce()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QVERIFY(factory.addStyle(dataFile("unknown_class.xml")));
    const QPalette expected = scheme(QStringLiteral("Full"))->palette;

    QSignalSpy spy(&factory, &ZuStyleFactory::paletteChanged);
    QColor windowAtSignal;
    bool zuStyleAtSignal = false;
    const QMetaObject::Connection connection =
        connect(&factory, &ZuStyleFactory::paletteChanged, this, [&] {
            windowAtSignal = QGuiApplication::palette().color(QPalette::Window);
            zuStyleAtSignal = dynamic_cast<ZuStyle*>(QApplication::style()) != nullptr;
        });
    factory.setCurrentStyle(QStringLiteral("Full"));
    QCOMPARE(spy.count(), 1);
    QCOMPARE(factory.currentStyle(), QStringLiteral("Full"));
    // Palette and style are both in place when the signal goes out.
    QCOMPARE(windowAtSignal, QColor(10, 20, 30));
    QVERIFY(zuStyleAtSignal);
    QCOMPARE(QGuiApplication::palette(), expected);
    QCOMPARE(factory.standardPalette(), expected);

    factory.setCurrentStyle(QStringLiteral("Full"));
    factory.setCurrentStyle(QStringLiteral("No such scheme"));
    factory.setCurrentStyle(QStringLiteral("UnknownClass"));
    QCOMPARE(spy.count(), 1);
    QCOMPARE(factory.currentStyle(), QStringLiteral("Full"));
    QVERIFY(dynamic_cast<ZuStyle*>(QApplication::style()));
    disconnect(connection);

    QCOMPARE(factory.userDefinedColor(QStringLiteral("PanelBackground"), Qt::red),
             QColor(11, 22, 33));
    QCOMPARE(factory.userDefinedColor(QStringLiteral("panelbackground"), Qt::red), QColor(Qt::red));
    QCOMPARE(factory.userDefinedColor(QString(), Qt::blue), QColor(77, 77, 77)); // exact match

    // A file read now takes the roles it leaves out from the scheme in force.
    QVERIFY(factory.addStyle(
        writeFile(mTemp, QStringLiteral("later.xml"),
                  QStringLiteral("<ColorScheme Version=\"1.0\" Name=\"Later\"><Active>"
                                 "<Color Id=\"Base\" Red=\"1\" Green=\"1\" Blue=\"1\"/>"
                                 "</Active></ColorScheme>"))));
    const QPalette& later = scheme(QStringLiteral("Later"))->palette;
    QCOMPARE(later.color(QPalette::Active, QPalette::Window), QColor(10, 20, 30));
    QCOMPARE(later.color(QPalette::Active, QPalette::Base), QColor(1, 1, 1));
}

void tst_StyleFactory::tesselNative_data()
{
    QTest::addColumn<QColor>("midlight");
    QTest::addColumn<bool>("tessel");
    QTest::newRow("201 grey") << QColor(201, 201, 201) << true;
    QTest::newRow("200 grey") << QColor(200, 200, 200) << false;
    QTest::newRow("white") << QColor(255, 255, 255) << true;
    QTest::newRow("cyan") << QColor(0, 255, 255) << false;          // (16+5)*255 >> 5 = 167
    QTest::newRow("light yellow") << QColor(255, 255, 120) << true; // (27*255+600) >> 5 = 233
    QTest::newRow("black") << QColor(0, 0, 0) << false;
}

void tst_StyleFactory::tesselNative()
{
    QFETCH(QColor, midlight);
    QFETCH(bool, tessel);
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    const QString name = QStringLiteral("Midlight ") + QTest::currentDataTag();
    QVERIFY(factory.addStyle(
        writeFile(mTemp, name + QStringLiteral(".xml"), schemeText(name, midlight, Qt::red))));
    factory.setCurrentStyle(name);
    QCOMPARE(factory.currentStyle(), name);
    QCOMPARE(factory.currentStyleIsTesselNative(), tessel);
    QVERIFY(!factory.currentStyleIsOSNative());
}

void tst_StyleFactory::nativeClass()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QVERIFY(factory.addStyle(dataFile("native_upper.xml")));
    QCOMPARE(scheme(QStringLiteral("NativeUpper"))->styleClass, mNativeClass);

    using Style = std::unique_ptr<QStyle>;
    const Style fromFile(factory.createStyleFromName(QStringLiteral("NativeUpper")));
    const Style fromClass(factory.createStyleFromClass(QStringLiteral("native")));
    const Style platform(QStyleFactory::create(mNativeClass));
    QVERIFY(fromFile && fromClass && platform);
    QCOMPARE(fromFile->metaObject()->className(), platform->metaObject()->className());
    QCOMPARE(fromClass->metaObject()->className(), platform->metaObject()->className());
    QVERIFY(!dynamic_cast<ZuStyle*>(fromClass.get()));

    const Style own(factory.createStyleFromClass(QStringLiteral("zuSTYLE")));
    QVERIFY(dynamic_cast<ZuStyle*>(own.get()));
    QVERIFY(!factory.createStyleFromClass(QStringLiteral("NoSuchStyle")));
    QVERIFY(!factory.createStyleFromName(QStringLiteral("No such scheme")));

    factory.setCurrentStyle(QStringLiteral("NativeUpper"));
    QCOMPARE(factory.currentStyle(), QStringLiteral("NativeUpper"));
    QVERIFY(factory.currentStyleIsOSNative());
    QVERIFY(!factory.showToolCardChooserButton());
    QVERIFY(!dynamic_cast<ZuStyle*>(QApplication::style()));
    factory.setCurrentStyle(QStringLiteral("Full"));
    QVERIFY(!factory.currentStyleIsOSNative());
    QVERIFY(factory.showToolCardChooserButton());
}

void tst_StyleFactory::styleForWidgetTree()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QWidget top;
    auto* child = new QWidget(&top);
    const QList<QWidget*> tree = {&top, child, new QWidget(child)};
    QStyle* before = top.style();

    QVERIFY(!factory.setStyleForWidget(QStringLiteral("No such scheme"), &top));
    QVERIFY(!factory.setStyleForWidget(QStringLiteral("UnknownClass"), &top));
    for (QWidget* widget : tree)
        QCOMPARE(widget->style(), before);

    // Every widget of the tree keeps every colour of the scheme, also those the file left out.
    QVERIFY(factory.setStyleForWidget(QStringLiteral("Duplicate"), &top));
    QVERIFY(dynamic_cast<ZuStyle*>(top.style()));
    const QPalette& duplicate = scheme(QStringLiteral("Duplicate"))->palette;
    for (QWidget* widget : tree) {
        QCOMPARE(widget->style(), top.style());
        QCOMPARE(widget->palette().color(QPalette::Active, QPalette::Window), QColor(0, 100, 0));
        QCOMPARE(widget->palette().color(QPalette::Active, QPalette::Base),
                 duplicate.color(QPalette::Active, QPalette::Base));
    }

    QVERIFY(factory.setNativeStyleForWidget(&top));
    const std::unique_ptr<QStyle> platform(QStyleFactory::create(mNativeClass));
    for (QWidget* widget : tree) {
        QCOMPARE(widget->style(), top.style());
        QCOMPARE(widget->style()->metaObject()->className(), platform->metaObject()->className());
        QCOMPARE(widget->palette().color(QPalette::Active, QPalette::Window),
                 mNativePalette.color(QPalette::Active, QPalette::Window));
    }
}

void tst_StyleFactory::themeChangeObserver()
{
    // The factory's observer sees the events the application dispatches, whatever the receiver.
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    factory.setCurrentStyle(QStringLiteral("Full"));
    QPalette other = factory.standardPalette();
    other.setColor(QPalette::Window, Qt::yellow);
    QApplication::setPalette(other);
    QWidget window;
    QEvent unrelated(QEvent::PaletteChange);
    QCoreApplication::sendEvent(&window, &unrelated);
    QCOMPARE(QGuiApplication::palette().color(QPalette::Window), QColor(Qt::yellow));
    QEvent themeChange(QEvent::ThemeChange);
    QCoreApplication::sendEvent(&window, &themeChange);
    QCOMPARE(QGuiApplication::palette(), factory.standardPalette());

    // The observer leaves with its factory. The application holds three hooks and drops any
    // further one: with the process-wide factory's observer and a second factory's in place,
    // one probe fits and one does not.
    ZuStyleFactory* second = ZuStyleFactoryPrivate::createDetached();
    ProbeHook fits, late;
    ZuApplication::installHookNotify(&fits);
    ZuApplication::installHookNotify(&late);
    QCoreApplication::sendEvent(&window, &unrelated);
    const int lateSeenWhileFull = late.seen;

    // The second factory takes its observer along, which frees the slot for the late probe.
    ZuStyleFactoryPrivate::destroyDetached(second);
    ZuApplication::installHookNotify(&late);
    QCoreApplication::sendEvent(&window, &unrelated);
    ZuApplication::deInstallHookNotify(&fits); // before any check can return
    ZuApplication::deInstallHookNotify(&late);
    QCOMPARE(fits.seen, 2);
    QCOMPARE(lateSeenWhileFull, 0);
    QCOMPARE(late.seen, 1);
}

void tst_StyleFactory::styledWidgetColours_data()
{
    QTest::addColumn<bool>("named");        // names set at all
    QTest::addColumn<QByteArray>("suffix"); // of "PanelText<suffix>", "PanelBackground<suffix>"
    QTest::addColumn<bool>("defaults");     // red text and blue background
    QTest::addColumn<QColor>("foreground");
    QTest::addColumn<QColor>("background");
    const QColor text(5, 6, 0), base(250, 251, 252); // the scheme's Text and Base
    QTest::newRow("names defined")
        << true << QByteArray() << true << QColor(240, 230, 220) << QColor(11, 22, 33);
    QTest::newRow("unknown names, defaults")
        << true << QByteArray("X") << true << QColor(Qt::red) << QColor(Qt::blue);
    QTest::newRow("unknown names, no defaults") << true << QByteArray("X") << false << text << base;
    // The scheme keeps an entry without Id under the empty name; unnamed widgets ignore it.
    QTest::newRow("no names, no defaults") << false << QByteArray() << false << text << base;
}

void tst_StyleFactory::styledWidgetColours()
{
    QFETCH(bool, named);
    QFETCH(QByteArray, suffix);
    QFETCH(bool, defaults);
    QFETCH(QColor, foreground);
    QFETCH(QColor, background);
    ZuStyleFactory::instance().setCurrentStyle(QStringLiteral("Full"));
    QWidget widget;
    ZuStyledWidget styled(&widget);
    if (named) {
        styled.setForegroundColorName("PanelText" + suffix);
        styled.setBackgroundColorName("PanelBackground" + suffix);
    }
    styled.setForegroundColorDefault(defaults ? QColor(Qt::red) : QColor());
    styled.setBackgroundColorDefault(defaults ? QColor(Qt::blue) : QColor());

    for (QPalette::ColorGroup group : {QPalette::Active, QPalette::Inactive, QPalette::Disabled}) {
        QCOMPARE(widget.palette().color(group, QPalette::Text), foreground);
        QCOMPARE(widget.palette().color(group, QPalette::WindowText), foreground);
        QCOMPARE(widget.palette().color(group, QPalette::Base), background);
    }
    // Everything else is the scheme's.
    QCOMPARE(widget.palette().color(QPalette::Window), QColor(10, 20, 30));
}

void tst_StyleFactory::widgetsFollowSchemeSwitch()
{
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QVERIFY(factory.addStyle(writeFile(mTemp, QStringLiteral("red.xml"),
                                       schemeText("RedPanel", Qt::white, QColor(200, 0, 0)))));
    QVERIFY(factory.addStyle(writeFile(mTemp, QStringLiteral("green.xml"),
                                       schemeText("GreenPanel", Qt::white, QColor(0, 200, 0)))));
    factory.setCurrentStyle(QStringLiteral("RedPanel"));

    QWidget kept;
    auto styledKept = std::make_unique<ZuStyledWidget>(&kept);
    styledKept->setBackgroundColorName("Panel");
    auto* doomed = new QWidget;
    QPointer<QWidget> guard(doomed);
    ZuStyledWidget styledDoomed(doomed);
    styledDoomed.setBackgroundColorName("Panel");
    QCOMPARE(kept.palette().color(QPalette::Base), QColor(200, 0, 0));
    // Push-button panels are cached per palette; none drawn in red may outlive the switch.
    QPushButton button;
    button.resize(90, 30);
    auto buttonCentre = [&] {
        return button.grab().toImage().pixelColor(45, 15);
    };
    QVERIFY2(buttonCentre().red() > buttonCentre().green() + 80, qPrintable(buttonCentre().name()));

    delete doomed; // the handle outlives its widget
    QVERIFY(guard.isNull());
    factory.setCurrentStyle(QStringLiteral("GreenPanel"));
    QCOMPARE(kept.palette().color(QPalette::Base), QColor(0, 200, 0));
    QVERIFY2(buttonCentre().green() > buttonCentre().red() + 80, qPrintable(buttonCentre().name()));

    // A destroyed handle no longer touches its widget.
    styledKept.reset();
    factory.setCurrentStyle(QStringLiteral("RedPanel"));
    QCOMPARE(kept.palette().color(QPalette::Base), QColor(0, 200, 0));
}

// The application object is the library's, so that the factory's hook sees every event.
int main(int argc, char** argv)
{
    QCoreApplication::setAttribute(Qt::AA_Use96Dpi, true);
    ZuApplication* application = ZuApplication::createInstance(argc, argv, nullptr);
    if (!application)
        return 1;
    tst_StyleFactory test;
    const int result = QTest::qExec(&test, argc, argv);
    delete application;
    return result;
}
#include "tst_stylefactory.moc"
