#include "pnresources/PnResourceLayer.h"

namespace PnResourceLayer {

int interfaceVersion()
{
    return 1;
}

} // namespace PnResourceLayer
