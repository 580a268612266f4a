// SPDX-License-Identifier: BSL-1.0
/// What the hostile importers do.
#pragma once

#include <string>

namespace Mz::Test {

/// Does what `name` says, or nothing if there is no such act. Returns only from acts that a process
/// survives.
void perform(const std::string& name);

} // namespace Mz::Test
