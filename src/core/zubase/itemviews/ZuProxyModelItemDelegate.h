#pragma once

#include "zubase/zubase_export.h"

#include <QItemDelegate>
#include <QPointer>

class QAbstractItemModel;
class QAbstractProxyModel;

// Paints and sizes a view's cells through a proxy model: the view works on the source model
// (and its selection), the cells show the proxy's data for the mapped index. Without a live
// proxy, or for an index of another model, cells are painted and sized like QItemDelegate.
class ZUBASE_EXPORT ZuProxyModelItemDelegate : public QItemDelegate
{
public:
    explicit ZuProxyModelItemDelegate(QObject* inParent = nullptr);
    ~ZuProxyModelItemDelegate() override;

    QSize sizeHint(const QStyleOptionViewItem& inOption, const QModelIndex& inIndex) const override;
    // The proxy is not owned; it may be destroyed at any time.
    virtual void setProxyModel(QAbstractProxyModel* inProxy);
    // Uses a new QIdentityProxyModel over inModel, owned by inModel.
    void createIdentityProxyModel(QAbstractItemModel* inModel);

protected:
    // Paints one cell with the proxy's index.
    virtual void paintProxiedModel(QPainter* inPainter, const QStyleOptionViewItem& inOption,
                                   const QModelIndex& inProxyIndex) const;

private:
    void paint(QPainter* inPainter, const QStyleOptionViewItem& inOption,
               const QModelIndex& inIndex) const override;

    QPointer<QAbstractProxyModel> mProxyModel;
};
