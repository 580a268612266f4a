// SPDX-License-Identifier: BSL-1.0
/// A locale with a decimal comma, for each system in its own folder.
#pragma once

namespace Mz::Benchmarks {

/// Sets a locale with a decimal comma. Returns whether there is one.
bool setDecimalComma();

} // namespace Mz::Benchmarks
