#pragma once

#include "zubase/zubase_export.h"

#include <QMetaObject>

#include <memory>

class ZuScopedConnectionPrivate;

// Keeps a signal-slot connection for as long as any copy of it lives: the connection is broken
// when the last copy is destroyed or disconnect()ed. Copies may live in different threads.
class ZUBASE_EXPORT ZuScopedConnection
{
public:
    ZuScopedConnection() = default;
    ZuScopedConnection(const QMetaObject::Connection& inConnection);
    ZuScopedConnection(const ZuScopedConnection&) = default;
    ZuScopedConnection& operator=(const ZuScopedConnection&) = default;
    ~ZuScopedConnection();

    // Drops this copy's share at once; the connection stays while other copies hold it.
    void disconnect();

private:
    std::shared_ptr<ZuScopedConnectionPrivate> d;
};
