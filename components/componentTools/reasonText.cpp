/// Only the reasons of failed openings have two lines: a fixed text, and the file's name with the
/// system's error. They are recognised by that fixed text, so that other line ends are kept.
#include "components/componentTools/reasonText.h"

#include "components/componentManager/nativeText.h"

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
