// SPDX-License-Identifier: BSL-1.0
// The uid of the builder. LibraryFolder replaces its bytes in each copy of the library.
#include "identity.h"

#include "components/base/export.h"

namespace Mz::Benchmarks {

const QrUid ownUid = identityMark;

} // namespace Mz::Benchmarks

extern "C" MZ_EXPORT const Mz::QrUid* mzBenchmarkUid() {
    return &Mz::Benchmarks::ownUid;
}
