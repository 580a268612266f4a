/// What a program with a command line needs of the system: one description, and one implementation
/// for each system, chosen by the build.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Meshes::console {

/// Makes the standard output and error write bytes as they are given, line ends included, so that
/// the same output is the same file everywhere. Call it before anything is written.
void useBinaryOutput();

/// The program's arguments, without its name, with every character that the user typed.
std::vector<std::filesystem::path> arguments(int argc, char** argv);

/// Text in the form of the library's names, as it is written to the standard output: on Linux the
/// bytes of a name are its own again, on Windows it is UTF-8.
std::string outputText(std::wstring_view text);

} // namespace Meshes::console
