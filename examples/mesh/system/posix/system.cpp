// SPDX-License-Identifier: BSL-1.0
/// The loaded libraries come from the list of the dynamic loader.
#include "../system.h"

#include <link.h>

#include <system_error>

namespace Meshes::system {

std::size_t mappedLibraries(const std::filesystem::path& folder) {
    struct Search {
        const std::filesystem::path& folder;
        std::size_t found = 0;
    } search{folder};
    ::dl_iterate_phdr(
        [](dl_phdr_info* info, std::size_t, void* data) {
            Search& now = *static_cast<Search*>(data);
            const std::filesystem::path library(info->dlpi_name);
            std::error_code ignored;
            if (library.has_parent_path() &&
                std::filesystem::equivalent(library.parent_path(), now.folder, ignored))
                ++now.found;
            return 0;
        },
        &search);
    return search.found;
}

} // namespace Meshes::system
