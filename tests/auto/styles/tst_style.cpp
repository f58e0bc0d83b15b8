// ZuStyle as a user sees it: widgets and style elements drawn into images.
#include "zubase/ZuStyle.h"

#include <QApplication>
#include <QCheckBox>
#include <QCommonStyle>
#include <QDialogButtonBox>
#include <QMenu>
#include <QPainter>
#include <QPixmapCache>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QStyleFactory>
#include <QStyleOption>
#include <QTabBar>
#include <QtTest>

#include <functional>
#include <memory>

namespace {

using PixelTest = std::function<bool(QRgb)>;

float sScale = 1.0f; // of the large-icon menus
ZuStyle* appStyle()
{
    return dynamic_cast<ZuStyle*>(QApplication::style());
}

std::unique_ptr<QStyle> cleanlooks()
{
    return std::unique_ptr<QStyle>(QStyleFactory::create(QStringLiteral("Cleanlooks")));
}

// Light colours with a black text and a mid-grey frame, so that ink is easy to tell apart.
QPalette testPalette(const QColor& inBase = Qt::white)
{
    QPalette palette(QColor(230, 230, 230), QColor(240, 240, 240));
    palette.setColor(QPalette::Base, inBase);
    for (QPalette::ColorRole role : {QPalette::WindowText, QPalette::Text, QPalette::ButtonText})
        palette.setColor(role, Qt::black);
    palette.setColor(QPalette::Dark, QColor(130, 130, 130));
    return palette;
}

QImage grabImage(QWidget& inWidget)
{
    return inWidget.grab().toImage().convertToFormat(QImage::Format_RGB32);
}

// Draws one style call into a white image of the given size.
QImage drawn(const QSize& inSize, const std::function<void(QPainter&)>& inDraw)
{
    QImage image(inSize, QImage::Format_RGB32);
    image.fill(Qt::white);
    QPainter painter(&image);
    inDraw(painter);
    return image;
}

// The pixels of the rectangle that pass the test: how many, and their bounding box.
struct Ink
{
    int count = 0;
    QRect box;
};
Ink ink(const QImage& inImage, const QRect& inRect, const PixelTest& inTest)
{
    Ink ink;
    const QRect rect = inRect.intersected(inImage.rect());
    for (int y = rect.top(); y <= rect.bottom(); ++y) {
        for (int x = rect.left(); x <= rect.right(); ++x) {
            if (inTest(inImage.pixel(x, y))) {
                ++ink.count;
                ink.box |= QRect(x, y, 1, 1);
            }
        }
    }
    return ink;
}
PixelTest is(const QColor& inColor)
{
    return [rgb = inColor.rgb()](QRgb pixel) {
        return pixel == rgb;
    };
}

const int Box = 0, Menu = 1, Radio = 2; // the widgets of the check-mark table

class OptionTabBar : public QTabBar
{
public:
    using QTabBar::initStyleOption;
};

} // namespace

class tst_Style : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void dialogButtonsInWindowsOrderWithoutIcons();
    void boldTabLabelFromTabData_data();
    void boldTabLabelFromTabData();
    void tabSpaceWithButtons_data();
    void tabSpaceWithButtons();
    void largeMenuIcons_data();
    void largeMenuIcons();
    void checkMarks_data();
    void checkMarks();
    void checkBoxBackground_data();
    void checkBoxBackground();
    void branchBox_data();
    void branchBox();
    void toolButtonLabelWithNegativeIconSize_data();
    void toolButtonLabelWithNegativeIconSize();
    void progressBarFill();
    void disabledIconOnDarkScheme_data();
    void disabledIconOnDarkScheme();
    void pushButtonPanelCache();
};

void tst_Style::initTestCase()
{
    QApplication::setStyle(new ZuStyle);
    QVERIFY(appStyle());
    // The base is Cleanlooks when the plugin is installed (Debian: qt5-style-plugins).
    QCOMPARE(appStyle()->baseStyle()->metaObject()->className(), "QCleanlooksStyle");
    const QList<QPair<QString, QSize>> images = {{":/CheckBoxCheckBlack", QSize(32, 32)},
                                                 {":/CheckBoxCheckWhite", QSize(32, 32)},
                                                 {":/RadioBoxCheck", QSize(10, 10)},
                                                 {":/BusyCursorMac", QSize(25, 37)},
                                                 {":/Tessel7", QSize(113, 49)}};
    for (const auto& image : images)
        QCOMPARE(QPixmap(image.first).size(), image.second);
}

void tst_Style::dialogButtonsInWindowsOrderWithoutIcons()
{
    QDialogButtonBox box(QDialogButtonBox::Cancel | QDialogButtonBox::Ok);
    box.resize(320, 40);
    box.show();
    QVERIFY(QTest::qWaitForWindowExposed(&box));
    QPushButton* ok = box.button(QDialogButtonBox::Ok);
    QPushButton* cancel = box.button(QDialogButtonBox::Cancel);
    QVERIFY2(ok->geometry().right() < cancel->geometry().left(), "Ok must be left of Cancel");
    QVERIFY(ok->icon().isNull() && cancel->icon().isNull());
}

void tst_Style::boldTabLabelFromTabData_data()
{
    QTest::addColumn<QVariant>("data");
    QTest::addColumn<bool>("bold");
    QTest::newRow("true") << QVariant(true) << true;
    QTest::newRow("false") << QVariant(false) << false;
    QTest::newRow("absent") << QVariant() << false;
}

void tst_Style::boldTabLabelFromTabData()
{
    QFETCH(QVariant, data);
    QFETCH(bool, bold);
    QTabBar bar;
    bar.setPalette(testPalette());
    bar.addTab(QStringLiteral("Findings"));
    if (data.isValid())
        bar.setTabData(0, data);
    bar.addTab(QStringLiteral("Findings"));
    bar.addTab(QStringLiteral("Current"));
    bar.setCurrentIndex(2); // the two compared tabs share the unselected look
    bar.resize(bar.sizeHint());
    const QImage image = grabImage(bar);
    const PixelTest text = [](QRgb pixel) {
        return qGray(pixel) < 100;
    };
    const int first = ink(image, bar.tabRect(0), text).count;
    const int second = ink(image, bar.tabRect(1), text).count;
    QVERIFY(second > 20);
    // A bold label gets a tab wide enough for bold text.
    QCOMPARE(bar.tabRect(0).width() > bar.tabRect(1).width(), bold);
    if (bold)
        QVERIFY2(first > second * 11 / 10,
                 qPrintable(QStringLiteral("%1 vs %2").arg(first).arg(second)));
    else
        QCOMPARE(first, second);
}

void tst_Style::tabSpaceWithButtons_data()
{
    QTest::addColumn<QSize>("left");
    QTest::addColumn<QSize>("right");
    QTest::addColumn<bool>("own");
    QTest::newRow("no buttons") << QSize() << QSize() << false;
    QTest::newRow("close button right") << QSize() << QSize(16, 16) << true;
    QTest::newRow("button left") << QSize(16, 16) << QSize() << true;
    QTest::newRow("1 x 1") << QSize(1, 1) << QSize() << true;
    QTest::newRow("zero width") << QSize() << QSize(0, 16) << false;
}

void tst_Style::tabSpaceWithButtons()
{
    QFETCH(QSize, left);
    QFETCH(QSize, right);
    QFETCH(bool, own);
    QStyleOptionTab option;
    option.leftButtonSize = left;
    option.rightButtonSize = right;
    const int baseH = cleanlooks()->pixelMetric(QStyle::PM_TabBarTabHSpace, &option);
    const int baseV = cleanlooks()->pixelMetric(QStyle::PM_TabBarTabVSpace, &option);
    QVERIFY(baseH != 8 && baseV != 4); // otherwise the test could not tell them apart
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_TabBarTabHSpace, &option), own ? 8 : baseH);
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_TabBarTabVSpace, &option), own ? 4 : baseV);
    if (QTest::currentDataTag() != QLatin1String("close button right"))
        return;

    // The same through a real tab bar: the close button takes the place of the wide spacing...
    QTabBar plain;
    plain.setExpanding(false);
    plain.addTab(QStringLiteral("Series"));
    OptionTabBar closable;
    closable.setExpanding(false);
    closable.setTabsClosable(true);
    closable.addTab(QStringLiteral("Series"));
    const int closeWidth = closable.tabButton(0, QTabBar::RightSide)->sizeHint().width();
    QCOMPARE(closable.tabRect(0).width() - closeWidth, plain.tabRect(0).width() - baseH + 8 + 4);
    // ... and its label still has room for the whole text.
    QStyleOptionTab tabOption;
    closable.initStyleOption(&tabOption, 0);
    QVERIFY(appStyle()->subElementRect(QStyle::SE_TabBarTabText, &tabOption, &closable).width() >=
            closable.fontMetrics().horizontalAdvance(QStringLiteral("Series")));
}

void tst_Style::largeMenuIcons_data()
{
    QTest::addColumn<float>("scale");
    QTest::addColumn<int>("large");
    QTest::newRow("1.0") << 1.0f << 32;
    QTest::newRow("1.5") << 1.5f << 48;
}

void tst_Style::largeMenuIcons()
{
    QFETCH(float, scale);
    QFETCH(int, large);
    sScale = scale;
    ZuStyle::setIconScalingFunction([](const QWidget*) { return sScale; });
    QPixmap red(64, 64);
    red.fill(Qt::red);
    ZuStyle::QLargeIconMenu largeMenu;
    QAction* largeAction = largeMenu.addAction(QIcon(red), QStringLiteral("Large"));
    QMenu plainMenu;
    QAction* plainAction = plainMenu.addAction(QIcon(red), QStringLiteral("Plain"));

    plainMenu.resize(plainMenu.sizeHint());
    QCOMPARE(ink(grabImage(plainMenu), plainMenu.rect(), is(Qt::red)).box.size(), QSize(16, 16));
    largeMenu.resize(largeMenu.sizeHint());
    QCOMPARE(ink(grabImage(largeMenu), largeMenu.rect(), is(Qt::red)).box.size(),
             QSize(large, large));
    QVERIFY(largeMenu.actionGeometry(largeAction).height() >= large);
    QVERIFY(plainMenu.actionGeometry(plainAction).height() < 32);
    // Asked without a widget, the size is that of the menu drawn last.
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_SmallIconSize), large);

    ZuStyle::setIconScalingFunction(nullptr);
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_SmallIconSize, nullptr, &largeMenu), 32);
}

void tst_Style::checkMarks_data()
{
    QTest::addColumn<int>("kind");
    QTest::addColumn<QColor>("base");
    QTest::addColumn<bool>("checked");
    QTest::addColumn<int>("expected"); // -1 a darker mark, 1 a lighter mark, 0 none
    QTest::newRow("box, white") << Box << QColor(Qt::white) << true << -1;
    QTest::newRow("box, value 129") << Box << QColor(129, 129, 129) << true << -1;
    QTest::newRow("box, value 128") << Box << QColor(128, 128, 128) << true << 1;
    QTest::newRow("box, dark") << Box << QColor(40, 40, 40) << true << 1;
    // Either mark's Off state is blank: an unchecked box shows no mark.
    QTest::newRow("box, white, unchecked") << Box << QColor(Qt::white) << false << 0;
    QTest::newRow("box, dark, unchecked") << Box << QColor(40, 40, 40) << false << 0;
    // Menus draw the light mark, inverted (XOR) on a light scheme so that it shows dark.
    QTest::newRow("menu, light") << Menu << QColor(Qt::white) << true << -1;
    QTest::newRow("menu, dark") << Menu << QColor(40, 40, 40) << true << 1;
    QTest::newRow("menu, unchecked") << Menu << QColor(Qt::white) << false << 0;
    QTest::newRow("radio") << Radio << QColor(Qt::white) << true << -1;
    QTest::newRow("radio, unchecked") << Radio << QColor(Qt::white) << false << 0;
}

void tst_Style::checkMarks()
{
    QFETCH(int, kind);
    QFETCH(QColor, base);
    QFETCH(bool, checked);
    QFETCH(int, expected);
    QPalette palette = testPalette(base);
    palette.setColor(QPalette::Window, base); // the menu's check column
    QImage image;
    QRect inside; // where only the mark may differ from the base colour
    if (kind == Menu) {
        QMenu menu;
        menu.setPalette(palette);
        QAction* action = menu.addAction(QStringLiteral("Show overlay"));
        action->setCheckable(true);
        action->setChecked(checked);
        menu.resize(menu.sizeHint());
        image = grabImage(menu);
        inside = menu.actionGeometry(action); // the check column, left of the text
        inside.setWidth(22);
    } else {
        QCheckBox box;
        QRadioButton radio;
        QAbstractButton& button = kind == Box ? static_cast<QAbstractButton&>(box) : radio;
        button.setPalette(palette);
        button.setChecked(checked);
        button.resize(button.sizeHint());
        image = grabImage(button);
        QStyleOptionButton option;
        option.initFrom(&button);
        option.rect.adjust(2, 0, -2, 0); // the style draws these narrowed by 2 pixels a side
        inside = appStyle()
                     ->subElementRect(kind == Box ? QStyle::SE_CheckBoxIndicator
                                                  : QStyle::SE_RadioButtonIndicator,
                                      &option, &button)
                     .adjusted(3, 3, -3, -3);
    }
    const int grey = qGray(base.rgb());
    QCOMPARE(ink(image, inside, [&](QRgb p) { return qGray(p) < grey - 60; }).count > 3,
             expected < 0);
    QCOMPARE(ink(image, inside, [&](QRgb p) { return qGray(p) > grey + 60; }).count > 3,
             expected > 0);
}

void tst_Style::checkBoxBackground_data()
{
    QTest::addColumn<bool>("checked");
    QTest::addColumn<int>("state");
    QTest::addColumn<QColor>("fill");
    const int enabled = QStyle::State_Enabled;
    const int hover = QStyle::State_MouseOver;
    // Active Window is red, Inactive Window green, Button blue.
    QTest::newRow("checked") << true << enabled << QColor(Qt::red);
    QTest::newRow("unchecked") << false << enabled << QColor(Qt::green);
    QTest::newRow("hover") << false << (enabled | hover) << QColor(Qt::blue);
    QTest::newRow("hover, checked") << true << (enabled | hover) << QColor(Qt::blue);
    QTest::newRow("hover, disabled") << true << hover << QColor(Qt::red);
}

void tst_Style::checkBoxBackground()
{
    QFETCH(bool, checked);
    QFETCH(int, state);
    QFETCH(QColor, fill);
    QCheckBox box;
    box.setChecked(checked);
    QStyleOptionButton option;
    option.rect = QRect(0, 0, 80, 20);
    option.state = QStyle::State(state) | (checked ? QStyle::State_On : QStyle::State_Off);
    option.palette = testPalette();
    option.palette.setColor(QPalette::Active, QPalette::Window, Qt::red);
    option.palette.setColor(QPalette::Inactive, QPalette::Window, Qt::green);
    option.palette.setColor(QPalette::Button, Qt::blue);
    const QImage image = drawn(QSize(80, 20), [&](QPainter& painter) {
        appStyle()->drawControl(QStyle::CE_CheckBox, &option, &painter, &box);
    });
    // The two columns the drawing leaves free on the right show the fill.
    QCOMPARE(ink(image, QRect(78, 0, 2, 20), is(fill)).count, 40);
}

void tst_Style::branchBox_data()
{
    QTest::addColumn<QSize>("size");
    QTest::addColumn<bool>("open");
    QTest::addColumn<int>("side");
    QTest::newRow("20x20 closed") << QSize(20, 20) << false << 15;
    QTest::newRow("20x20 open") << QSize(20, 20) << true << 15;
    QTest::newRow("21x40") << QSize(21, 40) << false << 15;
    QTest::newRow("30x16, odd") << QSize(30, 16) << false << 11;
    QTest::newRow("12x12, at least 9") << QSize(12, 12) << false << 9;
}

void tst_Style::branchBox()
{
    QFETCH(QSize, size);
    QFETCH(bool, open);
    QFETCH(int, side);
    QStyleOption option;
    option.rect = QRect(QPoint(0, 0), size);
    option.state = QStyle::State_Enabled | QStyle::State_Children |
                   (open ? QStyle::State_Open : QStyle::State_None);
    option.palette = testPalette();
    option.palette.setColor(QPalette::Dark, Qt::blue);
    option.palette.setColor(QPalette::Text, Qt::red);
    auto draw = [&](QStyle* style) {
        return drawn(size, [&](QPainter& painter) {
            style->drawPrimitive(QStyle::PE_IndicatorBranch, &option, &painter);
        });
    };
    const QImage image = draw(appStyle());
    const QRect box = ink(image, image.rect(), is(Qt::blue)).box;
    QCOMPARE(box.size(), QSize(side, side));
    QCOMPARE(box.center(), option.rect.center());
    // Minus while open, plus while closed.
    const QPoint middle = box.topLeft() + QPoint(side / 2, side / 2);
    QCOMPARE(ink(image, QRect(box.left(), middle.y(), side, 1), is(Qt::red)).count, side - 4);
    QCOMPARE(ink(image, QRect(middle.x(), box.top(), 1, side), is(Qt::red)).count,
             open ? 1 : side - 4);

    // Items without children are drawn as Cleanlooks draws them.
    option.state &= ~QStyle::State_Children;
    QCOMPARE(draw(appStyle()), draw(cleanlooks().get()));
}

void tst_Style::toolButtonLabelWithNegativeIconSize_data()
{
    QTest::addColumn<QSize>("iconSize");
    QTest::addColumn<bool>("drawn");
    QTest::newRow("16x16") << QSize(16, 16) << true;
    QTest::newRow("negative width") << QSize(-1, 16) << false;
    QTest::newRow("negative height") << QSize(16, -1) << false;
}

void tst_Style::toolButtonLabelWithNegativeIconSize()
{
    QFETCH(QSize, iconSize);
    QFETCH(bool, drawn);
    QPixmap red(16, 16);
    red.fill(Qt::red);
    QStyleOptionToolButton option;
    option.rect = QRect(0, 0, 80, 24);
    option.state = QStyle::State_Enabled;
    option.palette = testPalette();
    option.text = QStringLiteral("Export");
    option.icon = QIcon(red);
    option.iconSize = iconSize;
    option.toolButtonStyle = Qt::ToolButtonTextBesideIcon;
    const QImage image = ::drawn(QSize(80, 24), [&](QPainter& painter) {
        appStyle()->drawControl(QStyle::CE_ToolButtonLabel, &option, &painter);
    });
    QCOMPARE(ink(image, image.rect(), is(Qt::white)).count < 80 * 24, drawn);
}

void tst_Style::progressBarFill()
{
    QPalette palette = testPalette();
    palette.setColor(QPalette::Highlight, QColor(0, 160, 0));
    auto green = [](QRgb p) {
        return qGreen(p) > qRed(p) + 60;
    };
    for (bool inverted : {false, true}) {
        QProgressBar bar;
        bar.setPalette(palette);
        bar.setTextVisible(false);
        bar.setRange(0, 200);
        bar.setValue(50);
        bar.setInvertedAppearance(inverted);
        bar.resize(200, 20);
        const QImage image = grabImage(bar);
        const int filled = ink(image, QRect(inverted ? 100 : 0, 0, 100, 20), green).count;
        QVERIFY2(filled > 200, inverted ? "inverted" : "left to right");
        QCOMPARE(ink(image, QRect(inverted ? 0 : 100, 0, 100, 20), green).count, 0);
    }
}

void tst_Style::disabledIconOnDarkScheme_data()
{
    QTest::addColumn<QColor>("base");
    QTest::addColumn<QColor>("button");
    QTest::addColumn<int>("mode");
    QTest::addColumn<QColor>("pixel");
    QTest::addColumn<QColor>("expected"); // invalid: the common style's result
    const int disabled = QIcon::Disabled;
    const QColor darkBase(100, 100, 100);
    const QColor darkButton(60, 60, 60);
    QTest::newRow("dark base") << darkBase << darkButton << disabled << QColor(150, 90, 30)
                               << QColor(78, 78, 78); // 270/15 + 60
    QTest::newRow("dark base, coloured button")
        << QColor(20, 30, 40) << QColor(10, 20, 40) << disabled << QColor(15, 15, 15)
        << QColor(26, 26, 26); // 45/15 + 70/3
    QTest::newRow("half transparent") << darkBase << darkButton << disabled
                                      << QColor(255, 255, 255, 128) << QColor(111, 111, 111, 128);
    QTest::newRow("light button, clamped") << QColor(40, 40, 40) << QColor(250, 250, 250)
                                           << disabled << QColor(Qt::white) << QColor(Qt::white);
    QTest::newRow("light base") << QColor(200, 200, 200) << darkButton << disabled
                                << QColor(150, 90, 30) << QColor();
    QTest::newRow("dark base, normal mode")
        << darkBase << darkButton << int(QIcon::Normal) << QColor(150, 90, 30) << QColor();
}

void tst_Style::disabledIconOnDarkScheme()
{
    QFETCH(QColor, base);
    QFETCH(QColor, button);
    QFETCH(int, mode);
    QFETCH(QColor, pixel);
    QFETCH(QColor, expected);
    const QPalette saved = QGuiApplication::palette();
    QPalette palette = testPalette(base);
    palette.setColor(QPalette::Button, button);
    QApplication::setPalette(palette);

    QPixmap source(8, 8);
    source.fill(pixel);
    QStyleOption option;
    option.palette = palette;
    auto argb = [](const QPixmap& pixmap) {
        return pixmap.toImage().convertToFormat(QImage::Format_ARGB32);
    };
    const QImage result = argb(appStyle()->generatedIconPixmap(QIcon::Mode(mode), source, &option));
    // A disabled icon drawn anywhere in the application goes the same way.
    const QImage viaIcon = argb(QIcon(source).pixmap(QSize(8, 8), QIcon::Mode(mode)));
    QApplication::setPalette(saved);

    if (!expected.isValid()) {
        QCOMPARE(result,
                 argb(QCommonStyle().generatedIconPixmap(QIcon::Mode(mode), source, &option)));
        return;
    }
    for (const QImage& image : {result, viaIcon}) {
        const QColor got = image.pixelColor(3, 3);
        QVERIFY2(qAbs(got.red() - expected.red()) <= 1 && got.red() == got.green() &&
                     got.green() == got.blue() && qAbs(got.alpha() - expected.alpha()) <= 1,
                 qPrintable(got.name(QColor::HexArgb)));
    }
}

void tst_Style::pushButtonPanelCache()
{
    QStyleOptionSpinBox spin;
    spin.state = QStyle::State_Enabled;
    spin.direction = Qt::RightToLeft;
    spin.buttonSymbols = QAbstractSpinBox::PlusMinus;
    spin.stepEnabled = QAbstractSpinBox::StepUpEnabled | QAbstractSpinBox::StepDownEnabled;
    spin.frame = false;
    QCOMPARE(ZuStyle::pixmapCacheKey(QStringLiteral("spinbox"), &spin, QSize(10, 20)),
             QStringLiteral("spinbox-1-1-%1-10x20-1-3-0").arg(spin.palette.cacheKey()));

    QStyleOptionButton option;
    option.rect = QRect(0, 0, 80, 30);
    option.state = QStyle::State_Enabled | QStyle::State_Raised;
    option.features = QStyleOptionButton::DefaultButton;
    option.palette = testPalette();
    const QString key = QStringLiteral("pushbutton-1-%1-0-%2-80x30")
                            .arg(int(option.state))
                            .arg(option.palette.cacheKey());
    auto draw = [&] {
        return drawn(QSize(80, 30), [&](QPainter& painter) {
            appStyle()->drawPrimitive(QStyle::PE_PanelButtonCommand, &option, &painter);
        });
    };
    QPixmapCache::clear();
    const QImage first = draw();
    QPixmap cached;
    QVERIFY(QPixmapCache::find(key, &cached));
    QCOMPARE(cached.size(), QSize(80, 30));

    // Whatever sits under the key is what the next button of this kind shows.
    QPixmap marker(80, 30);
    marker.fill(Qt::magenta);
    QPixmapCache::insert(key, marker);
    QCOMPARE(draw().pixelColor(40, 15), QColor(Qt::magenta));
    // A plain button has a key of its own.
    option.features = QStyleOptionButton::None;
    QVERIFY(draw().pixelColor(40, 15) != QColor(Qt::magenta));
    option.features = QStyleOptionButton::DefaultButton;

    // Polishing the application (a scheme switch) throws the renderings away.
    appStyle()->polish(qApp);
    QVERIFY(!QPixmapCache::find(key, &cached));
    QCOMPARE(draw(), first);
}

QTEST_MAIN(tst_Style)
#include "tst_style.moc"
