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

/// The folder that the program's file stands in.
std::filesystem::path programFolder();

/// The name of a file as the component libraries want it: as buffered IO converts text while the C
/// locale is "C", which a program has unless it changes it.
std::wstring wideName(const std::filesystem::path& path);

/// The name of a file as text, the same for the same name on every system.
std::wstring fileText(const std::filesystem::path& path);

/// The way back from `wideName`: text as it is written to the standard output.
std::string outputText(std::wstring_view text);

} // namespace Meshes::console
