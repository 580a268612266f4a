/// What Windows calls the ways in which a program can crash.
#pragma once

#include <string>

namespace Mz::Tools::System {

/// The fault with that number, as a person may know it.
std::wstring faultName(unsigned long code);

} // namespace Mz::Tools::System
