// ZuStyle as a user sees it: widgets and style elements drawn into images, on the Cleanlooks
// base and (ZU_STYLE_BASE=fusion, Cleanlooks hidden) on the Fusion fallback. The style's own
// elements are compared with tests/data/style/look.png, checked by eye when it was made;
// ZU_STYLE_UPDATE_LOOK=1 rewrites it after a deliberate change of the look.
#include "zubase/ZuStyle.h"

#include "TestSupport.h"

#include <QApplication>
#include <QCheckBox>
#include <QCommonStyle>
#include <QLibraryInfo>
#include <QPainter>
#include <QPixmapCache>
#include <QPushButton>
#include <QStyleFactory>
#include <QStyleOption>
#include <QTabBar>

#include <functional>

namespace {

ZuStyle* appStyle()
{
    return dynamic_cast<ZuStyle*>(QApplication::style());
}

// A fresh style of the kind the application style is based on.
std::unique_ptr<QStyle> baseStyle()
{
    return std::unique_ptr<QStyle>(QStyleFactory::create(appStyle()->baseStyle()->objectName()));
}

QImage drawn(const QSize& inSize, const std::function<void(QPainter*)>& inDraw)
{
    QImage image(inSize, QImage::Format_RGB32);
    image.fill(Qt::white);
    QPainter painter(&image);
    inDraw(&painter);
    return image;
}

int count(const QImage& inImage, const QRect& inRect, const std::function<bool(QRgb)>& inTest)
{
    int found = 0;
    for (int y = inRect.top(); y <= inRect.bottom(); ++y) {
        for (int x = inRect.left(); x <= inRect.right(); ++x)
            found += inTest(inImage.pixel(x, y));
    }
    return found;
}

// Light colours, black text, a mid-grey frame and a blue highlight.
template <class Option> Option option(const QRect& inRect, QStyle::State inState)
{
    Option option;
    option.rect = inRect;
    option.state = inState;
    option.palette = QPalette(QColor(230, 230, 230), QColor(240, 240, 240));
    option.palette.setColor(QPalette::Base, Qt::white);
    for (auto role : {QPalette::WindowText, QPalette::Text, QPalette::ButtonText})
        option.palette.setColor(role, Qt::black);
    option.palette.setColor(QPalette::Dark, QColor(130, 130, 130));
    option.palette.setColor(QPalette::Highlight, QColor(40, 90, 200));
    return option;
}

class OptionTabBar : public QTabBar
{
public:
    using QTabBar::initStyleOption;
};

float sScale = 1.0f; // of the large-icon menus

} // namespace

class tst_Style : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void boldTabLabel();
    void tabsWithButtons();
    void largeMenuIcons();
    void checkBoxBackground();
    void disabledIconOnDarkScheme();
    void pushButtonPanelCache();
    void look();
};

void tst_Style::initTestCase()
{
    QApplication::setStyle(new ZuStyle);
    const bool fallback = qgetenv("ZU_STYLE_BASE") == "fusion" ||
                          !QStyleFactory::keys().contains("Cleanlooks", Qt::CaseInsensitive);
    QCOMPARE(appStyle()->baseStyle()->metaObject()->className(),
             fallback ? "QFusionStyle" : "QCleanlooksStyle");
}

void tst_Style::boldTabLabel()
{
    // Tab data true draws the label bold, in a tab wide enough for it; false or none do not.
    for (const QVariant& data : {QVariant(true), QVariant(false), QVariant()}) {
        QTabBar bar;
        bar.addTab(QStringLiteral("Findings"));
        bar.setTabData(0, data);
        bar.addTab(QStringLiteral("Findings"));
        bar.addTab(QStringLiteral("Current"));
        bar.setCurrentIndex(2); // the two compared tabs share the unselected look
        bar.resize(bar.sizeHint());
        const QImage image = bar.grab().toImage();
        auto ink = [&](int inTab) {
            return count(image, bar.tabRect(inTab), [](QRgb p) { return qGray(p) < 100; });
        };
        const bool bold = data.toBool();
        QVERIFY(ink(1) > 20);
        QCOMPARE(bar.tabRect(0).width() > bar.tabRect(1).width(), bold);
        QCOMPARE(ink(0) > ink(1) * 11 / 10, bold);
        QCOMPARE(ink(0) == ink(1), !bold);
    }
}

void tst_Style::tabsWithButtons()
{
    // A button at least 1 x 1 on either side gives 8 and 4 pixels of tab space.
    for (const auto& [left, right] :
         {qMakePair(QSize(), QSize()), qMakePair(QSize(), QSize(16, 16)),
          qMakePair(QSize(1, 1), QSize()), qMakePair(QSize(), QSize(0, 16))}) {
        QStyleOptionTab tab;
        tab.leftButtonSize = left;
        tab.rightButtonSize = right;
        const bool own = right.width() > 0 || left.isValid();
        QCOMPARE(appStyle()->pixelMetric(QStyle::PM_TabBarTabHSpace, &tab),
                 own ? 8 : baseStyle()->pixelMetric(QStyle::PM_TabBarTabHSpace, &tab));
        QCOMPARE(appStyle()->pixelMetric(QStyle::PM_TabBarTabVSpace, &tab),
                 own ? 4 : baseStyle()->pixelMetric(QStyle::PM_TabBarTabVSpace, &tab));
    }
    // A closable tab's label gets its whole text, clear of the close button, on either base;
    // vertical tabs lay it out as horizontal ones do, in their rotated frame.
    for (bool fusion : {false, true}) {
        ZuStyle style;
        if (fusion)
            style.setBaseStyle(QStyleFactory::create(QStringLiteral("Fusion")));
        QRect north;
        for (auto shape : {QTabBar::RoundedNorth, QTabBar::RoundedWest, QTabBar::RoundedEast}) {
            OptionTabBar bar;
            bar.setStyle(&style);
            bar.setShape(shape);
            bar.setTabsClosable(true);
            bar.setExpanding(false);
            bar.addTab(QStringLiteral("Series one"));
            bar.resize(bar.sizeHint());
            QStyleOptionTab tab;
            bar.initStyleOption(&tab, 0);
            const QRect text = style.subElementRect(QStyle::SE_TabBarTabText, &tab, &bar);
            if (shape == QTabBar::RoundedNorth) {
                north = text;
                QCOMPARE(tab.text, QStringLiteral("Series one")); // not elided
                QVERIFY(text.right() < bar.tabButton(0, QTabBar::RightSide)->x());
            }
            QCOMPARE(text, north);
        }
    }
}

void tst_Style::largeMenuIcons()
{
    // Icons of large-icon menus are 32 pixels times the scaling function, others 16; asked
    // without a widget, the size is that of the menu measured or drawn last.
    QPixmap red(64, 64);
    red.fill(Qt::red);
    for (float scale : {1.0f, 1.5f}) {
        sScale = scale;
        ZuStyle::setIconScalingFunction([](const QWidget*) { return sScale; });
        const int large = int(32 * scale);
        ZuStyle::QLargeIconMenu largeMenu;
        QMenu plainMenu;
        for (QMenu* menu : {static_cast<QMenu*>(&plainMenu), static_cast<QMenu*>(&largeMenu)}) {
            QAction* action = menu->addAction(QIcon(red), QStringLiteral("Item"));
            menu->resize(menu->sizeHint());
            const int side = menu == &largeMenu ? large : 16;
            QCOMPARE(count(menu->grab().toImage(), menu->rect(),
                           [](QRgb p) { return p == QColor(Qt::red).rgb(); }),
                     side * side);
            QVERIFY(menu->actionGeometry(action).height() >= side);
        }
        QCOMPARE(appStyle()->pixelMetric(QStyle::PM_SmallIconSize), large);
    }
    ZuStyle::setIconScalingFunction(nullptr);
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_SmallIconSize, nullptr,
                                     std::make_unique<ZuStyle::QLargeIconMenu>().get()),
             32);
}

void tst_Style::checkBoxBackground()
{
    // Button colour under an enabled hovered box, else Active Window for a checked one and
    // Inactive Window otherwise; the two columns the narrowed drawing leaves show it.
    const QColor active(Qt::red), inactive(Qt::green), button(Qt::blue);
    const QStyle::State enabled = QStyle::State_Enabled, hover = QStyle::State_MouseOver;
    for (const auto& [checked, state, fill] :
         {std::make_tuple(true, enabled, active), std::make_tuple(false, enabled, inactive),
          std::make_tuple(false, enabled | hover, button), std::make_tuple(true, hover, active)}) {
        QCheckBox box;
        box.setChecked(checked);
        auto o = option<QStyleOptionButton>(QRect(0, 0, 80, 20), state);
        o.palette.setColor(QPalette::Active, QPalette::Window, active);
        o.palette.setColor(QPalette::Inactive, QPalette::Window, inactive);
        o.palette.setColor(QPalette::Button, button);
        const QImage image = drawn(QSize(80, 20), [&](QPainter* p) {
            appStyle()->drawControl(QStyle::CE_CheckBox, &o, p, &box);
        });
        QCOMPARE(count(image, QRect(78, 0, 2, 20), [&](QRgb p) { return p == fill.rgb(); }), 40);
    }
}

void tst_Style::disabledIconOnDarkScheme()
{
    // On a dark Base (value up to 128) a disabled icon turns grey: (R + G + B) / 15 plus the
    // average of the application's Button colour, alpha kept, at most 255; else as usual.
    const int disabled = QIcon::Disabled;
    const QPalette saved = QGuiApplication::palette();
    for (const auto& [base, button, mode, pixel, grey] :
         {std::make_tuple(20, QColor(10, 20, 40), disabled, QColor(150, 90, 30), 41),
          std::make_tuple(128, QColor(60, 60, 60), disabled, QColor(255, 255, 255, 128), 111),
          std::make_tuple(40, QColor(250, 250, 250), disabled, QColor(Qt::white), 255),
          std::make_tuple(129, QColor(60, 60, 60), disabled, QColor(150, 90, 30), -1),
          std::make_tuple(100, QColor(60, 60, 60), int(QIcon::Normal), QColor(150, 90, 30), -1)}) {
        QStyleOption o;
        o.palette = saved;
        o.palette.setColor(QPalette::Base, QColor(base, base, base));
        o.palette.setColor(QPalette::Button, button);
        QApplication::setPalette(o.palette);
        QPixmap source(8, 8);
        source.fill(pixel);
        auto argb = [&](const QStyle& inStyle) {
            return inStyle.generatedIconPixmap(QIcon::Mode(mode), source, &o)
                .toImage()
                .convertToFormat(QImage::Format_ARGB32);
        };
        const QImage result = argb(*appStyle());
        QApplication::setPalette(saved);
        const QColor got = result.pixelColor(3, 3);
        if (grey < 0)
            QCOMPARE(result, argb(QCommonStyle()));
        else
            QVERIFY2(qAbs(got.red() - grey) <= 1 && got.red() == got.green() &&
                         got.green() == got.blue() && qAbs(got.alpha() - pixel.alpha()) <= 1,
                     qPrintable(got.name(QColor::HexArgb)));
    }
}

void tst_Style::pushButtonPanelCache()
{
    // Panels are drawn once per key; whatever sits under the key is what the next button of
    // the kind shows, until polishing the application (a scheme switch) empties the cache.
    auto button = option<QStyleOptionButton>(QRect(0, 0, 80, 30), QStyle::State_Enabled);
    const QString key = QStringLiteral("pushbutton-0-%1-0-%2-80x30")
                            .arg(int(button.state))
                            .arg(button.palette.cacheKey());
    auto centre = [&] {
        return drawn(QSize(80, 30),
                     [&](QPainter* p) {
                         appStyle()->drawPrimitive(QStyle::PE_PanelButtonCommand, &button, p);
                     })
            .pixelColor(40, 15);
    };
    QPixmapCache::clear();
    const QColor first = centre();
    QPixmap cached;
    QVERIFY(QPixmapCache::find(key, &cached));
    cached.fill(Qt::magenta);
    QPixmapCache::insert(key, cached);
    QCOMPARE(centre(), QColor(Qt::magenta));
    appStyle()->polish(qApp);
    QCOMPARE(centre(), first);
}

void tst_Style::look()
{
    // The elements the style draws itself, without text (fonts differ), one to a 48 x 24 cell
    // on grey, so that white lines show.
    QImage sheet(10 * 48, 8 * 24, QImage::Format_RGB32);
    sheet.fill(QColor(160, 160, 160));
    QPainter painter(&sheet);
    ZuStyle* style = appStyle();
    int cell = 0;
    auto at = [&cell](int inW, int inH) {
        const QRect rect(cell % 10 * 48, cell / 10 * 24, inW, inH);
        ++cell;
        return rect;
    };
    using States = std::initializer_list<QStyle::State>;
    const QStyle::State enabled = QStyle::State_Enabled, on = enabled | QStyle::State_On;
    for (QStyle::State state : States{enabled, on | QStyle::State_Sunken,
                                      enabled | QStyle::State_MouseOver, QStyle::State_None}) {
        for (auto features : {QStyleOptionButton::None, QStyleOptionButton::DefaultButton}) {
            auto button = option<QStyleOptionButton>(at(40, 16), state);
            button.features = features;
            style->drawPrimitive(QStyle::PE_PanelButtonCommand, &button, &painter);
        }
    }
    const auto frame = option<QStyleOption>(at(40, 20), enabled);
    style->drawPrimitive(QStyle::PE_FrameTabWidget, &frame, &painter);
    // Check boxes on light, just light (value 129), just dark (128) and dark Base colours.
    for (int base : {255, 129, 128, 40}) {
        for (QStyle::State state : States{on, enabled, enabled | QStyle::State_NoChange,
                                          on | QStyle::State_Sunken, QStyle::State_On}) {
            auto box = option<QStyleOptionButton>(at(14, 14), state);
            box.palette.setColor(QPalette::Base, QColor(base, base, base));
            style->drawPrimitive(QStyle::PE_IndicatorCheckBox, &box, &painter);
        }
    }
    for (QStyle::State state : States{on, enabled}) {
        const auto radio = option<QStyleOptionButton>(at(14, 14), state);
        style->drawPrimitive(QStyle::PE_IndicatorRadioButton, &radio, &painter);
    }
    for (auto shape : {QTabBar::RoundedNorth, QTabBar::TriangularNorth, QTabBar::RoundedSouth}) {
        for (QStyle::State state :
             States{enabled, enabled | QStyle::State_Selected, enabled | QStyle::State_MouseOver}) {
            auto tab = option<QStyleOptionTab>(at(40, 20), state);
            tab.shape = shape;
            style->drawControl(QStyle::CE_TabBarTabShape, &tab, &painter);
        }
    }
    for (int bar = 0; bar < 5; ++bar) {
        auto progress = option<QStyleOptionProgressBar>(bar < 3 ? at(40, 12) : at(12, 22), enabled);
        progress.minimum = 10;
        progress.maximum = 110;
        progress.progress = 45;
        progress.orientation = bar < 3 ? Qt::Horizontal : Qt::Vertical;
        progress.invertedAppearance = bar == 1 || bar == 4;
        progress.direction = bar == 2 ? Qt::RightToLeft : Qt::LeftToRight;
        style->drawControl(QStyle::CE_ProgressBarContents, &progress, &painter);
    }
    QPixmap red(16, 16);
    red.fill(Qt::red);
    using Item = QStyleOptionMenuItem;
    const QList<std::tuple<Item::MenuItemType, Item::CheckType, QStyle::State, int>> items = {
        {Item::Separator, Item::NotCheckable, enabled, 255},
        {Item::Normal, Item::Exclusive, on | QStyle::State_Selected, 255},
        {Item::Normal, Item::NonExclusive, on, 255},
        {Item::Normal, Item::NonExclusive, on, 40},
        {Item::Normal, Item::NonExclusive, QStyle::State_Sunken, 255},
        {Item::Normal, Item::NonExclusive, on, -1}}; // -1: with an icon
    for (const auto& [type, check, state, base] : items) {
        auto item = option<Item>(at(46, 22), state);
        item.menuItemType = type;
        item.checkType = check;
        item.checked = state & QStyle::State_On;
        item.icon = base < 0 ? QIcon(red) : QIcon();
        item.palette.setColor(QPalette::Base, QColor(qAbs(base), qAbs(base), qAbs(base)));
        style->drawControl(QStyle::CE_MenuItem, &item, &painter);
    }
    // Tree branches of items with children, closed and open.
    for (QSize size : {QSize(20, 20), QSize(21, 24), QSize(30, 16), QSize(12, 12)}) {
        for (auto open : {QStyle::State_None, QStyle::State_Open}) {
            auto branch = option<QStyleOption>(at(size.width(), size.height()),
                                               enabled | QStyle::State_Children | open);
            style->drawPrimitive(QStyle::PE_IndicatorBranch, &branch, &painter);
        }
    }
    // A tool button with a negative icon size stays blank, text and all.
    for (QSize iconSize : {QSize(-1, 16), QSize(16, -1)}) {
        auto tool = option<QStyleOptionToolButton>(at(46, 22), enabled);
        tool.text = QStringLiteral("Export");
        tool.icon = QIcon(red);
        tool.iconSize = iconSize;
        style->drawControl(QStyle::CE_ToolButtonLabel, &tool, &painter);
    }
    painter.end();
    const QString file = TestSupport::dataPath("style/look.png");
    if (qEnvironmentVariableIsSet("ZU_STYLE_UPDATE_LOOK"))
        QVERIFY(sheet.save(file));
    QVERIFY2(sheet == QImage(file).convertToFormat(QImage::Format_RGB32), qPrintable(file));
    // Items without children are the base style's.
    auto leaf = option<QStyleOption>(QRect(0, 0, 20, 20), enabled);
    QCOMPARE(
        drawn(QSize(20, 20),
              [&](QPainter* p) { style->drawPrimitive(QStyle::PE_IndicatorBranch, &leaf, p); }),
        drawn(QSize(20, 20), [&](QPainter* p) {
            baseStyle()->drawPrimitive(QStyle::PE_IndicatorBranch, &leaf, p);
        }));
}

int main(int argc, char** argv)
{
    // The fallback run hides the style plugins, Cleanlooks among them.
    if (qgetenv("ZU_STYLE_BASE") == "fusion") {
        const QString plugins = QLibraryInfo::location(QLibraryInfo::PluginsPath);
        qputenv("QT_QPA_PLATFORM_PLUGIN_PATH", QFile::encodeName(plugins + "/platforms"));
        QCoreApplication::setLibraryPaths(QStringList());
    }
    QApplication app(argc, argv);
    tst_Style test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_style.moc"
