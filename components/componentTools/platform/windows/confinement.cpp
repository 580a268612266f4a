// SPDX-License-Identifier: BSL-1.0
/// Windows has no call by which a running process gives up writing or the network. The limits of
/// the child's job are set by the parent process.
#include "components/componentTools/platform/confinement.h"

namespace Mz::Tools::System {

Confinement confineToReading() {
    return {};
}

} // namespace Mz::Tools::System
