#include "rklib/RkHandle.h"

RkHandable::~RkHandable() = default;

void RkHandable::notifyDelete()
{
    delete this;
}
