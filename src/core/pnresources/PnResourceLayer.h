#pragma once

#include "pnresources/pnresources_export.h"

// The installation-resource layer. Its parameter-file reader arrives with the installation
// registry; for now the layer only reports its interface version.
namespace PnResourceLayer {

// Interface version of the layer; hosts may compare it with the one they were built against.
PNRESOURCES_EXPORT int interfaceVersion();

} // namespace PnResourceLayer
