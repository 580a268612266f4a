#include "components/componentManager/bufferio.h"

namespace Mz {

QrBufferedIO::~QrBufferedIO() = default;

void QrBufferedIO::forceVtblInstantiation() {}

} // namespace Mz
