// SPDX-License-Identifier: BSL-1.0
/// Normalises a path in one pass from left to right.
///
/// The input is a view from which roots, names and separators are removed at the front, and the
/// output grows at the end. No name is ever removed from the output again: ".." removes only the
/// separator before it. The rules are odd, but recorded lists depend on them.
#include "components/platform/pathNormaliser.h"

#include "components/platform/platform.h"
#include "components/platform/searchPath.h"

#include <algorithm>
#include <cstddef>
#include <string_view>
#include <utility>

namespace Mz {

namespace {

bool isSeparator(wchar_t c) {
    return c == L'/' || c == L'\\';
}

bool isLetter(wchar_t c) {
    return (c >= L'a' && c <= L'z') || (c >= L'A' && c <= L'Z');
}

/// Removes the leading characters for which `belongs` is true from `rest`, and returns them.
template <class Predicate>
std::wstring_view takeWhile(std::wstring_view& rest, Predicate belongs) {
    const auto end = std::find_if_not(rest.begin(), rest.end(), belongs);
    const std::wstring_view taken = rest.substr(0, static_cast<std::size_t>(end - rest.begin()));
    rest.remove_prefix(taken.size());
    return taken;
}

std::wstring_view takeName(std::wstring_view& rest) {
    return takeWhile(rest, [](wchar_t c) { return !isSeparator(c); });
}

std::wstring_view takeSeparators(std::wstring_view& rest) {
    return takeWhile(rest, isSeparator);
}

/// Moves the root of `rest`, if there is one, to `result`.
void copyRoot(std::wstring_view& rest, std::wstring& result) {
    if (rest.starts_with(L"\\\\")) {
        result += rest.substr(0, 2);
        rest.remove_prefix(2);
        result += takeName(rest); // The server
        result += takeSeparators(rest);
        result += takeName(rest); // The share
    } else if (rest.size() > 1 && isLetter(rest[0]) && rest[1] == L':') {
        result += rest.substr(0, 2);
        rest.remove_prefix(2);
    }
    if (!takeSeparators(rest).empty())
        result += L'\\';
}

/// Appends the normal form of one path to `result`.
void appendEntry(std::wstring_view rest, std::wstring& result) {
    copyRoot(rest, result);
    const std::size_t rootEnd = result.size();
    while (!rest.empty()) {
        const std::wstring_view name = takeName(rest);
        if (name == L".." && result.size() > rootEnd)
            result.pop_back(); // The separator before it. The one after it follows below.
        else if (name != L".")
            result += name;
        if (!takeSeparators(rest).empty() && !rest.empty())
            result += L'\\';
    }
}

/// Returns whether the letter case is all that normalisation changes. File names on Linux may
/// contain a '\', and begin as a drive does.
bool isPlainName(std::wstring_view name) {
    return name.size() > 2 && name[1] != L':' &&
           std::none_of(name.begin(), name.end(), isSeparator);
}

} // namespace

std::wstring normalisePath(const wchar_t* path, bool listMode) {
    if (!path)
        return {};
    std::wstring_view rest(path);
    std::wstring result;
    if (!listMode) {
        appendEntry(rest, result);
    } else {
        bool isFirst = true;
        for (std::wstring_view next; !(next = platform::takeDirectory(rest)).empty();) {
            if (!std::exchange(isFirst, false))
                result += platform::searchPathSeparator<wchar_t>;
            appendEntry(next, result);
        }
    }
    return platform::lowerCase(result.empty() ? std::wstring(L".") : std::move(result));
}

std::wstring normaliseName(std::wstring name) {
    return isPlainName(name) ? platform::lowerCase(std::move(name))
                             : normalisePath(name.c_str(), false);
}

} // namespace Mz
