// SPDX-License-Identifier: BSL-1.0
/// Writes results, as lines of text or as JSON, and error messages.
#pragma once

#include "components/componentTools/console.h"
#include "components/componentTools/explain.h"
#include "components/componentTools/scan.h"

#include <cstddef>
#include <filesystem>
#include <iosfwd>
#include <nlohmann/json.hpp>
#include <string>

namespace Mz::Commands {

using Json = nlohmann::ordered_json;

/// Returns `text` in UTF-8, the encoding of JSON, in every locale.
std::string utf8(const std::wstring& text);

/// Returns the stream for results. Components cannot write to it after `reserveResults`.
std::ostream& results();

/// Reserves standard output for results: everything that components print from now on goes to
/// standard error.
void reserveResults();

/// Flushes the results. Returns false if any output was lost.
bool flushResults();

/// Writes an error message to standard error.
void printError(const std::wstring& text);

/// Returns an argument, or the text of an exception, as wide text for people.
std::wstring toWide(const std::string& bytes);

/// Returns the text of the current exception. Call it in a `catch` block only.
std::wstring exceptionText();

/// Returns a path for output, with control characters escaped.
std::wstring shown(const std::filesystem::path& path);

/// Reports a rejected old list, its copy, and a list that could not be written.
void reportList(Tools::ConsoleController& controller, const std::wstring& list,
                const Tools::ScanResult& result);

/// Writes one line to the results, with control characters escaped.
void printLine(const std::wstring& text);

/// Writes a value and a line end to the results. Non-ASCII characters are escaped, so that the
/// result is independent of encodings.
void printJson(const Json& value);

Json jsonOf(const Tools::Finding& finding);
Json jsonOf(const Tools::RecordedBuilder& builder);
Json jsonOf(const Tools::RecordedLibrary& library);

/// Returns a number with its noun: "1 file", "2 files".
std::wstring counted(std::size_t count, const wchar_t* one, const wchar_t* several);

/// Returns `text`, padded with trailing blanks to `width` characters.
std::wstring padded(std::wstring text, std::size_t width);

/// Returns the verdict's name as wide text.
std::wstring nameOf(const Tools::Finding& finding);

/// Returns whether the verdict is a fault.
bool isFault(const Tools::Finding& finding);

} // namespace Mz::Commands
