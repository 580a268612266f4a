// SPDX-License-Identifier: BSL-1.0
/// Names only the properties that differ, so that the sentence shows what has to change. The other
/// side is the build of this library, which has the ABI of the libMZcomponentManager that it links.
#include "components/componentTools/inspecting/abiDifference.h"

#include <string>

namespace Mz::Tools {

namespace {

constexpr ComponentStamp own MZ_STAMP_VALUE;

/// A value that only newer versions know is shown as its number.
template <class Value>
std::wstring numbered(const wchar_t* what, Value value) {
    return what + (L" number " + std::to_wstring(static_cast<unsigned int>(value)));
}

std::wstring versionName(const ComponentStamp& stamp) {
    return L"SOVERSION " + std::to_wstring(stamp.soVersion) + L" (version " +
           std::to_wstring(stamp.version[0]) + L"." + std::to_wstring(stamp.version[1]) + L"." +
           std::to_wstring(stamp.version[2]) + L")";
}

std::wstring cxxAbiName(const ComponentStamp& stamp) {
    switch (stamp.cxxAbi) {
    case CxxAbi::unknown: return L"an unknown C++ ABI";
    case CxxAbi::itanium: return L"the Itanium C++ ABI";
    case CxxAbi::microsoft: return L"the C++ ABI of MSVC";
    }
    return numbered(L"C++ ABI", stamp.cxxAbi);
}

std::wstring stringAbiName(const ComponentStamp& stamp) {
    switch (stamp.stringAbi) {
    case StringAbi::unknown: return L"an unknown standard library";
    case StringAbi::libstdcxx: return L"libstdc++ with _GLIBCXX_USE_CXX11_ABI=1";
    case StringAbi::libstdcxxOld: return L"libstdc++ with _GLIBCXX_USE_CXX11_ABI=0";
    case StringAbi::libcxx: return L"libc++";
    case StringAbi::libcxxNext: return L"libc++ with _LIBCPP_ABI_VERSION=2";
    }
    return numbered(L"standard library", stamp.stringAbi);
}

std::wstring debugName(const ComponentStamp& stamp) {
    switch (stamp.containerDebug) {
    case 0: return L"containers without debug mode";
    case 1: return L"containers in debug mode (_GLIBCXX_DEBUG)";
    default: return numbered(L"debug mode", stamp.containerDebug);
    }
}

std::wstring wideCharName(const ComponentStamp& stamp) {
    return L"wchar_t of " + std::to_wstring(stamp.wideCharSize) + L" bytes";
}

void append(std::wstring& list, const std::wstring& item) {
    list += (list.empty() ? L"" : L", ") + item;
}

} // namespace

std::optional<Finding> abiDifference(const ComponentStamp& stamp) {
    Finding finding{Verdict::otherAbi, {}, {}};
    const auto compare = [&](auto field, auto name) {
        if (stamp.*field == own.*field)
            return;
        append(finding.subject, name(stamp));
        append(finding.words, name(own));
    };
    compare(&ComponentStamp::soVersion, versionName);
    compare(&ComponentStamp::cxxAbi, cxxAbiName);
    compare(&ComponentStamp::stringAbi, stringAbiName);
    compare(&ComponentStamp::containerDebug, debugName);
    compare(&ComponentStamp::wideCharSize, wideCharName);
    return finding.subject.empty() ? std::nullopt : std::optional(std::move(finding));
}

std::wstring textOf(const ComponentStamp& stamp) {
    return versionName(stamp) + L", " + cxxAbiName(stamp) + L", " + stringAbiName(stamp) + L", " +
           debugName(stamp) + L", " + wideCharName(stamp);
}

std::wstring ownStampText() {
    return textOf(own);
}

std::optional<Finding> abiDifference(const LibraryImage& image) {
    return image.stamp ? abiDifference(*image.stamp) : std::nullopt;
}

} // namespace Mz::Tools
