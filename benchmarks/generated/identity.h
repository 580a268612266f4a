// SPDX-License-Identifier: BSL-1.0
/// The uid of the builder in a generated component library. The file contains it as plain bytes,
/// which are replaced in each copy.
#pragma once

#include "components/componentManager/cast.h"

namespace Mz::Benchmarks {

/// The uid in the compiled file. `w1` to `w3` occur nowhere else in the file.
inline constexpr QrUid identityMark{0x3D000000, 0x91E7C46A, 0x2B58F0D3, 0xC60F8E75};

/// Returns the uid of the builder in the copy with this number.
constexpr QrUid generatedUid(unsigned int number) {
    return {identityMark.w0 + number, identityMark.w1, identityMark.w2, identityMark.w3};
}

/// The uid of this copy. It is defined in a separate source, so that the compiler cannot fold it.
extern const QrUid ownUid;

} // namespace Mz::Benchmarks
