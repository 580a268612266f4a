#include "identity.h"

namespace Mz::Benchmarks {

const QrUid ownUid = identityMark;

} // namespace Mz::Benchmarks
