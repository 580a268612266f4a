// SPDX-License-Identifier: BSL-1.0
// The uid of the builder. LibraryFolder replaces its bytes in each copy of the library.
#include "identity.h"

namespace Mz::Benchmarks {

const QrUid ownUid = identityMark;

} // namespace Mz::Benchmarks
