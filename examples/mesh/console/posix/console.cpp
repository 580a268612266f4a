/// On Linux names are bytes. The program stays in the "C" locale, so each byte is one wide
/// character and back again: every name passes through unchanged, whatever its encoding.
#include "../console.h"

namespace Meshes::console {

void useBinaryOutput() {}

std::vector<std::filesystem::path> arguments(int argc, char** argv) {
    return {argv + (argc > 0 ? 1 : 0), argv + argc};
}

std::filesystem::path programFolder() {
    return std::filesystem::read_symlink("/proc/self/exe").parent_path();
}

std::wstring wideName(const std::filesystem::path& path) {
    std::wstring result;
    for (const char byte : path.native())
        result.push_back(static_cast<unsigned char>(byte));
    return result;
}

std::wstring fileText(const std::filesystem::path& path) {
    try {
        const std::u32string text = path.u32string(); // Names are UTF-8 in every locale.
        return {text.begin(), text.end()};
    } catch (const std::exception&) {
        return wideName(path); // The name is not valid UTF-8.
    }
}

std::string outputText(std::wstring_view text) {
    std::string result;
    for (const wchar_t character : text)
        result.push_back(static_cast<char>(character));
    return result;
}

} // namespace Meshes::console
