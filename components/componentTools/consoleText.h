// SPDX-License-Identifier: BSL-1.0
/// Text and arguments of command lines: conversion between wide text and what a terminal shows.
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// Returns `text` with each control character, line ends included, replaced by `\xNN`. Use it for
/// names: a terminal interprets control characters, and a line end would fake a second line.
/// \param keep  control characters that stay
MZ_COMPONENT_TOOLS_API std::wstring withoutControls(const std::wstring& text,
                                                    std::wstring_view keep = {});

/// Returns `text` as bytes for standard output. The encoding is the terminal's if standard output
/// is one, else the locale's. A character that cannot be encoded becomes '?'.
MZ_COMPONENT_TOOLS_API std::string forOutput(const std::wstring& text);

/// Returns the arguments of this process without the program's name: the original bytes on Linux,
/// UTF-8 on Windows.
/// \param count, values  the parameters of `main`; unused on Windows
MZ_COMPONENT_TOOLS_API std::vector<std::string> argumentsOfProcess(int count, char** values);

/// Returns the path that an argument from `argumentsOfProcess` names.
MZ_COMPONENT_TOOLS_API std::filesystem::path pathOf(const std::string& argument);

} // namespace Mz::Tools
