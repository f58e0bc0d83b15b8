#include "DemoWidgetsTextPage.h"

#include "zubase/ZuAutoTrimLineEdit.h"
#include "zubase/ZuContainsStringValidator.h"
#include "zubase/ZuDicomNodeItems.h"
#include "zubase/ZuFindReplaceDialog.h"
#include "zubase/ZuHeaderColumnFixer.h"
#include "zubase/ZuIntValidator.h"
#include "zubase/ZuKeyEater.h"
#include "zubase/ZuLineEdit.h"
#include "zubase/ZuMouseWheelHelper.h"
#include "zubase/ZuNoWheelComboBox.h"
#include "zubase/ZuRegExpValidator.h"
#include "zubase/ZuStartsWithStringValidator.h"
#include "zubase/ZuTextEdit.h"

#include <QFormLayout>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QTableWidget>
#include <QTreeWidget>
#include <QVBoxLayout>
#include <QWheelEvent>

namespace {

// Counts whole wheel steps, however finely the wheel reports them.
class WheelLabel : public QLabel
{
public:
    explicit WheelLabel(QWidget* inParent) : QLabel(inParent)
    {
        setFrameShape(QFrame::StyledPanel);
        setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Fixed);
        show(0);
    }

protected:
    void wheelEvent(QWheelEvent* inEvent) override
    {
        mSteps += mHelper.calcMouseWheelStepsFor120Ticks(inEvent->angleDelta().y());
        show(mSteps);
    }

private:
    void show(int inSteps) { setText(tr("Wheel here: %1 steps").arg(inSteps)); }

    ZuMouseWheelHelper mHelper;
    int mSteps = 0;
};

QWidget* findBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("Text edit with find and replace"), inParent);
    auto* layout = new QVBoxLayout(box);
    auto* edit = new ZuTextEdit(box);
    edit->setPlainText(
        QObject::tr("CT head without contrast.\nNo acute bleeding. Contrast study follows.\n"
                    "Comparison with the contrast series of last year: unchanged."));
    layout->addWidget(edit);
    layout->addWidget(new QLabel(QObject::tr("Ctrl+F or the context menu: Find..."), box));

    // A second dialog, never shown, that only marks: hosts reach Find All by name.
    auto* marker = new ZuFindReplaceDialog(box);
    marker->setDocument(edit);
    auto* markField = marker->findChildren<QLineEdit*>().value(0);
    auto* row = new QHBoxLayout;
    auto* mark = new QLineEdit(QObject::tr("contrast"), box);
    auto* markButton = new QPushButton(QObject::tr("Mark all"), box);
    row->addWidget(mark);
    row->addWidget(markButton);
    layout->addLayout(row);
    const auto markAll = [marker, markField, mark] {
        markField->setText(mark->text());
        QMetaObject::invokeMethod(marker, "findAllClicked");
    };
    QObject::connect(markButton, &QPushButton::clicked, box, markAll);
    markAll();
    return box;
}

QWidget* lineEditBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("Line edits and validators"), inParent);
    auto* form = new QFormLayout(box);
    auto* sized = new ZuLineEdit(box);
    sized->setTextForMinimumSize(QStringLiteral("0000"));
    sized->setText(QStringLiteral("512"));
    sized->setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Fixed); // as wide as the sample
    form->addRow(QObject::tr("Sized to 0000:"), sized);
    auto* trimmed = new ZuAutoTrimLineEdit(box);
    trimmed->setPlaceholderText(QObject::tr("Paste lines"));
    form->addRow(QObject::tr("Auto-trim:"), trimmed);
    const auto validated = [box, form](const QString& inLabel, const QString& inText,
                                       QValidator* inValidator) {
        auto* edit = new QLineEdit(inText, box);
        edit->setValidator(inValidator);
        inValidator->setParent(edit);
        form->addRow(inLabel, edit);
    };
    validated(QObject::tr("Slices 1-500:"), QStringLiteral("120"),
              new ZuIntValidator(1, 500, nullptr));
    validated(QObject::tr("Up to 3 digits:"), QStringLiteral("042"),
              new ZuRegExpValidator(QRegExp(QStringLiteral("\\d{0,3}")), nullptr));
    validated(QObject::tr("Address with @:"), QStringLiteral("pacs@hospital"),
              new ZuContainsStringValidator(QStringLiteral("@"), nullptr));
    validated(QObject::tr("Node ID:"), QStringLiteral("DCM-0042"),
              new ZuStartsWithStringValidator(QStringLiteral("DCM-"), nullptr));
    return box;
}

QWidget* filterBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("Input filters"), inParent);
    auto* form = new QFormLayout(box);
    auto* combo = new ZuNoWheelComboBox(box);
    combo->addItems({QStringLiteral("CT"), QStringLiteral("MR"), QStringLiteral("US")});
    form->addRow(QObject::tr("Wheel ignored:"), combo);
    auto* noBlanks = new QLineEdit(QStringLiteral("AE_TITLE"), box);
    new ZuKeyEater(noBlanks, Qt::Key_Space);
    form->addRow(QObject::tr("Space eaten:"), noBlanks);
    form->addRow(new WheelLabel(box));
    auto* table = new QTableWidget(1, 3, box);
    table->setHorizontalHeaderLabels(
        {QObject::tr("Name"), QObject::tr("Modality"), QObject::tr("Date")});
    const char* const cells[] = {"Doe^Jane", "CT", "2024-05-02"};
    for (int column = 0; column < 3; ++column)
        table->setItem(0, column, new QTableWidgetItem(QString::fromLatin1(cells[column])));
    table->horizontalHeader()->setSectionsMovable(true);
    table->horizontalHeader()->setSectionResizeMode(QHeaderView::Stretch);
    new ZuHeaderColumnFixer(table->horizontalHeader(), 0);
    table->verticalHeader()->hide();
    table->setFixedHeight(table->horizontalHeader()->sizeHint().height() + table->rowHeight(0) +
                          2 * table->frameWidth());
    form->addRow(new QLabel(QObject::tr("Drag the columns; Name stays first:"), box));
    form->addRow(table);
    return box;
}

QWidget* nodeBox(QWidget* inParent)
{
    auto* box = new QGroupBox(QObject::tr("DICOM nodes"), inParent);
    auto* layout = new QVBoxLayout(box);
    auto* filter = new QLineEdit(box);
    filter->setPlaceholderText(QObject::tr("Filter nodes"));
    filter->setClearButtonEnabled(true);
    auto* tree = new QTreeWidget(box);
    tree->setHeaderHidden(true);
    tree->setRootIsDecorated(false);
    auto* checked = new QLabel(box);
    checked->setWordWrap(true);
    layout->addWidget(filter);
    layout->addWidget(tree);
    layout->addWidget(checked);

    // The list is a value; the lambdas below share one copy.
    auto nodes = std::make_shared<ZuDicomNodeItems>();
    nodes->setTreeWidget(tree);
    for (const char* name : {"PACS_MAIN", "CT_SCANNER_1", "MR_3T", "US_WARD", "ARCHIVE_OLD",
                             "PET_CT", "WORKSTATION_7"})
        nodes->addDicomNode(QString::fromLatin1(name));
    tree->topLevelItem(0)->setCheckState(0, Qt::Checked);
    tree->topLevelItem(3)->setCheckState(0, Qt::Checked);
    const auto showChecked = [nodes, checked] {
        checked->setText(QObject::tr("Checked: %1").arg(nodes->selectedDicomNodes().join(", ")));
    };
    QObject::connect(tree, &QTreeWidget::itemChanged, checked, showChecked);
    QObject::connect(filter, &QLineEdit::textChanged, tree,
                     [nodes](const QString& inText) { nodes->applyFilter(inText); });
    showChecked();
    return box;
}

} // namespace

DemoWidgetsTextPage::DemoWidgetsTextPage(QWidget* inParent) : QWidget(inParent)
{
    auto* layout = new QGridLayout(this);
    layout->addWidget(findBox(this), 0, 0);
    layout->addWidget(lineEditBox(this), 0, 1);
    layout->addWidget(filterBox(this), 1, 0);
    layout->addWidget(nodeBox(this), 1, 1);
}
