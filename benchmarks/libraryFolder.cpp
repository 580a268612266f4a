// SPDX-License-Identifier: BSL-1.0
// Writes copies of a library. If the library contains the marked uid, each copy gets another one.
#include "libraryFolder.h"

#include "libraryStamp.h"
#include "temporaryName.h"

#include "generated/identity.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <string>
#include <string_view>

namespace Mz::Benchmarks {

namespace {

constexpr std::size_t npos = std::string::npos;

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream stream(file, std::ios::binary);
    std::string content(std::istreambuf_iterator<char>(stream), {});
    if (content.empty())
        throw std::runtime_error("cannot read " + file.string());
    return content;
}

/// Returns the offset of the uid in the file, or `npos`. Throws if the file contains it twice.
std::size_t identityIn(const std::string& content) {
    char mark[sizeof(QrUid)];
    std::memcpy(mark, &identityMark, sizeof mark);
    const std::string_view sought(mark, sizeof mark);
    const std::size_t found = content.find(sought);
    if (found != npos && content.find(sought, found + 1) != npos)
        throw std::runtime_error("the generated component holds its identity twice");
    return found;
}

std::filesystem::path newFolder() {
    std::filesystem::path name = temporaryName("mzbenchmarks");
    if (!std::filesystem::create_directory(name))
        throw std::runtime_error("cannot make the folder " + name.string());
    return name;
}

} // namespace

LibraryFolder::LibraryFolder(const std::filesystem::path& library, unsigned int count) {
    std::string content = contentOf(library);
    const std::size_t identity = identityIn(content);
    folder = newFolder();
    for (unsigned int number = 0; number < count; ++number) {
        const QrUid uid = generatedUid(number);
        if (identity != npos)
            std::memcpy(content.data() + identity, &uid, sizeof uid);
        setStamp(content, number);
        char name[32];
        std::snprintf(name, sizeof name, "library%04u", number);
        const std::filesystem::path file = (folder / name).replace_extension(library.extension());
        std::ofstream copy(file, std::ios::binary);
        if (!copy.write(content.data(), static_cast<std::streamsize>(content.size())).flush())
            throw std::runtime_error("cannot write " + file.string());
    }
}

LibraryFolder::~LibraryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(folder, ignored);
}

} // namespace Mz::Benchmarks
