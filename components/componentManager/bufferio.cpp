// SPDX-License-Identifier: BSL-1.0
/// The virtual functions that anchor the vtable of `QrBufferedIO` in this library, so that every
/// component library shares one type description. The buffers are in buffers/.
#include "components/componentManager/bufferio.h"

namespace Mz {

QrBufferedIO::~QrBufferedIO() = default;

void QrBufferedIO::forceVtblInstantiation() {}

} // namespace Mz
