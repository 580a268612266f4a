/// The verdicts that a scan keeps beside its list.
#pragma once

#include "components/componentTools/recordedList.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <utility>

namespace Mz::Tools {

/// What was found of a file in one state.
struct KeptVerdict {
    std::uint32_t time = 0;
    std::int64_t size = 0;
    Finding finding;
};

/// By directory and file name, both normalised.
using KeptVerdicts = std::map<std::pair<std::wstring, std::wstring>, KeptVerdict>;

/// Reads the verdicts; none when there is no such file or it makes no sense.
KeptVerdicts readVerdicts(const std::filesystem::path& file);

/// Writes them as `replaceFile` does.
void writeVerdicts(const std::filesystem::path& file, const KeptVerdicts& verdicts);

} // namespace Mz::Tools
