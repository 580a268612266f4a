// SPDX-License-Identifier: BSL-1.0
/// The identity of a generated component library. It stands in the file as plain bytes, which each
/// copy of the file has replaced by its own.
#pragma once

#include "components/componentManager/cast.h"

namespace Mz::Benchmarks {

/// What the compiled file holds; `w1` to `w3` occur nowhere else in it.
inline constexpr QrUid identityMark{0x3D000000, 0x91E7C46A, 0x2B58F0D3, 0xC60F8E75};

/// The identity of the builder in the copy with this number.
constexpr QrUid generatedUid(unsigned int number) {
    return {identityMark.w0 + number, identityMark.w1, identityMark.w2, identityMark.w3};
}

/// The identity of this copy, from a source of its own, so that no compiler folds it away.
extern const QrUid ownUid;

} // namespace Mz::Benchmarks
