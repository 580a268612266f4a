// SPDX-License-Identifier: BSL-1.0
/// The function of the library that throws each exception class.
#pragma once

namespace Mz::Test {

using ThrowFunction = void(int which);
inline constexpr const char* throwFunctionName = "throwException";

} // namespace Mz::Test
