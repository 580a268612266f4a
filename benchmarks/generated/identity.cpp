// SPDX-License-Identifier: BSL-1.0
#include "identity.h"

namespace Mz::Benchmarks {

const QrUid ownUid = identityMark;

} // namespace Mz::Benchmarks
