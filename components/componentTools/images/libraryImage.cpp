// SPDX-License-Identifier: BSL-1.0
/// Opens a file, and selects the reader of its format by its magic number.
#include "components/componentTools/images/libraryImage.h"

#include "components/platform/platform.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace Mz::Tools {

FileBytes::Source::Source(const std::filesystem::path& path) {
    stream.rdbuf()->pubsetbuf(nullptr, 0); // `FileBlocks` has its own.
    opened = platform::openForReading(stream, path.native());
    if (!opened)
        return;
    const std::streamoff end = stream.rdbuf()->pubseekoff(0, std::ios::end, std::ios::in);
    failed = end < 0;
    bytes = end > 0 ? static_cast<std::uint64_t>(end) : 0;
}

std::size_t FileBytes::Source::read(std::uint64_t offset, void* data, std::size_t length) {
    stream.clear();
    stream.seekg(static_cast<std::streamoff>(offset));
    failed = failed || !stream;
    stream.read(static_cast<char*>(data), static_cast<std::streamsize>(length));
    failed = failed || stream.bad();
    const std::streamsize count = stream.bad() ? 0 : stream.gcount();
    return static_cast<std::size_t>(std::max<std::streamsize>(count, 0));
}

std::optional<std::string> FileBytes::text(std::uint64_t offset) {
    constexpr std::size_t longest = 4096;
    std::string result;
    while (result.size() < longest) {
        char piece[64];
        const std::size_t length = static_cast<std::size_t>(
            std::min<std::uint64_t>(sizeof piece, size() - std::min(size(), offset)));
        if (length == 0 || !read(offset, piece, length))
            return std::nullopt;
        const char* end = static_cast<const char*>(std::memchr(piece, 0, length));
        result.append(piece, end ? static_cast<std::size_t>(end - piece) : length);
        if (end)
            return result;
        offset += length;
    }
    return std::nullopt;
}

std::optional<ComponentStamp> validStamp(const std::optional<ComponentStamp>& stamp) {
    static constexpr ComponentStamp known MZ_STAMP_VALUE;
    const bool valid = stamp && std::memcmp(stamp->magic, known.magic, sizeof known.magic) == 0 &&
                       stamp->layout == known.layout && stamp->size >= known.size;
    return valid ? stamp : std::nullopt;
}

LibraryImage readLibraryImage(const std::filesystem::path& path) {
    FileBytes file(path);
    return readLibraryImage(file);
}

LibraryImage readLibraryImage(FileBytes& file) {
    LibraryImage image;
    image.readable = file.isOpen();
    if (!image.readable)
        return image;
    const auto magic = file.read<std::array<char, 4>>(0);
    if (magic && std::memcmp(magic->data(), "\177ELF", 4) == 0)
        readElfImage(file, image);
    else if (magic && std::memcmp(magic->data(), "MZ", 2) == 0)
        readPeImage(file, image);
    image.readable = !file.hasFailed();
    return image;
}

std::vector<std::string> exportedNames(const std::filesystem::path& path) {
    FileBytes file(path);
    const auto magic = file.read<std::array<char, 4>>(0);
    if (magic && std::memcmp(magic->data(), "\177ELF", 4) == 0)
        return exportedElfNames(file);
    if (magic && std::memcmp(magic->data(), "MZ", 2) == 0)
        return exportedPeNames(file);
    return {};
}

std::string sectionsOf(const std::filesystem::path& path, std::string_view prefix) {
    FileBytes file(path);
    return sectionsOf(file, prefix);
}

std::string sectionsOf(FileBytes& file, std::string_view prefix) {
    const auto magic = file.read<std::array<char, 4>>(0);
    if (magic && std::memcmp(magic->data(), "\177ELF", 4) == 0)
        return elfSections(file, prefix);
    if (magic && std::memcmp(magic->data(), "MZ", 2) == 0)
        return peSections(file, prefix);
    return {};
}

bool appendSection(FileBytes& file, std::uint64_t offset, std::uint64_t size,
                   std::string& content) {
    const std::size_t begin = (content.size() + 7) / 8 * 8;
    if (begin > mostSectionBytes || size > mostSectionBytes - begin || !file.reaches(offset, size))
        return false;
    content.resize(begin + static_cast<std::size_t>(size));
    char* const target = content.data() + begin;
    const auto length = static_cast<std::size_t>(size);
    if (length <= platform::FileBlocks::blockSize ? !file.read(offset, target, length)
                                                  : !file.readLong(offset, target, length)) {
        content.resize(begin);
        return false;
    }
    return true;
}

bool isComponentExport(const std::string& name) {
    // The last ones are added by the linkers.
    for (const char* known : {entryPointName, stampName, "MzRunComponentTest", "_init", "_fini",
                              "_edata", "_end", "__bss_start"})
        if (name == known)
            return true;
    // The address sanitizer exports a mark for each variable that a library exports.
    return name.starts_with("__odr_asan.");
}

} // namespace Mz::Tools
