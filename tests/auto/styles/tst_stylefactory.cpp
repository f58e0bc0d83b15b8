// Colour-scheme files, the style factory's switching and widget trees, and styled widgets. The
// scheme files under tests/data/style are read once, before any switch, so that the roles
// they leave out keep the starting palette; every test function then stands alone.
#include "zubase/ZuApplication.h"
#include "zubase/ZuStyle.h"
#include "zubase/ZuStyleFactory.h"
#include "zubase/ZuStyledWidget.h"
#include "zubase/styles/ZuStyleFactory_p.h"

#include "TestSupport.h"

#include <QPushButton>
#include <QStyleFactory>
#include <QTemporaryDir>

namespace {

QString dataFile(const char* inName)
{
    return TestSupport::dataPath("style/") + QLatin1String(inName);
}

// A scheme named inName with an Active Midlight and a Button colour that is also its
// user-defined "Panel" colour, written to a file of the folder.
QString writeScheme(const QTemporaryDir& inDir, const QString& inName, const QColor& inMidlight,
                    const QColor& inPanel)
{
    auto rgb = [](const QColor& c) {
        return QStringLiteral("Red=\"%1\" Green=\"%2\" Blue=\"%3\"")
            .arg(c.red())
            .arg(c.green())
            .arg(c.blue());
    };
    const QString path = inDir.filePath(inName + QStringLiteral(".xml"));
    QFile file(path);
    file.open(QIODevice::WriteOnly);
    file.write(QStringLiteral("<ColorScheme Version=\"1.0\" Name=\"%1\"><Active><Color Id="
                              "\"Midlight\" %2/><Color Id=\"Button\" %3/></Active><UserDefined>"
                              "<Color Id=\"Panel\" %3/></UserDefined></ColorScheme>")
                   .arg(inName, rgb(inMidlight), rgb(inPanel))
                   .toUtf8());
    return path;
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

private Q_SLOTS:
    void initTestCase();
    void rejectedFiles();
    void schemeFiles();
    void addStylesFromPath();
    void switching();
    void tesselNative();
    void nativeClass();
    void widgetTrees();
    void themeChangeObserver();
    void styledWidget();
    void styledWidgetsFollowSwitch();

private:
    ZuStyleFactory& mFactory = ZuStyleFactory::instance();
    QPalette mStart;
    QString mNativeClass;
    QTemporaryDir mTemp;
};

void tst_StyleFactory::initTestCase()
{
    // Before any scheme, every answer is a fallback.
    QCOMPARE(mFactory.count(), 0u);
    QVERIFY(mFactory.currentStyle().isEmpty());
    QCOMPARE(mFactory.userDefinedColor(QStringLiteral("Panel"), Qt::magenta), QColor(Qt::magenta));
    QCOMPARE(mFactory.standardPalette(), QPalette());
    QVERIFY(!mFactory.currentStyleIsOSNative() && mFactory.showToolCardChooserButton());
    QVERIFY(mFactory.showSplitterButton());
    mStart = QGuiApplication::palette();
    mNativeClass = QApplication::style()->objectName();
    for (const char* name : {"full.xml", "empty_inactive.xml", "duplicate_first.xml",
                             "duplicate_second.xml", "native_upper.xml", "unknown_class.xml"})
        QVERIFY2(mFactory.addStyle(dataFile(name)), name);
    QCOMPARE(mFactory.styleNames(),
             QStringList({"Duplicate", "EmptyInactive", "Full", "NativeUpper", "UnknownClass"}));
}

void tst_StyleFactory::rejectedFiles()
{
    // One warning each, nothing stored; the version is tested before the root's name.
    const QString open = QStringLiteral("ZuStyle: couldn't open file '%1'\n");
    const QString noXml = QStringLiteral("ZuStyle: '%1' is no valid xml - document : %2\n");
    const QString version = QStringLiteral("ZuStyle: version < %1 is not supported\n");
    const QList<QPair<QString, QString>> files = {
        {dataFile("missing.xml"), open.arg(dataFile("missing.xml"))},
        {dataFile("invalid.xml"), noXml.arg(dataFile("invalid.xml"), "tag mismatch in line 4")},
        {dataFile("missing_version.xml"), version.arg("0.000000")},
        {dataFile("old_palette.xml"), version.arg("0.900000")},
        {dataFile("wrong_root.xml"), QStringLiteral("ZuStyle: document is no color scheme\n")}};
    const QStringList names = mFactory.styleNames();
    for (const auto& [file, warning] : files) {
        RkLogCapture capture;
        QVERIFY(!mFactory.addStyle(file));
        QCOMPARE(TestSupport::logLines(capture, nullptr, RkLogWarning), QStringList(warning));
    }
    QCOMPARE(mFactory.styleNames(), names);
}

void tst_StyleFactory::schemeFiles()
{
    mFactory.setCurrentStyle(QStringLiteral("Full"));
    const QPalette p = mFactory.standardPalette();
    // The later entry of the first Active element wins; "window" and the second Active do not.
    QCOMPARE(p.color(QPalette::Active, QPalette::Window), QColor(10, 20, 30));
    QCOMPARE(p.color(QPalette::Active, QPalette::Text), QColor(5, 6, 0)); // no Blue: 0
    QCOMPARE(p.color(QPalette::Disabled, QPalette::Text), QColor(128, 129, 130));
    // Roles the file does not set keep the colours the application had when it was read.
    for (auto role : {QPalette::Button, QPalette::ToolTipBase})
        QCOMPARE(p.color(QPalette::Active, role), mStart.color(QPalette::Active, role));
    QCOMPARE(p.color(QPalette::Disabled, QPalette::Window),
             mStart.color(QPalette::Disabled, QPalette::Window));
    // No Inactive element: Inactive copies Active in every role a file can set.
    for (int role = 0; role < QPalette::NColorRoles; ++role) {
        const auto r = QPalette::ColorRole(role);
        QCOMPARE(p.color(QPalette::Inactive, r), p.color(QPalette::Active, r));
    }
    // The first entry of an Id wins, an entry without Id is kept under the empty name, and only
    // the first UserDefined element counts.
    QCOMPARE(QList<QColor>({mFactory.userDefinedColor("PanelBackground", Qt::red),
                            mFactory.userDefinedColor(QString(), Qt::red),
                            mFactory.userDefinedColor("Ignored", Qt::red)}),
             QList<QColor>({QColor(11, 22, 33), QColor(77, 77, 77), QColor(Qt::red)}));

    // An empty Inactive element keeps the starting Inactive colours.
    mFactory.setCurrentStyle(QStringLiteral("EmptyInactive"));
    const QPalette e = mFactory.standardPalette();
    QCOMPARE(e.color(QPalette::Active, QPalette::Window), QColor(10, 20, 30));
    QCOMPARE(e.color(QPalette::Inactive, QPalette::Window),
             mStart.color(QPalette::Inactive, QPalette::Window));
    // A second file of the same name replaced the whole scheme, its colours too.
    mFactory.setCurrentStyle(QStringLiteral("Duplicate"));
    QCOMPARE(mFactory.standardPalette().color(QPalette::Window), QColor(0, 100, 0));
    QCOMPARE(mFactory.userDefinedColor(QStringLiteral("OnlyInFirst"), Qt::red), QColor(Qt::red));

    // The flag and the number the factory keeps for the host, without a reader of its own:
    // exactly "on", "true" or "1"; "high" is no number.
    const auto& schemes = ZuStyleFactoryPrivate::get(mFactory)->schemes;
    QCOMPARE(schemes.value(QStringLiteral("Full")).priority, 7);
    QCOMPARE(schemes.value(QStringLiteral("EmptyInactive")).priority, 0);
    const QList<QPair<QByteArray, bool>> flags = {
        {"on", true}, {"true", true}, {"1", true}, {"TRUE", false}, {"yes", false}};
    for (const auto& [value, flag] : flags) {
        QFile file(mTemp.filePath(QStringLiteral("translate.xml")));
        QVERIFY(file.open(QIODevice::WriteOnly | QIODevice::Truncate));
        file.write(QByteArray("<ColorScheme Version=\"1\" Name=\"T\" TranslateName=\"") + value +
                   "\"/>");
        file.close();
        QVERIFY(mFactory.addStyle(file.fileName()));
        QCOMPARE(ZuStyleFactoryPrivate::get(mFactory)->schemes.value("T").translateName, flag);
    }
}

void tst_StyleFactory::addStylesFromPath()
{
    QTemporaryDir dir;
    writeScheme(dir, QStringLiteral("bScheme"), Qt::white, Qt::red);
    QFile::rename(writeScheme(dir, QStringLiteral("Upper"), Qt::white, Qt::red),
                  dir.filePath(QStringLiteral("UPPER.XML")));
    QFile::rename(writeScheme(dir, QStringLiteral("Ignored"), Qt::white, Qt::red),
                  dir.filePath(QStringLiteral("notes.txt")));
    QFile broken(dir.filePath(QStringLiteral("broken.xml")));
    broken.open(QIODevice::WriteOnly);
    QVERIFY(QDir(dir.path()).mkdir(QStringLiteral("folder.xml")));

    RkLogCapture capture;
    QCOMPARE(mFactory.addStylesFromPath(dir.path()), 2);
    QCOMPARE(capture.entries().size(), size_t(1)); // the broken file's warning only
    const QStringList names = mFactory.styleNames();
    QVERIFY(!names.contains(QStringLiteral("Ignored")));
    // Ordered by UTF-16 code units: upper case before lower case.
    QVERIFY(names.indexOf(QStringLiteral("Upper")) < names.indexOf(QStringLiteral("bScheme")));
    QCOMPARE(mFactory.addStylesFromPath(dir.filePath(QStringLiteral("nowhere"))), 0);
}

void tst_StyleFactory::switching()
{
    mFactory.setCurrentStyle(QStringLiteral("Duplicate"));
    QSignalSpy spy(&mFactory, &ZuStyleFactory::paletteChanged);
    QColor windowAtSignal;
    bool zuStyleAtSignal = false;
    const auto connection = connect(&mFactory, &ZuStyleFactory::paletteChanged, this, [&] {
        windowAtSignal = QGuiApplication::palette().color(QPalette::Window);
        zuStyleAtSignal = dynamic_cast<ZuStyle*>(QApplication::style());
    });
    mFactory.setCurrentStyle(QStringLiteral("Full"));
    // Palette and style are both in place when the signal goes out.
    QCOMPARE(windowAtSignal, QColor(10, 20, 30));
    QVERIFY(zuStyleAtSignal);
    QCOMPARE(QGuiApplication::palette(), mFactory.standardPalette());
    // The same scheme again, an unknown one, or one whose style cannot be made: nothing.
    for (const char* name : {"Full", "No such scheme", "UnknownClass"})
        mFactory.setCurrentStyle(QLatin1String(name));
    disconnect(connection);
    QCOMPARE(spy.count(), 1);
    QCOMPARE(mFactory.currentStyle(), QStringLiteral("Full"));

    // A file read now takes the roles it leaves out from the scheme in force.
    QVERIFY(mFactory.addStyle(writeScheme(mTemp, QStringLiteral("Later"), Qt::white, Qt::red)));
    mFactory.setCurrentStyle(QStringLiteral("Later"));
    QCOMPARE(mFactory.standardPalette().color(QPalette::Window), QColor(10, 20, 30));
    QCOMPARE(mFactory.standardPalette().color(QPalette::Button), QColor(Qt::red));
}

void tst_StyleFactory::tesselNative()
{
    // Light when (11 red + 16 green + 5 blue) >> 5 is above 200.
    const QList<QPair<QColor, bool>> cases = {{QColor(201, 201, 201), true},
                                              {QColor(200, 200, 200), false},
                                              {QColor(0, 255, 255), false},  // 167
                                              {QColor(255, 255, 120), true}, // 233
                                              {QColor(255, 0, 255), false}}; // 127
    for (const auto& [midlight, tessel] : cases) {
        const QString name = QStringLiteral("Midlight ") + midlight.name();
        QVERIFY(mFactory.addStyle(writeScheme(mTemp, name, midlight, Qt::red)));
        mFactory.setCurrentStyle(name);
        QCOMPARE(mFactory.currentStyleIsTesselNative(), tessel);
        QVERIFY(!mFactory.currentStyleIsOSNative());
    }
}

void tst_StyleFactory::nativeClass()
{
    using Style = std::unique_ptr<QStyle>;
    const Style platform(QStyleFactory::create(mNativeClass));
    const Style fromFile(mFactory.createStyleFromName(QStringLiteral("NativeUpper")));
    const Style fromClass(mFactory.createStyleFromClass(QStringLiteral("native")));
    QVERIFY(platform && fromFile && fromClass);
    QCOMPARE(fromFile->metaObject()->className(), platform->metaObject()->className());
    QCOMPARE(fromClass->metaObject()->className(), platform->metaObject()->className());
    QVERIFY(dynamic_cast<ZuStyle*>(Style(mFactory.createStyleFromClass("zuSTYLE")).get()));
    QVERIFY(!mFactory.createStyleFromClass(QStringLiteral("NoSuchStyle")));
    QVERIFY(!mFactory.createStyleFromName(QStringLiteral("No such scheme")));

    mFactory.setCurrentStyle(QStringLiteral("NativeUpper"));
    QVERIFY(mFactory.currentStyleIsOSNative());
    QVERIFY(!mFactory.showToolCardChooserButton());
    QVERIFY(!dynamic_cast<ZuStyle*>(QApplication::style()));
    mFactory.setCurrentStyle(QStringLiteral("Full"));
    QVERIFY(!mFactory.currentStyleIsOSNative());
}

void tst_StyleFactory::widgetTrees()
{
    QWidget top;
    auto* child = new QWidget(&top);
    const QList<QWidget*> tree = {&top, child, new QWidget(child)};
    QStyle* before = top.style();
    QVERIFY(!mFactory.setStyleForWidget(QStringLiteral("No such scheme"), &top));
    QVERIFY(!mFactory.setStyleForWidget(QStringLiteral("UnknownClass"), &top));
    QVERIFY(!mFactory.setStyleForWidget(QStringLiteral("Full"), nullptr));
    QCOMPARE(child->style(), before);

    // Every widget keeps every colour of the scheme, also those the file left out.
    mFactory.setCurrentStyle(QStringLiteral("Full"));
    QVERIFY(mFactory.setStyleForWidget(QStringLiteral("Duplicate"), &top));
    QVERIFY(dynamic_cast<ZuStyle*>(top.style()));
    for (QWidget* widget : tree) {
        QCOMPARE(widget->style(), top.style());
        QCOMPARE(widget->palette().color(QPalette::Window), QColor(0, 100, 0));
        QCOMPARE(widget->palette().color(QPalette::Base), mStart.color(QPalette::Base));
    }
    // One style object per class, however many trees are styled.
    QWidget other;
    QVERIFY(mFactory.setStyleForWidget(QStringLiteral("EmptyInactive"), &other));
    QCOMPARE(other.style(), top.style());

    QVERIFY(mFactory.setNativeStyleForWidget(&top));
    QVERIFY(mFactory.setNativeStyleForWidget(&other));
    QVERIFY(mFactory.setStyleForWidget(QStringLiteral("NativeUpper"), child));
    QCOMPARE(other.style(), top.style());
    QCOMPARE(child->style(), top.style());
    QCOMPARE(
        top.style()->metaObject()->className(),
        std::unique_ptr<QStyle>(QStyleFactory::create(mNativeClass))->metaObject()->className());
    QCOMPARE(tree.last()->palette().color(QPalette::Window), mStart.color(QPalette::Window));
}

void tst_StyleFactory::themeChangeObserver()
{
    // The observer puts the scheme palette back on a theme change, whatever the receiver.
    mFactory.setCurrentStyle(QStringLiteral("Full"));
    QPalette other = mFactory.standardPalette();
    other.setColor(QPalette::Window, Qt::yellow);
    QApplication::setPalette(other);
    QWidget window;
    QEvent unrelated(QEvent::PaletteChange);
    QCoreApplication::sendEvent(&window, &unrelated);
    QCOMPARE(QGuiApplication::palette().color(QPalette::Window), QColor(Qt::yellow));
    QEvent themeChange(QEvent::ThemeChange);
    QCoreApplication::sendEvent(&window, &themeChange);
    QCOMPARE(QGuiApplication::palette(), mFactory.standardPalette());

    // The observer leaves with its factory: of the application's three hook slots, a second
    // factory takes one, a probe the last, and a later probe fits only once it has gone.
    ZuStyleFactory* second = ZuStyleFactoryPrivate::createDetached();
    ProbeHook fits, late;
    ZuApplication::installHookNotify(&fits);
    ZuApplication::installHookNotify(&late);
    QCoreApplication::sendEvent(&window, &unrelated);
    const int lateSeenWhileFull = late.seen;
    ZuStyleFactoryPrivate::destroyDetached(second);
    ZuApplication::installHookNotify(&late);
    QCoreApplication::sendEvent(&window, &unrelated);
    ZuApplication::deInstallHookNotify(&fits);
    ZuApplication::deInstallHookNotify(&late);
    QCOMPARE(QList<int>({fits.seen, lateSeenWhileFull, late.seen}), QList<int>({2, 0, 1}));
}

void tst_StyleFactory::styledWidget()
{
    // Each change applies at once, in every colour group; the rest is the scheme's palette.
    mFactory.setCurrentStyle(QStringLiteral("Full"));
    QWidget widget;
    ZuStyledWidget styled(&widget);
    auto colours = [&widget] {
        QStringList names;
        for (auto group : {QPalette::Active, QPalette::Inactive, QPalette::Disabled}) {
            for (auto role : {QPalette::Text, QPalette::WindowText, QPalette::Base})
                names << widget.palette().color(group, role).name();
        }
        names.removeDuplicates();
        return names.join(' ');
    };
    const QString text = "#050600", base = "#fafbfc"; // the scheme's Text and Base
    // No names: the scheme's own colours, not its entry without Id.
    QCOMPARE(colours(), text + ' ' + base);
    styled.setForegroundColorName("PanelText");
    QCOMPARE(colours(), "#f0e6dc " + base);
    styled.setBackgroundColorName("PanelBackground");
    QCOMPARE(colours(), "#f0e6dc #0b1621");
    styled.setForegroundColorName("Unknown");
    QCOMPARE(colours(), text + " #0b1621");
    styled.setForegroundColorDefault(Qt::red);
    QCOMPARE(colours(), "#ff0000 #0b1621");
    styled.setBackgroundColorName("Unknown");
    QCOMPARE(colours(), "#ff0000 " + base);
    styled.setBackgroundColorDefault(Qt::blue);
    QCOMPARE(colours(), "#ff0000 #0000ff");
    QCOMPARE(widget.palette().color(QPalette::Window), QColor(10, 20, 30));
}

void tst_StyleFactory::styledWidgetsFollowSwitch()
{
    QVERIFY(mFactory.addStyle(writeScheme(mTemp, "RedPanel", Qt::white, QColor(200, 0, 0))));
    QVERIFY(mFactory.addStyle(writeScheme(mTemp, "GreenPanel", Qt::white, QColor(0, 200, 0))));
    mFactory.setCurrentStyle(QStringLiteral("RedPanel"));
    QWidget kept;
    auto styledKept = std::make_unique<ZuStyledWidget>(&kept);
    styledKept->setBackgroundColorName("Panel");
    QPointer<QWidget> doomed = new QWidget;
    ZuStyledWidget styledDoomed(doomed);
    styledDoomed.setBackgroundColorName("Panel");
    // Push-button panels are cached per palette; none drawn in red may outlive the switch.
    QPushButton button;
    button.resize(90, 30);
    auto buttonCentre = [&] {
        return button.grab().toImage().pixelColor(45, 15);
    };
    QVERIFY2(buttonCentre().red() > buttonCentre().green() + 80, qPrintable(buttonCentre().name()));

    delete doomed; // the handle outlives its widget
    mFactory.setCurrentStyle(QStringLiteral("GreenPanel"));
    QCOMPARE(kept.palette().color(QPalette::Base), QColor(0, 200, 0));
    QVERIFY2(buttonCentre().green() > buttonCentre().red() + 80, qPrintable(buttonCentre().name()));
    // A destroyed handle no longer touches its widget.
    styledKept.reset();
    mFactory.setCurrentStyle(QStringLiteral("RedPanel"));
    QCOMPARE(kept.palette().color(QPalette::Base), QColor(0, 200, 0));
}

// The application object is the library's, so that the factory's hook sees every event.
int main(int argc, char** argv)
{
    QCoreApplication::setAttribute(Qt::AA_Use96Dpi, true);
    std::unique_ptr<ZuApplication> app(ZuApplication::createInstance(argc, argv, nullptr));
    tst_StyleFactory test;
    return app ? QTest::qExec(&test, argc, argv) : 1;
}

#include "tst_stylefactory.moc"
