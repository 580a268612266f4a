# SPDX-License-Identifier: BSL-1.0
# Makes a source of pages of the documentation, so that `help` works without network and files.
#   cmake -D "pages=FILE;…" -D output=FILE -P embedPages.cmake
set(rows)
foreach(page IN LISTS pages)
  file(READ ${page} content)
  get_filename_component(name ${page} NAME)
  string(APPEND rows "    {\"${name}\", R\"mz(${content})mz\"},\n")
endforeach()
file(WRITE ${output} "// Written by embedPages.cmake from the documentation.
#include \"tools/mzcomponents/helpPages.h\"

namespace Mz::Commands {

std::span<const HelpPage> helpPages() {
    static constexpr HelpPage all[] = {
${rows}    };
    return all;
}

} // namespace Mz::Commands
")
