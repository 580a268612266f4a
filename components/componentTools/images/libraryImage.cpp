// SPDX-License-Identifier: BSL-1.0
/// Files are read through two cached blocks, because the readers alternate between a table and the
/// names that it refers to. A foreign library then costs few reads, whatever its size.
#include "components/componentTools/images/libraryImage.h"

#include "components/platform/platform.h"

#include <algorithm>

namespace Mz::Tools {

FileBytes::FileBytes(const std::filesystem::path& path) {
    opened = platform::openForReading(stream, path.native());
    if (!opened)
        return;
    stream.seekg(0, std::ios::end);
    const auto end = static_cast<std::streamoff>(stream.tellg());
    fileSize = end > 0 ? static_cast<std::uint64_t>(end) : 0;
}

bool FileBytes::read(std::uint64_t offset, void* data, std::size_t length) {
    if (!reaches(offset, length))
        return false;
    const auto holds = [&](const Block& block) {
        return offset >= block.offset && offset - block.offset <= block.size &&
               length <= block.size - (offset - block.offset);
    };
    auto block = std::find_if(blocks.begin(), blocks.end(), holds);
    if (block == blocks.end()) {
        block = blocks.begin() + static_cast<std::ptrdiff_t>(older);
        if (!load(*block, offset) || !holds(*block))
            return false;
    }
    older = block == blocks.begin() ? 1 : 0;
    std::memcpy(data, block->bytes.data() + (offset - block->offset), length);
    return true;
}

bool FileBytes::load(Block& block, std::uint64_t offset) {
    block.size = 0;
    block.offset = offset;
    stream.clear();
    stream.seekg(static_cast<std::streamoff>(offset));
    stream.read(block.bytes.data(), static_cast<std::streamsize>(block.bytes.size()));
    block.size = static_cast<std::size_t>(std::max<std::streamsize>(stream.gcount(), 0));
    return !stream.bad();
}

std::optional<std::string> FileBytes::text(std::uint64_t offset) {
    constexpr std::size_t longest = 4096;
    std::string result;
    while (result.size() < longest) {
        char piece[64];
        const std::size_t length = static_cast<std::size_t>(
            std::min<std::uint64_t>(sizeof piece, fileSize - std::min(fileSize, offset)));
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

LibraryImage readLibraryImage(const std::filesystem::path& path) {
    LibraryImage image;
    FileBytes file(path);
    image.readable = file.isOpen();
    if (!image.readable)
        return image;
    const auto magic = file.read<std::array<char, 4>>(0);
    if (magic && std::memcmp(magic->data(), "\177ELF", 4) == 0)
        readElfImage(file, image);
    else if (magic && std::memcmp(magic->data(), "MZ", 2) == 0)
        readPeImage(file, image);
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

bool isComponentExport(const std::string& name) {
    // The last ones are added by the linkers.
    for (const char* known :
         {entryPointName, "MzRunComponentTest", "_init", "_fini", "_edata", "_end", "__bss_start"})
        if (name == known)
            return true;
    return false;
}

} // namespace Mz::Tools
