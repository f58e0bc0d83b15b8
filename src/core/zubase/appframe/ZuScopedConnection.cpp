#include "zubase/ZuScopedConnection.h"

#include <QObject>

class ZuScopedConnectionPrivate
{
public:
    explicit ZuScopedConnectionPrivate(const QMetaObject::Connection& inConnection)
        : mConnection(inConnection)
    {}
    ~ZuScopedConnectionPrivate() { QObject::disconnect(mConnection); }

    QMetaObject::Connection mConnection;
};

ZuScopedConnection::ZuScopedConnection(const QMetaObject::Connection& inConnection)
    : d(std::make_shared<ZuScopedConnectionPrivate>(inConnection))
{}

ZuScopedConnection::~ZuScopedConnection() = default;

void ZuScopedConnection::disconnect()
{
    d.reset();
}
