// SPDX-License-Identifier: BSL-1.0
/// The class of an exception comes from the runtime of the compiler, which knows it even for
/// exceptions that are not classes.
#include "components/componentTools/probing/exceptionText.h"

#include "components/base/exBase.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/platform/system.h"

#include <cstdlib>
#include <cxxabi.h>
#include <exception>
#include <memory>
#include <typeinfo>

namespace Mz::Tools {

std::wstring foreignText(const char* text) {
    return System::displayName(System::pathOfArgument(text ? text : ""));
}

std::wstring typeText(const std::type_info& type) {
    int failure = 0;
    const std::unique_ptr<char, decltype(&std::free)> name(
        abi::__cxa_demangle(type.name(), nullptr, nullptr, &failure), &std::free);
    return foreignText(name ? name.get() : type.name());
}

std::wstring exceptionClass() {
    // For an exception of another runtime, whose class is no C++ type, there is no exception_ptr.
    // The runtime would take memory in front of it for its type.
    const std::type_info* type =
        std::current_exception() ? abi::__cxa_current_exception_type() : nullptr;
    if (!type)
        return L"an exception of another language";
    return L"a value of type " + typeText(*type);
}

std::wstring exceptionText() {
    try {
        throw;
    } catch (const ExBase& failure) {
        return displayText(failure.getReason());
    } catch (const std::exception& failure) {
        return foreignText(failure.what());
    } catch (...) {
        return exceptionClass();
    }
}

} // namespace Mz::Tools
