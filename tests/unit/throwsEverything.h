// SPDX-License-Identifier: BSL-1.0
/// A library that throws each exception there is.
#pragma once

namespace Mz::Test {

using ThrowFunction = void(int which);
inline constexpr const char* throwFunctionName = "throwException";

} // namespace Mz::Test
