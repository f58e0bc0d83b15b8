#include "DemoWidgetsViewsPage.h"

#include "zubase/ZuAnimatedProgressIcon.h"
#include "zubase/ZuConvert.h"
#include "zubase/ZuDateTimeEdit.h"
#include "zubase/ZuDirectionalLabel.h"
#include "zubase/ZuPixmapWidget.h"
#include "zubase/ZuProgressIcon.h"
#include "zubase/ZuTabWidget.h"
#include "zubase/ZuTabstopItemDelegate.h"

#include <QApplication>
#include <QFormLayout>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QIconEngine>
#include <QLabel>
#include <QLinearGradient>
#include <QMenu>
#include <QPainter>
#include <QPushButton>
#include <QStandardItemModel>
#include <QTableView>

#include <memory>

namespace {

// A cross in the application's current text colour, so that it follows scheme switches.
class CrossIconEngine : public QIconEngine
{
public:
    void paint(QPainter* inPainter, const QRect& inRect, QIcon::Mode, QIcon::State) override
    {
        inPainter->save();
        inPainter->setRenderHint(QPainter::Antialiasing);
        inPainter->setPen(QPen(QApplication::palette().color(QPalette::WindowText), 1.6));
        const QRectF cross = QRectF(inRect).adjusted(3.5, 3.5, -3.5, -3.5);
        inPainter->drawLine(cross.topLeft(), cross.bottomRight());
        inPainter->drawLine(cross.topRight(), cross.bottomLeft());
        inPainter->restore();
    }
    QPixmap pixmap(const QSize& inSize, QIcon::Mode inMode, QIcon::State inState) override
    {
        QPixmap pixmap(inSize);
        pixmap.fill(Qt::transparent);
        QPainter painter(&pixmap);
        paint(&painter, pixmap.rect(), inMode, inState);
        return pixmap;
    }
    QIconEngine* clone() const override { return new CrossIconEngine; }
};

// A synthetic slice: a bright disc with darker structures, as a viewer would show it.
QPixmap sampleSlice()
{
    QPixmap pixmap(256, 192);
    pixmap.fill(Qt::black);
    QPainter painter(&pixmap);
    painter.setRenderHint(QPainter::Antialiasing);
    QRadialGradient body(128, 96, 90);
    body.setColorAt(0, QColor(210, 210, 210));
    body.setColorAt(0.8, QColor(120, 120, 120));
    body.setColorAt(1, QColor(20, 20, 20));
    painter.setBrush(body);
    painter.setPen(Qt::NoPen);
    painter.drawEllipse(QPointF(128, 96), 110, 84);
    painter.setBrush(QColor(60, 60, 60));
    painter.drawEllipse(QPointF(95, 90), 24, 34);
    painter.drawEllipse(QPointF(161, 90), 24, 34);
    return pixmap;
}

QWidget* worklist(QWidget* inParent)
{
    auto* model = new QStandardItemModel(0, 1, inParent);
    model->setHorizontalHeaderLabels({QObject::tr("Patient, ID, study")});
    for (const char* row : {"Doe^Jane\t10042\tCT Thorax", "Li^Wei\t7\tMR Knee",
                            "Abercrombie^Alexander\t2203381\tCR Hand", "Ng^Ann\t55\tUS Abdomen"})
        model->appendRow(new QStandardItem(QString::fromUtf8(row)));
    auto* view = new QTableView(inParent);
    view->setModel(model);
    auto* delegate = new ZuTabstopItemDelegate(view);
    delegate->createIdentityProxyModel(model);
    delegate->setTabPatternForColumn(0, QStringLiteral("Abercrombie^Alexander\t2203381"));
    view->setItemDelegate(delegate);
    view->verticalHeader()->hide();
    view->horizontalHeader()->setStretchLastSection(true);
    return view;
}

} // namespace

DemoWidgetsViewsPage::DemoWidgetsViewsPage(QWidget* inParent) : QWidget(inParent)
{
    Q_INIT_RESOURCE(DemoProgressFrames);
    auto* layout = new QGridLayout(this);

    // Tabs: "+" asks for a menu of new tabs, close buttons and middle clicks close.
    auto* tabs = new ZuTabWidget(this);
    const QIcon closeIcon(new CrossIconEngine);
    // The worklist beside a preview of the selected study; the frame follows the scheme.
    auto* browser = new QWidget(tabs);
    auto* browserLayout = new QHBoxLayout(browser);
    browserLayout->addWidget(worklist(browser), 5);
    auto* slice = new ZuPixmapWidget(browser);
    slice->setPixmap(sampleSlice());
    slice->setBackgroundColor(Qt::black);
    slice->setOverlayTextColor(Qt::white);
    slice->setOverlayText(tr("CT 3/12"), Qt::AlignBottom | Qt::AlignLeft);
    slice->setMinimumWidth(140);
    browserLayout->addWidget(slice, 2);
    tabs->addTab(browser, tr("Worklist"));
    tabs->addTab(new QWidget(tabs), tr("Viewer"));
    tabs->addTab(new QWidget(tabs), QStringLiteral("+"));
    tabs->setCloseButton(0, closeIcon);
    tabs->setCloseButton(1, closeIcon);
    tabs->setMovable(true);
    auto* newTabMenu = new QMenu(this);
    for (const QString& kind : {tr("Worklist"), tr("Viewer"), tr("Report")}) {
        newTabMenu->addAction(kind, this, [tabs, kind, closeIcon] {
            const int index = tabs->insertTab(tabs->count() - 1, new QWidget(tabs), kind);
            tabs->setCloseButton(index, closeIcon);
            tabs->setCurrentIndex(index);
        });
    }
    connect(tabs, &ZuTabWidget::newTabMenuRequested, newTabMenu,
            [newTabMenu] { newTabMenu->popup(QCursor::pos()); });
    connect(tabs, &QTabWidget::tabCloseRequested, tabs, [tabs](int inIndex) {
        QWidget* page = tabs->widget(inIndex);
        tabs->removeTab(inIndex);
        delete page;
    });
    layout->addWidget(tabs, 0, 1, 1, 2);

    // Captions along the sides, read top to bottom and bottom to top.
    for (const auto& caption : {std::make_pair(ZuDirectionalLabel::BottomToTop, 0),
                                std::make_pair(ZuDirectionalLabel::TopToBottom, 3)}) {
        auto* label = new ZuDirectionalLabel(this);
        label->setText(tr("Study browser"));
        label->setAlignment(Qt::AlignCenter);
        label->setDirection(caption.first);
        layout->addWidget(label, 0, caption.second);
    }

    // A date edit in the product's month-name format: "Mar" or the local name, or "3".
    auto* form = new QFormLayout;
    auto* date = new ZuDateTimeEdit(this);
    date->setDisplayFormat(QStringLiteral("yyyy-MMM-dd"));
    date->setDate(QDate(2024, 3, 14));
    auto* stored = new QLabel(this);
    const auto showStored = [stored, date] {
        stored->setText(
            tr("Stored as %1").arg(Zu::dateToString(date->date(), Zu::Format::FormatCompact)));
    };
    connect(date, &QDateTimeEdit::dateTimeChanged, stored, showStored);
    showStored();
    form->addRow(tr("Study date (type a month name or number):"), date);
    form->addRow(QString(), stored);

    // The spinner's frames in a label; the animator's frames on a button while it "sends".
    auto* spinnerLabel = new QLabel(this);
    spinnerLabel->setFixedSize(24, 24);
    mSpinner = new ZuProgressIcon;
    connect(mSpinner, &ZuProgressIcon::nextPixmap, spinnerLabel, &QLabel::setPixmap);
    mSpinner->start();
    auto* receiving = new QHBoxLayout;
    receiving->addWidget(spinnerLabel);
    receiving->addWidget(new QLabel(tr("Receiving images from PACS"), this), 1);
    form->addRow(tr("Spinner:"), receiving);
    auto* send = new QPushButton(tr("Send to archive"), this);
    send->setCheckable(true);
    send->setIcon(QIcon(QStringLiteral(":images/DicomJobProcessing00")));
    // The removal at destruction calls the setter once more: by then the button is no longer a
    // QPushButton, so the setter must not touch it.
    auto alive = std::make_shared<bool>(true);
    connect(send, &QPushButton::toggled, send, [send, alive](bool inSending) {
        if (inSending)
            ZuAnimatedProgressIcon::setIconTo(send, [send, alive](const QIcon& inIcon) {
                if (*alive)
                    send->setIcon(inIcon);
            });
        else
            ZuAnimatedProgressIcon::removeIconFrom(send);
    });
    connect(send, &QObject::destroyed, [send, alive] {
        *alive = false;
        ZuAnimatedProgressIcon::removeIconFrom(send);
    });
    send->setChecked(true);
    form->addRow(tr("Animated icon:"), send);
    layout->addLayout(form, 1, 1, 1, 2);
    layout->setRowStretch(0, 1);
    layout->setColumnStretch(1, 1);
}

DemoWidgetsViewsPage::~DemoWidgetsViewsPage()
{
    delete mSpinner; // not a child: the spinner is a QObject without parent
}
