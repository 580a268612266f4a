// SPDX-License-Identifier: BSL-1.0
/// Calls libzip. An entry is read block by block until it ends or exceeds its limit, whatever size
/// the archive claims. libzip compares the checksum when the end is reached.
#include "zipArchive.h"

#include <array>
#include <zip.h>

ZipArchive::ZipArchive(const std::filesystem::path& file) {
    int code = 0;
    archive.reset(zip_open(file.c_str(), ZIP_RDONLY, &code));
    if (!archive) {
        zip_error_t error;
        zip_error_init_with_code(&error, code);
        const std::string reason = zip_error_strerror(&error);
        zip_error_fini(&error);
        throw ZipError(reason);
    }
}

void ZipArchive::Close::operator()(zip* opened) const {
    zip_discard(opened);
}

std::vector<std::string> ZipArchive::names() const {
    std::vector<std::string> all;
    const zip_int64_t count = zip_get_num_entries(archive.get(), 0);
    for (zip_int64_t index = 0; index < count; ++index) {
        const char* const name = zip_get_name(archive.get(), static_cast<zip_uint64_t>(index), 0);
        if (name && *name && std::string_view(name).back() != '/')
            all.emplace_back(name);
    }
    return all;
}

std::optional<std::string> ZipArchive::content(const std::string& name, std::size_t most) const {
    const zip_int64_t index = zip_name_locate(archive.get(), name.c_str(), 0);
    if (index < 0)
        return std::nullopt;
    const auto close = [](zip_file_t* entry) { zip_fclose(entry); };
    const std::unique_ptr<zip_file_t, decltype(close)> entry(
        zip_fopen_index(archive.get(), static_cast<zip_uint64_t>(index), 0), close);
    if (!entry)
        throw ZipError(zip_strerror(archive.get()));
    std::string bytes;
    std::array<char, 16 * 1024> block{};
    for (;;) {
        const zip_int64_t count = zip_fread(entry.get(), block.data(), block.size());
        if (count < 0)
            throw ZipError(zip_file_strerror(entry.get()));
        if (count == 0)
            return bytes;
        bytes.append(block.data(), static_cast<std::size_t>(count));
        if (bytes.size() > most)
            throw ZipError("larger than " + std::to_string(most) + " bytes");
    }
}
