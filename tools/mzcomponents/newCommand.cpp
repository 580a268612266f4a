// SPDX-License-Identifier: BSL-1.0
/// Makes all files in memory first, so that only the file system can fail once writing begins.
#include "tools/mzcomponents/newCommand.h"

#include "components/componentManager/files.h"
#include "components/componentTools/consoleText.h"
#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/newFolder.h"
#include "tools/mzcomponents/output.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <filesystem>
#include <set>
#include <string_view>

namespace Mz::Commands {

namespace {

constexpr std::size_t longestName = 64; // File names are made of it.
constexpr std::size_t longestExtension = 32;

bool isLower(char c) {
    return c >= 'a' && c <= 'z';
}
bool isUpper(char c) {
    return c >= 'A' && c <= 'Z';
}
bool isDigit(char c) {
    return c >= '0' && c <= '9';
}
bool isInName(char c) {
    return isLower(c) || isUpper(c) || isDigit(c) || c == '_';
}
bool isInExtension(char c) {
    return isLower(c) || isDigit(c) || c == '_' || c == '-' || c == '+';
}

std::string inQuotes(const std::string& text) {
    return "\"" + text + "\"";
}

bool isKeyword(const std::string& name) {
    static const std::set<std::string_view> keywords = {
        "alignas",       "alignof",     "and",
        "and_eq",        "asm",         "auto",
        "bitand",        "bitor",       "bool",
        "break",         "case",        "catch",
        "char",          "char16_t",    "char32_t",
        "char8_t",       "class",       "co_await",
        "co_return",     "co_yield",    "compl",
        "concept",       "const",       "const_cast",
        "consteval",     "constexpr",   "constinit",
        "continue",      "decltype",    "default",
        "delete",        "do",          "double",
        "dynamic_cast",  "else",        "enum",
        "explicit",      "export",      "extern",
        "false",         "float",       "for",
        "friend",        "goto",        "if",
        "inline",        "int",         "long",
        "mutable",       "namespace",   "new",
        "noexcept",      "not",         "not_eq",
        "nullptr",       "operator",    "or",
        "or_eq",         "private",     "protected",
        "public",        "register",    "reinterpret_cast",
        "requires",      "return",      "short",
        "signed",        "sizeof",      "static",
        "static_assert", "static_cast", "struct",
        "switch",        "template",    "this",
        "thread_local",  "throw",       "true",
        "try",           "typedef",     "typeid",
        "typename",      "union",       "unsigned",
        "using",         "virtual",     "void",
        "volatile",      "wchar_t",     "while",
        "xor",           "xor_eq"};
    return keywords.contains(name);
}

// Validators of values. Each returns an error message; empty if the value is valid.
std::string isName(const std::string& name) {
    if (name.empty() || !(isLower(name.front()) || isUpper(name.front())) ||
        !std::all_of(name.begin(), name.end(), isInName))
        return inQuotes(name) +
               " is not an identifier of C++: use letters, digits and _, and begin "
               "with a letter";
    if (name.find("__") != std::string::npos)
        return inQuotes(name) + " is reserved for the compiler: use no two _ in a row";
    if (isKeyword(name))
        return inQuotes(name) + " is a keyword of C++: choose another name";
    if (name.size() > longestName)
        return inQuotes(name) + " is too long: use at most " + std::to_string(longestName) +
               " characters";
    return "";
}

std::string isExtension(const std::string& extension) {
    if (extension.find_first_of(".*?") != std::string::npos)
        return inQuotes(extension) + " has a dot or a wildcard: write the letters after the dot, "
                                     "such as \"txt\"";
    if (std::any_of(extension.begin(), extension.end(), isUpper)) {
        std::string lower = extension;
        std::transform(lower.begin(), lower.end(), lower.begin(),
                       [](char c) { return isUpper(c) ? static_cast<char>(c - 'A' + 'a') : c; });
        return inQuotes(extension) + " has capitals: write " + inQuotes(lower) +
               ", which stands for both";
    }
    if (extension.empty() || extension.size() > longestExtension ||
        !std::all_of(extension.begin(), extension.end(), isInExtension))
        return inQuotes(extension) + " is not an extension: use up to " +
               std::to_string(longestExtension) + " lower-case letters, digits, _, - and +";
    return "";
}

std::string namesAFolder(const std::string& path) {
    return path.empty() ? "it names no folder" : "";
}

/// \throws CLI::ValidationError  if one is given twice
void checkTwins(const std::vector<std::string>& extensions) {
    std::set<std::string> seen;
    for (const std::string& extension : extensions)
        if (!seen.insert(extension).second)
            throw CLI::ValidationError("--extension", inQuotes(extension) + " is given twice");
}

CLI::App* addKind(CLI::App& app, const char* kind, const char* text, const char* example,
                  NewArguments& arguments, std::function<int()>& command) {
    CLI::App* const added = app.add_subcommand(kind, text);
    added
        ->add_option("NAME", arguments.project.name,
                     "The name of the project and its classes, an identifier of C++")
        ->type_name("")
        ->required()
        ->check(isName);
    added
        ->add_option("--directory", arguments.directory,
                     "The folder to write to, which is new or empty. The default is NAME")
        ->type_name("PATH")
        ->check(namesAFolder);
    added->footer(std::string("Example:\n  ") + example);
    added->callback([&arguments, &command, kind] {
        arguments.project.kind = kind;
        checkTwins(arguments.project.extensions);
        command = [&arguments] { return newProject(arguments); };
    });
    return added;
}

/// Returns a word for the shell of the system.
std::wstring shellWord(const std::wstring& word) {
    constexpr bool posix = std::filesystem::path::preferred_separator == '/';
    constexpr std::wstring_view plain = L"abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ"
                                        L"0123456789_-+./\\:";
    if (word.find_first_not_of(posix ? plain.substr(0, plain.find(L'\\')) : plain) ==
        std::wstring::npos)
        return word;
    if constexpr (!posix)
        return L"\"" + word + L"\"";
    std::wstring result = L"'";
    for (const wchar_t c : word)
        result += c == L'\'' ? std::wstring(L"'\\''") : std::wstring(1, c);
    return result + L"'";
}

/// Returns the folder in which CMake finds the library; empty if it searches there
/// anyway.
std::wstring neededPrefix() {
    const std::filesystem::path program = programFolder();
    if (!std::filesystem::exists(program / MZ_PACKAGE_FOLDER))
        return L"PREFIX"; // This program is not installed.
    const std::filesystem::path prefix = program.parent_path();
    return prefix == "/usr" || prefix == "/usr/local" ? L"" : shown(prefix);
}

void printNextCommands(const NewArguments& arguments) {
    const std::wstring prefix = neededPrefix();
    const std::wstring workflow = L"cmake --workflow --preset " MZ_PRESET;
    printLine(L"Build it, run it and check it:");
    printLine(L"  cd " + shellWord(toWide(arguments.directory)));
    if (prefix.empty()) {
        printLine(L"  " + workflow);
    } else if constexpr (std::filesystem::path::preferred_separator == '/') {
        printLine(L"  CMAKE_PREFIX_PATH=" + shellWord(prefix) + L" " + workflow);
    } else {
        printLine(L"  set \"CMAKE_PREFIX_PATH=" + prefix + L"\"");
        printLine(L"  " + workflow);
    }
    if (prefix == L"PREFIX")
        printLine(L"PREFIX is the folder in which libMZcomponentManager is installed.");
}

/// Reports the current exception, and what it left.
int reportFailure(NewFolder& folder) {
    const std::wstring reason = exceptionText();
    const std::vector<std::filesystem::path> left = folder.remove();
    printError(reason + (left.empty() ? L". Nothing was left behind." : L""));
    for (const std::filesystem::path& path : left)
        printError(shown(path) + L": this was written and could not be removed");
    return exitFailure;
}

int writeProject(const NewArguments& arguments, const std::filesystem::path& folder) {
    const std::vector<ProjectFile> files = filesOf(arguments.project);
    NewFolder written(folder);
    try {
        for (const ProjectFile& file : files)
            written.write(file.path, file.content);
    } catch (...) {
        return reportFailure(written);
    }
    written.keep();
    printLine(shown(folder) + L": " + counted(files.size(), L"file", L"files"));
    for (const ProjectFile& file : files)
        printLine(L"  " + toWide(file.path));
    printNextCommands(arguments);
    return exitSuccess;
}

} // namespace

void addNewCommand(CLI::App& app, NewArguments& arguments, std::function<int()>& command) {
    CLI::App* const made = app.add_subcommand(
        "new", "Writes a small project that builds and passes its tests: a component, an importer "
               "or a host.");
    made->require_subcommand(1);
    made->footer("Example:\n  mzcomponents new component gauge");
    addKind(*made, "component", "A component with an interface, and a host that uses it.",
            "mzcomponents new component gauge", arguments, command);
    CLI::App* const importer =
        addKind(*made, "importer", "A component that imports a text format, and a host.",
                "mzcomponents new importer notes --extension note", arguments, command);
    importer
        ->add_option("--extension", arguments.project.extensions,
                     "An extension of the files, without dot; may be repeated")
        ->type_name("EXT")
        ->required()
        ->allow_extra_args(false) // What follows it is the name.
        ->check(isExtension);
    addKind(*made, "host", "A program with components, and a component for it.",
            "mzcomponents new host viewer", arguments, command);
}

int newProject(const NewArguments& given) {
    NewArguments arguments = given;
    if (arguments.directory.empty())
        arguments.directory = arguments.project.name;
    const std::filesystem::path folder = fullPath(Tools::pathOf(arguments.directory));
    if (shown(folder).find(L';') != std::wstring::npos) {
        printError(shown(folder) + L": the name contains a semicolon, which separates the folders "
                                   L"of a search path. Choose another one with --directory");
        return exitUsage;
    }
    const std::wstring obstacle = obstacleToNew(folder);
    if (!obstacle.empty()) {
        printError(obstacle + L". Choose another folder with --directory");
        return exitFailure;
    }
    return writeProject(arguments, folder);
}

} // namespace Mz::Commands
