/// How results look: lines of text, or JSON.
#pragma once

#include "components/componentTools/explain.h"

#include <nlohmann/json.hpp>
#include <string>

namespace Mz::Commands {

using Json = nlohmann::ordered_json;

/// Texts in JSON are UTF-8, whatever the locale.
std::string utf8(const std::wstring& text);

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
