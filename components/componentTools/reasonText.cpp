// SPDX-License-Identifier: BSL-1.0
/// Only the reasons of failed openings have a second line, which follows a fixed text. The line end
/// is recognised by that text, so that line ends in file names and other reasons are kept.
#include "components/componentTools/reasonText.h"

#include "components/componentManager/nativeText.h"

#include <cstddef>
#include <initializer_list>
#include <string_view>

namespace Mz::Tools {

std::wstring reasonText(const char* reason) {
    std::wstring text = displayText(reason ? reason : "");
    for (const std::wstring_view ending : {L"input stream\n", L"output stream\n"})
        if (const std::size_t at = text.find(ending); at != std::wstring::npos)
            text.replace(at + ending.size() - 1, 1, L": ");
    return text;
}

} // namespace Mz::Tools
