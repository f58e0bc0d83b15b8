#include "zubase/ZuProxyModelItemDelegate.h"

#include <QIdentityProxyModel>

ZuProxyModelItemDelegate::ZuProxyModelItemDelegate(QObject* inParent) : QItemDelegate(inParent) {}

ZuProxyModelItemDelegate::~ZuProxyModelItemDelegate() = default;

namespace {

// Mapping an index of a model other than the proxy's source asserts in the proxy and would
// paint another row; such an index is painted as it is.
bool mapsIndex(const QAbstractProxyModel* inProxy, const QModelIndex& inIndex)
{
    return inProxy && inIndex.model() && inIndex.model() == inProxy->sourceModel();
}

} // namespace

void ZuProxyModelItemDelegate::paint(QPainter* inPainter, const QStyleOptionViewItem& inOption,
                                     const QModelIndex& inIndex) const
{
    if (mapsIndex(mProxyModel, inIndex))
        paintProxiedModel(inPainter, inOption, mProxyModel->mapFromSource(inIndex));
    else
        QItemDelegate::paint(inPainter, inOption, inIndex);
}

QSize ZuProxyModelItemDelegate::sizeHint(const QStyleOptionViewItem& inOption,
                                         const QModelIndex& inIndex) const
{
    if (mapsIndex(mProxyModel, inIndex))
        return QItemDelegate::sizeHint(inOption, mProxyModel->mapFromSource(inIndex));
    return QItemDelegate::sizeHint(inOption, inIndex);
}

void ZuProxyModelItemDelegate::setProxyModel(QAbstractProxyModel* inProxy)
{
    mProxyModel = inProxy;
}

void ZuProxyModelItemDelegate::createIdentityProxyModel(QAbstractItemModel* inModel)
{
    if (!inModel)
        return;
    auto* proxy = new QIdentityProxyModel(inModel);
    proxy->setSourceModel(inModel);
    setProxyModel(proxy);
}

void ZuProxyModelItemDelegate::paintProxiedModel(QPainter* inPainter,
                                                 const QStyleOptionViewItem& inOption,
                                                 const QModelIndex& inProxyIndex) const
{
    QItemDelegate::paint(inPainter, inOption, inProxyIndex);
}
