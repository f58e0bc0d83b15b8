// ZuStyle as a user sees it: widgets and style elements drawn into images.
#include "zubase/ZuStyle.h"
#include "zubase/ZuStyleFactory.h"

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
#include <QTemporaryDir>
#include <QtTest>

#include <functional>
#include <memory>

namespace {

float sScale = 1.0f;
float testScaling(const QWidget*)
{
    return sScale;
}

ZuStyle* appStyle()
{
    return dynamic_cast<ZuStyle*>(QApplication::style());
}

// Light colours with a black text and a mid-grey frame, so that ink is easy to tell apart.
QPalette testPalette(const QColor& inBase = Qt::white)
{
    QPalette palette(QColor(230, 230, 230), QColor(240, 240, 240));
    palette.setColor(QPalette::Base, inBase);
    palette.setColor(QPalette::WindowText, Qt::black);
    palette.setColor(QPalette::Text, Qt::black);
    palette.setColor(QPalette::ButtonText, Qt::black);
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
    QImage image(inSize, QImage::Format_ARGB32_Premultiplied);
    image.fill(Qt::white);
    QPainter painter(&image);
    inDraw(painter);
    painter.end();
    return image;
}

int countPixels(const QImage& inImage, const QRect& inRect, const std::function<bool(QRgb)>& inTest)
{
    int count = 0;
    const QRect rect = inRect.intersected(inImage.rect());
    for (int y = rect.top(); y <= rect.bottom(); ++y) {
        for (int x = rect.left(); x <= rect.right(); ++x) {
            if (inTest(inImage.pixel(x, y)))
                ++count;
        }
    }
    return count;
}

QRect boundingBox(const QImage& inImage, const std::function<bool(QRgb)>& inTest)
{
    QRect box;
    for (int y = 0; y < inImage.height(); ++y) {
        for (int x = 0; x < inImage.width(); ++x) {
            if (inTest(inImage.pixel(x, y)))
                box |= QRect(x, y, 1, 1);
        }
    }
    return box;
}

bool isColor(QRgb inPixel, const QColor& inColor)
{
    return qRed(inPixel) == inColor.red() && qGreen(inPixel) == inColor.green() &&
           qBlue(inPixel) == inColor.blue();
}

class OptionCheckBox : public QCheckBox
{
public:
    using QCheckBox::initStyleOption;
};

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
    void checkMarkFollowsBase_data();
    void checkMarkFollowsBase();
    void menuCheckMark_data();
    void menuCheckMark();
    void checkBoxBackground_data();
    void checkBoxBackground();
    void radioDot();
    void branchBox_data();
    void branchBox();
    void toolButtonLabelWithNegativeIconSize_data();
    void toolButtonLabelWithNegativeIconSize();
    void progressBarFill_data();
    void progressBarFill();
    void disabledIconOnDarkScheme_data();
    void disabledIconOnDarkScheme();
    void pixmapCacheKey();
    void pushButtonPanelCache();
    void pushButtonsFollowSchemeSwitch();
};

void tst_Style::initTestCase()
{
    QApplication::setStyle(new ZuStyle);
    QVERIFY(appStyle());
    // The base is Cleanlooks when the plugin is installed (Debian: qt5-style-plugins).
    QVERIFY(QStyleFactory::keys().contains(QStringLiteral("Cleanlooks"), Qt::CaseInsensitive));
    QCOMPARE(appStyle()->baseStyle()->metaObject()->className(), "QCleanlooksStyle");
    QVERIFY(!QPixmap(QStringLiteral(":/CheckBoxCheckBlack")).isNull());
    QCOMPARE(QPixmap(QStringLiteral(":/CheckBoxCheckWhite")).size(), QSize(32, 32));
    QCOMPARE(QPixmap(QStringLiteral(":/RadioBoxCheck")).size(), QSize(10, 10));
    QCOMPARE(QPixmap(QStringLiteral(":/BusyCursorMac")).size(), QSize(25, 37));
    QCOMPARE(QPixmap(QStringLiteral(":/Tessel7")).size(), QSize(113, 49));
}

void tst_Style::dialogButtonsInWindowsOrderWithoutIcons()
{
    QDialogButtonBox box(QDialogButtonBox::Cancel | QDialogButtonBox::Ok);
    box.resize(320, 40);
    box.show();
    QVERIFY(QTest::qWaitForWindowExposed(&box));
    QPushButton* ok = box.button(QDialogButtonBox::Ok);
    QPushButton* cancel = box.button(QDialogButtonBox::Cancel);
    QVERIFY(ok && cancel);
    QVERIFY2(ok->geometry().right() < cancel->geometry().left(), "Ok must be left of Cancel");
    QVERIFY(ok->icon().isNull());
    QVERIFY(cancel->icon().isNull());
}

void tst_Style::boldTabLabelFromTabData_data()
{
    QTest::addColumn<QVariant>("data");
    QTest::addColumn<bool>("bold");
    QTest::newRow("true") << QVariant(true) << true;
    QTest::newRow("1") << QVariant(1) << true;
    QTest::newRow("text true") << QVariant(QStringLiteral("true")) << true;
    QTest::newRow("false") << QVariant(false) << false;
    QTest::newRow("absent") << QVariant() << false;
    QTest::newRow("text 0") << QVariant(QStringLiteral("0")) << false;
    QTest::newRow("not a boolean") << QVariant(QPointF(1, 2)) << false;
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
    auto ink = [](QRgb pixel) {
        return qGray(pixel) < 100;
    };
    const int first = countPixels(image, bar.tabRect(0), ink);
    const int second = countPixels(image, bar.tabRect(1), ink);
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
    const std::unique_ptr<QStyle> cleanlooks(QStyleFactory::create(QStringLiteral("Cleanlooks")));
    const int baseH = cleanlooks->pixelMetric(QStyle::PM_TabBarTabHSpace, &option);
    const int baseV = cleanlooks->pixelMetric(QStyle::PM_TabBarTabVSpace, &option);
    QVERIFY(baseH != 8 && baseV != 4); // otherwise the test could not tell them apart
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_TabBarTabHSpace, &option), own ? 8 : baseH);
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_TabBarTabVSpace, &option), own ? 4 : baseV);

    // The same through a real tab bar: the close button takes the place of the wide spacing.
    if (QTest::currentDataTag() == QLatin1String("close button right")) {
        QTabBar plain;
        plain.setExpanding(false);
        plain.addTab(QStringLiteral("Series"));
        OptionTabBar closable;
        closable.setExpanding(false);
        closable.setTabsClosable(true);
        closable.addTab(QStringLiteral("Series"));
        QWidget* close = closable.tabButton(0, QTabBar::RightSide);
        QVERIFY(close);
        const int plainWidth = plain.tabRect(0).width();
        const int closableWidth = closable.tabRect(0).width();
        QCOMPARE(closableWidth - close->sizeHint().width(), plainWidth - baseH + 8 + 4);
        // ... and its label still has room for the whole text.
        QStyleOptionTab tabOption;
        closable.initStyleOption(&tabOption, 0);
        QVERIFY(
            appStyle()->subElementRect(QStyle::SE_TabBarTabText, &tabOption, &closable).width() >=
            closable.fontMetrics().horizontalAdvance(QStringLiteral("Series")));
    }
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
    ZuStyle::setIconScalingFunction(&testScaling);

    QPixmap red(64, 64);
    red.fill(Qt::red);
    const QIcon icon(red);
    ZuStyle::QLargeIconMenu largeMenu;
    QAction* largeAction = largeMenu.addAction(icon, QStringLiteral("Large"));
    QMenu plainMenu;
    QAction* plainAction = plainMenu.addAction(icon, QStringLiteral("Plain"));
    auto isRed = [](QRgb pixel) {
        return isColor(pixel, Qt::red);
    };

    plainMenu.resize(plainMenu.sizeHint());
    QCOMPARE(boundingBox(grabImage(plainMenu), isRed).size(), QSize(16, 16));

    largeMenu.resize(largeMenu.sizeHint());
    QCOMPARE(boundingBox(grabImage(largeMenu), isRed).size(), QSize(large, large));
    QVERIFY(largeMenu.actionGeometry(largeAction).height() >= large);
    QVERIFY(plainMenu.actionGeometry(plainAction).height() < 32);
    // Asked without a widget, the size is that of the menu drawn last.
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_SmallIconSize), large);
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_ToolBarIconSize), 32);

    ZuStyle::setIconScalingFunction(nullptr);
    QCOMPARE(appStyle()->pixelMetric(QStyle::PM_SmallIconSize, nullptr, &largeMenu), 32);
}

void tst_Style::checkMarkFollowsBase_data()
{
    QTest::addColumn<QColor>("base");
    QTest::addColumn<bool>("checked");
    QTest::addColumn<int>("expected"); // -1 a darker mark, 1 a lighter mark, 0 none
    QTest::newRow("white, checked") << QColor(Qt::white) << true << -1;
    QTest::newRow("value 129, checked") << QColor(129, 129, 129) << true << -1;
    QTest::newRow("value 128, checked") << QColor(128, 128, 128) << true << 1;
    QTest::newRow("dark, checked") << QColor(40, 40, 40) << true << 1;
    QTest::newRow("white, unchecked") << QColor(Qt::white) << false << 0;
    QTest::newRow("dark, unchecked") << QColor(40, 40, 40) << false << 0;
}

void tst_Style::checkMarkFollowsBase()
{
    QFETCH(QColor, base);
    QFETCH(bool, checked);
    QFETCH(int, expected);
    OptionCheckBox box;
    box.setPalette(testPalette(base));
    box.setChecked(checked);
    box.resize(box.sizeHint());
    const QImage image = grabImage(box);

    QStyleOptionButton option;
    box.initStyleOption(&option);
    option.rect.adjust(2, 0, -2, 0); // the style draws check boxes narrowed by 2 pixels a side
    const QRect inside = appStyle()
                             ->subElementRect(QStyle::SE_CheckBoxIndicator, &option, &box)
                             .adjusted(2, 2, -2, -2);
    const int baseGrey = qGray(base.rgb());
    const int darker = countPixels(image, inside, [&](QRgb p) { return qGray(p) < baseGrey - 60; });
    const int lighter =
        countPixels(image, inside, [&](QRgb p) { return qGray(p) > baseGrey + 60; });
    QCOMPARE(darker > 3, expected < 0);
    QCOMPARE(lighter > 3, expected > 0);
}

void tst_Style::menuCheckMark_data()
{
    QTest::addColumn<QColor>("base");
    QTest::addColumn<QColor>("window");
    QTest::addColumn<bool>("darkMark");
    // On a light scheme the light mark is inverted (XOR) so that it shows as a dark mark.
    QTest::newRow("light base") << QColor(Qt::white) << QColor(235, 235, 235) << true;
    QTest::newRow("dark base") << QColor(40, 40, 40) << QColor(60, 60, 60) << false;
}

void tst_Style::menuCheckMark()
{
    QFETCH(QColor, base);
    QFETCH(QColor, window);
    QFETCH(bool, darkMark);
    QMenu menu;
    QPalette palette = testPalette(base);
    palette.setColor(QPalette::Window, window);
    menu.setPalette(palette);
    QAction* checked = menu.addAction(QStringLiteral("Show overlay"));
    checked->setCheckable(true);
    checked->setChecked(true);
    QAction* unchecked = menu.addAction(QStringLiteral("Show ruler"));
    unchecked->setCheckable(true);
    menu.resize(menu.sizeHint());
    const QImage image = grabImage(menu);

    // The check column is the part of the item left of the text.
    auto column = [&](QAction* action) {
        const QRect item = menu.actionGeometry(action);
        return QRect(item.left(), item.top(), 22, item.height());
    };
    auto mark = [&](QRgb p) {
        return darkMark ? qGray(p) < qGray(window.rgb()) - 100
                        : qGray(p) > qGray(window.rgb()) + 100;
    };
    QVERIFY(countPixels(image, column(checked), mark) > 5);
    QCOMPARE(countPixels(image, column(unchecked), mark), 0);
}

void tst_Style::checkBoxBackground_data()
{
    QTest::addColumn<bool>("checked");
    QTest::addColumn<int>("state");
    QTest::addColumn<QColor>("fill");
    const int enabled = QStyle::State_Enabled;
    const int hover = QStyle::State_MouseOver;
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
    QVERIFY(isColor(image.pixel(79, 10), fill));
    QVERIFY(isColor(image.pixel(78, 2), fill));
}

void tst_Style::radioDot()
{
    QRadioButton on;
    on.setPalette(testPalette());
    on.setChecked(true);
    on.resize(on.sizeHint());
    QRadioButton off;
    off.setPalette(testPalette());
    off.resize(off.sizeHint());
    // The dot image is blue; nothing else of the button is.
    auto blue = [](QRgb p) {
        return qBlue(p) > 150 && qRed(p) < 120;
    };
    QVERIFY(countPixels(grabImage(on), on.rect(), blue) >= 12);
    QCOMPARE(countPixels(grabImage(off), off.rect(), blue), 0);
}

void tst_Style::branchBox_data()
{
    QTest::addColumn<QSize>("size");
    QTest::addColumn<bool>("open");
    QTest::addColumn<int>("side");
    QTest::newRow("20x20 closed") << QSize(20, 20) << false << 15;
    QTest::newRow("20x20 open") << QSize(20, 20) << true << 15;
    QTest::newRow("21x40") << QSize(21, 40) << false << 15;
    QTest::newRow("30x16") << QSize(30, 16) << false << 11;
    QTest::newRow("12x12 at least 9") << QSize(12, 12) << false << 9;
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
    const QImage image = drawn(size, [&](QPainter& painter) {
        appStyle()->drawPrimitive(QStyle::PE_IndicatorBranch, &option, &painter);
    });
    const QRect box = boundingBox(image, [](QRgb p) { return isColor(p, Qt::blue); });
    QCOMPARE(box.size(), QSize(side, side));
    QCOMPARE(box.center(), option.rect.center());
    // Minus while open, plus while closed.
    const int midX = box.left() + side / 2;
    const int midY = box.top() + side / 2;
    const int vertical = countPixels(image, QRect(midX, box.top(), 1, side),
                                     [&](QRgb p) { return isColor(p, Qt::red); });
    const int horizontal = countPixels(image, QRect(box.left(), midY, side, 1),
                                       [&](QRgb p) { return isColor(p, Qt::red); });
    QCOMPARE(horizontal, side - 4);
    QCOMPARE(vertical, open ? 1 : side - 4);

    // Items without children are drawn as Cleanlooks draws them.
    option.state &= ~QStyle::State_Children;
    const std::unique_ptr<QStyle> cleanlooks(QStyleFactory::create(QStringLiteral("Cleanlooks")));
    const QImage leaf = drawn(size, [&](QPainter& painter) {
        appStyle()->drawPrimitive(QStyle::PE_IndicatorBranch, &option, &painter);
    });
    const QImage reference = drawn(size, [&](QPainter& painter) {
        cleanlooks->drawPrimitive(QStyle::PE_IndicatorBranch, &option, &painter);
    });
    QCOMPARE(leaf, reference);
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
    const int painted =
        countPixels(image, image.rect(), [](QRgb p) { return p != qRgb(255, 255, 255); });
    QCOMPARE(painted > 0, drawn);
}

void tst_Style::progressBarFill_data()
{
    QTest::addColumn<bool>("inverted");
    QTest::newRow("left to right") << false;
    QTest::newRow("inverted") << true;
}

void tst_Style::progressBarFill()
{
    QFETCH(bool, inverted);
    QProgressBar bar;
    QPalette palette = testPalette();
    palette.setColor(QPalette::Highlight, QColor(0, 160, 0));
    bar.setPalette(palette);
    bar.setTextVisible(false);
    bar.setRange(0, 200);
    bar.setValue(50);
    bar.setInvertedAppearance(inverted);
    bar.resize(200, 20);
    const QImage image = grabImage(bar);
    auto green = [](QRgb p) {
        return qGreen(p) > qRed(p) + 60;
    };
    const int leftHalf = countPixels(image, QRect(0, 0, 100, 20), green);
    const int rightHalf = countPixels(image, QRect(100, 0, 100, 20), green);
    QVERIFY((inverted ? rightHalf : leftHalf) > 200);
    QCOMPARE(inverted ? leftHalf : rightHalf, 0);
}

void tst_Style::disabledIconOnDarkScheme_data()
{
    QTest::addColumn<QColor>("base");
    QTest::addColumn<QColor>("button");
    QTest::addColumn<int>("mode");
    QTest::addColumn<QColor>("pixel");
    QTest::addColumn<QColor>("expected"); // invalid: the common style's result
    const int disabled = QIcon::Disabled;
    QTest::newRow("dark base") << QColor(100, 100, 100) << QColor(60, 60, 60) << disabled
                               << QColor(150, 90, 30) << QColor(78, 78, 78); // 270/15 + 60
    QTest::newRow("dark base, coloured button")
        << QColor(20, 30, 40) << QColor(10, 20, 40) << disabled << QColor(15, 15, 15)
        << QColor(26, 26, 26); // 45/15 + 70/3
    QTest::newRow("half transparent") << QColor(100, 100, 100) << QColor(60, 60, 60) << disabled
                                      << QColor(255, 255, 255, 128) << QColor(111, 111, 111, 128);
    QTest::newRow("light button, clamped")
        << QColor(40, 40, 40) << QColor(250, 250, 250) << disabled << QColor(255, 255, 255)
        << QColor(255, 255, 255);
    QTest::newRow("light base") << QColor(200, 200, 200) << QColor(60, 60, 60) << disabled
                                << QColor(150, 90, 30) << QColor();
    QTest::newRow("dark base, normal mode")
        << QColor(100, 100, 100) << QColor(60, 60, 60) << int(QIcon::Normal) << QColor(150, 90, 30)
        << QColor();
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
    const QImage result = appStyle()
                              ->generatedIconPixmap(QIcon::Mode(mode), source, &option)
                              .toImage()
                              .convertToFormat(QImage::Format_ARGB32);
    // A disabled icon drawn anywhere in the application goes the same way.
    const QImage viaIcon = QIcon(source)
                               .pixmap(QSize(8, 8), QIcon::Mode(mode))
                               .toImage()
                               .convertToFormat(QImage::Format_ARGB32);
    QApplication::setPalette(saved);

    if (!expected.isValid()) {
        QCommonStyle common;
        const QImage reference = common.generatedIconPixmap(QIcon::Mode(mode), source, &option)
                                     .toImage()
                                     .convertToFormat(QImage::Format_ARGB32);
        QCOMPARE(result, reference);
        return;
    }
    for (const QImage& image : {result, viaIcon}) {
        const QColor got = image.pixelColor(3, 3);
        QVERIFY2(qAbs(got.red() - expected.red()) <= 1 && got.red() == got.green() &&
                     got.green() == got.blue() && qAbs(got.alpha() - expected.alpha()) <= 1,
                 qPrintable(got.name(QColor::HexArgb)));
    }
}

void tst_Style::pixmapCacheKey()
{
    QStyleOption plain;
    plain.state = QStyle::State_Enabled | QStyle::State_Raised;
    plain.direction = Qt::RightToLeft;
    const qint64 key = plain.palette.cacheKey();
    QCOMPARE(ZuStyle::pixmapCacheKey(QStringLiteral("pushbutton-0"), &plain, QSize(75, 23)),
             QStringLiteral("pushbutton-0-3-1-%1-75x23").arg(key));

    QStyleOptionSpinBox spin;
    spin.state = QStyle::State_Enabled;
    spin.direction = Qt::LeftToRight;
    spin.buttonSymbols = QAbstractSpinBox::PlusMinus;
    spin.stepEnabled = QAbstractSpinBox::StepUpEnabled | QAbstractSpinBox::StepDownEnabled;
    spin.frame = false;
    QCOMPARE(ZuStyle::pixmapCacheKey(QStringLiteral("spinbox"), &spin, QSize(10, 20)),
             QStringLiteral("spinbox-1-0-%1-10x20-1-3-0").arg(spin.palette.cacheKey()));
}

void tst_Style::pushButtonPanelCache()
{
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
    QVERIFY(isColor(draw().pixel(40, 15), Qt::magenta));

    // A plain button has a key of its own.
    option.features = QStyleOptionButton::None;
    QVERIFY(!isColor(draw().pixel(40, 15), Qt::magenta));
    option.features = QStyleOptionButton::DefaultButton;

    // Polishing the application (a scheme switch) throws the renderings away.
    appStyle()->polish(qApp);
    QVERIFY(!QPixmapCache::find(key, &cached));
    QCOMPARE(draw(), first);
}

void tst_Style::pushButtonsFollowSchemeSwitch()
{
    QTemporaryDir dir;
    QVERIFY(dir.isValid());
    for (const auto& scheme : {std::make_pair("Reddish", QColor(220, 60, 60)),
                               std::make_pair("Bluish", QColor(60, 60, 220))}) {
        QFile file(dir.filePath(QLatin1String(scheme.first) + QStringLiteral(".xml")));
        QVERIFY(file.open(QIODevice::WriteOnly));
        file.write(QStringLiteral("<ColorScheme Version=\"1.0\" Name=\"%1\"><Active>"
                                  "<Color Id=\"Button\" Red=\"%2\" Green=\"%3\" Blue=\"%4\"/>"
                                  "</Active></ColorScheme>")
                       .arg(QLatin1String(scheme.first))
                       .arg(scheme.second.red())
                       .arg(scheme.second.green())
                       .arg(scheme.second.blue())
                       .toUtf8());
    }
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    QCOMPARE(factory.addStylesFromPath(dir.path()), 2);

    QPushButton button;
    button.resize(90, 30);
    factory.setCurrentStyle(QStringLiteral("Reddish"));
    QVERIFY(appStyle());
    QColor centre = grabImage(button).pixelColor(45, 15);
    QVERIFY2(centre.red() > centre.blue() + 80, qPrintable(centre.name()));

    factory.setCurrentStyle(QStringLiteral("Bluish"));
    centre = grabImage(button).pixelColor(45, 15);
    QVERIFY2(centre.blue() > centre.red() + 80, qPrintable(centre.name()));
}

QTEST_MAIN(tst_Style)
#include "tst_style.moc"
