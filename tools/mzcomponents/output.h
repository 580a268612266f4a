// SPDX-License-Identifier: BSL-1.0
/// How results look: lines of text, or JSON.
#pragma once

#include "components/componentTools/console.h"
#include "components/componentTools/explain.h"
#include "components/componentTools/scan.h"

#include <filesystem>
#include <iosfwd>
#include <nlohmann/json.hpp>
#include <string>

namespace Mz::Commands {

using Json = nlohmann::ordered_json;

/// Texts in JSON are UTF-8, whatever the locale.
std::string utf8(const std::wstring& text);

/// Where results go, and nothing else does: standard output.
std::ostream& results();

/// From now on components may print what they like: it goes to standard error.
void reserveResults();

/// Brings everything out; false when any of it was lost.
bool flushResults();

/// Says on standard error what is wrong.
void complain(const std::wstring& text);

/// What an exception or an argument says, in characters.
std::wstring widened(const std::string& bytes);

/// What the exception that is being handled says.
std::wstring wordsOfException();

/// A name as it may be printed: control characters are not left to the terminal.
std::wstring shown(const std::filesystem::path& path);

/// Says what became of the old list, and why the new one could not be written.
void tellOfList(Tools::ConsoleController& controller, const std::wstring& list,
                const Tools::ScanResult& result);

/// Prints one line.
void printLine(const std::wstring& text);

/// Prints a value and a line end. Everything beyond ASCII is escaped, so that no encoding matters.
void printJson(const Json& value);

Json jsonOf(const Tools::Finding& finding);
Json jsonOf(const Tools::RecordedBuilder& builder);
Json jsonOf(const Tools::RecordedLibrary& library);

/// `text`, with blanks behind it up to `width`.
std::wstring padded(std::wstring text, std::size_t width);

/// The verdict's name.
std::wstring nameOf(const Tools::Finding& finding);

/// Whether it is a fault of the file.
bool isFault(const Tools::Finding& finding);

} // namespace Mz::Commands
