#include "DemoSchemePage.h"

#include "zubase/ZuStyleFactory.h"
#include "zubase/ZuStyledWidget.h"

#include <QCheckBox>
#include <QComboBox>
#include <QCoreApplication>
#include <QDialogButtonBox>
#include <QDir>
#include <QFormLayout>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QListWidget>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QSlider>
#include <QSpinBox>
#include <QTabWidget>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace {

// A label whose colours are the scheme's "PanelText" on "PanelBackground".
class PanelLabel : public QLabel
{
public:
    PanelLabel(const QString& inText, QWidget* inParent) : QLabel(inText, inParent), mStyled(this)
    {
        setAutoFillBackground(true);
        setBackgroundRole(QPalette::Base);
        setForegroundRole(QPalette::Text);
        setMargin(8);
        mStyled.setForegroundColorName("PanelText");
        mStyled.setBackgroundColorName("PanelBackground");
    }

private:
    ZuStyledWidget mStyled;
};

QWidget* buttonsBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("Buttons"), inParent);
    auto* layout = new QGridLayout(box);
    auto* checked = new QCheckBox(QObject::tr("Show annotations"), box);
    checked->setChecked(true);
    auto* partial = new QCheckBox(QObject::tr("Some series"), box);
    partial->setTristate(true);
    partial->setCheckState(Qt::PartiallyChecked);
    auto* disabled = new QCheckBox(QObject::tr("Disabled, checked"), box);
    disabled->setChecked(true);
    disabled->setEnabled(false);
    layout->addWidget(checked, 0, 0);
    layout->addWidget(new QCheckBox(QObject::tr("Sync scrolling"), box), 1, 0);
    layout->addWidget(partial, 2, 0);
    layout->addWidget(disabled, 3, 0);
    auto* axial = new QRadioButton(QObject::tr("Axial"), box);
    axial->setChecked(true);
    layout->addWidget(axial, 0, 1);
    layout->addWidget(new QRadioButton(QObject::tr("Sagittal"), box), 1, 1);
    layout->addWidget(new QRadioButton(QObject::tr("Coronal"), box), 2, 1);
    auto* push = new QPushButton(QObject::tr("Export..."), box);
    auto* off = new QPushButton(QObject::tr("Disabled"), box);
    off->setEnabled(false);
    layout->addWidget(push, 3, 1);
    layout->addWidget(off, 4, 1);
    return box;
}

QWidget* inputsBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("Input"), inParent);
    auto* form = new QFormLayout(box);
    form->addRow(QObject::tr("Patient:"), new QLineEdit(QObject::tr("Doe^Jane"), box));
    auto* combo = new QComboBox(box);
    combo->addItems({QObject::tr("CT"), QObject::tr("MR"), QObject::tr("US")});
    form->addRow(QObject::tr("Modality:"), combo);
    auto* spin = new QSpinBox(box);
    spin->setRange(1, 64);
    spin->setValue(12);
    form->addRow(QObject::tr("Slices:"), spin);
    auto* slider = new QSlider(Qt::Horizontal, box);
    slider->setValue(35);
    form->addRow(QObject::tr("Window:"), slider);
    auto* progress = new QProgressBar(box);
    progress->setValue(64);
    form->addRow(QObject::tr("Import:"), progress);
    return box;
}

QWidget* tabsBox(QWidget* inParent)
{
    auto* tabs = new QTabWidget(inParent);
    tabs->setTabsClosable(true);
    auto* tree = new QTreeWidget(tabs);
    tree->setHeaderLabels({QObject::tr("Study"), QObject::tr("Images")});
    for (int study = 1; study <= 2; ++study) {
        auto* item = new QTreeWidgetItem(tree, {QObject::tr("Study %1").arg(study), QString()});
        for (int series = 1; series <= 3; ++series) {
            new QTreeWidgetItem(
                item, {QObject::tr("Series %1").arg(series), QString::number(series * 40)});
        }
    }
    tree->expandItem(tree->topLevelItem(0));
    tree->setColumnWidth(0, 240);
    tabs->addTab(tree, QObject::tr("Studies"));
    tabs->addTab(new QWidget(tabs), QObject::tr("Reports"));
    tabs->addTab(new QWidget(tabs), QObject::tr("Unread"));
    tabs->tabBar()->setTabData(2, true); // drawn bold by ZuStyle
    return tabs;
}

} // namespace

DemoSchemePage::DemoSchemePage(QWidget* inParent) : QWidget(inParent)
{
    loadSchemes();
    auto* layout = new QHBoxLayout(this);
    auto* side = new QVBoxLayout;
    side->addWidget(new QLabel(
        tr("Colour schemes in %1:").arg(QDir::toNativeSeparators(schemeFolder())), this));
    mSchemeList = new QListWidget(this);
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    mSchemeList->addItems(factory.styleNames());
    const QList<QListWidgetItem*> current =
        mSchemeList->findItems(factory.currentStyle(), Qt::MatchExactly);
    if (!current.isEmpty())
        mSchemeList->setCurrentItem(current.first());
    connect(mSchemeList, &QListWidget::currentTextChanged, this, &DemoSchemePage::selectScheme);
    side->addWidget(mSchemeList);
    layout->addLayout(side, 1);
    layout->addWidget(createGallery(this), 3);
}

DemoSchemePage::~DemoSchemePage() = default;

void DemoSchemePage::selectScheme(const QString& inName)
{
    ZuStyleFactory::instance().setCurrentStyle(inName);
}

QString DemoSchemePage::schemeFolder()
{
    const QString fromEnvironment = qEnvironmentVariable("ZUBASE_COLORSCHEMES");
    if (!fromEnvironment.isEmpty())
        return fromEnvironment;
    const QDir installed(QCoreApplication::applicationDirPath() +
                         QStringLiteral("/../share/zubase/colorschemes"));
    if (installed.exists())
        return installed.absolutePath();
    return QStringLiteral(ZUDEMO_SCHEME_DIR);
}

int DemoSchemePage::loadSchemes()
{
    static bool sLoaded = false;
    ZuStyleFactory& factory = ZuStyleFactory::instance();
    if (!sLoaded) {
        sLoaded = true;
        factory.addStylesFromPath(schemeFolder());
    }
    return int(factory.count());
}

QWidget* DemoSchemePage::createGallery(QWidget* inParent)
{
    auto* gallery = new QWidget(inParent);
    auto* grid = new QGridLayout(gallery);
    auto* logo = new QLabel(gallery);
    logo->setPixmap(QPixmap(QStringLiteral(":/Tessel7")));
    grid->addWidget(logo, 0, 0);
    grid->addWidget(new PanelLabel(tr("A panel in the scheme's own panel colours"), gallery), 0, 1);
    grid->addWidget(buttonsBox(gallery), 1, 0);
    grid->addWidget(inputsBox(gallery), 1, 1);
    grid->addWidget(tabsBox(gallery), 2, 0, 1, 2);
    grid->addWidget(new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, gallery),
                    3, 0, 1, 2);
    return gallery;
}
