/// The system functions of a command-line program: one declaration, and one implementation per
/// system, selected by the build.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Meshes::console {

/// Makes the standard output and error write bytes unchanged, line ends included, so that the
/// output is the same on every system. Call it before anything is written.
void useBinaryOutput();

/// Returns the arguments of the program, without its name and without loss of characters.
std::vector<std::filesystem::path> arguments(int argc, char** argv);

/// Returns the folder of the program's file.
std::filesystem::path programFolder();

/// Returns the name of a file as the library's functions take it while the C locale is "C", in
/// which every program starts.
std::wstring wideName(const std::filesystem::path& path);

/// Returns the name of a file as text, the same on every system.
std::wstring fileText(const std::filesystem::path& path);

/// Returns text as it is written to the standard output; the reverse of `wideName`.
std::string outputText(std::wstring_view text);

} // namespace Meshes::console
