// SPDX-License-Identifier: BSL-1.0
/// Texts for the exceptions of component libraries.
#pragma once

#include <string>
#include <typeinfo>

namespace Mz::Tools {

/// Returns bytes of a library, for example the text of an exception, for people. Null counts as
/// empty.
std::wstring foreignText(const char* text);

/// Returns the name of a type for people.
std::wstring typeText(const std::type_info& type);

/// Returns the class of the current exception, for exceptions without a text: "a value of type X".
/// Call it in a `catch` block, or in a handler of `std::terminate`.
std::wstring exceptionClass();

/// Returns the text of the current exception; for one without a text, its class. Call it in a
/// `catch` block, or in a handler of `std::terminate` if there is a current exception.
std::wstring exceptionText();

} // namespace Mz::Tools
