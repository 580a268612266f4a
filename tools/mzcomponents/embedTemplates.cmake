# SPDX-License-Identifier: BSL-1.0
# Makes a source of the templates of projects, so that the program needs no files beside it.
#   cmake -D folder=FOLDER -D "templates=KIND/PATH.in;…" -D output=FILE -P embedTemplates.cmake
#
# The content of each template becomes a raw string literal, which needs no escapes.
set(rows)
foreach(template IN LISTS templates)
  if(NOT template MATCHES "^([a-z]+)/(.+)\\.in$")
    message(FATAL_ERROR "not KIND/PATH.in: ${template}")
  endif()
  set(kind ${CMAKE_MATCH_1})
  set(path ${CMAKE_MATCH_2})
  # A template with a leading dot would be hidden in its folder.
  string(REGEX REPLACE "^gitignore$" ".gitignore" path ${path})
  file(READ ${folder}/${template} content)
  string(APPEND rows "    {\"${kind}\", \"${path}\", R\"mz(${content})mz\"},\n")
endforeach()
file(WRITE ${output} "// Written by embedTemplates.cmake from the folder templates.
#include \"tools/mzcomponents/project.h\"

namespace Mz::Commands {

std::span<const ProjectTemplate> projectTemplates() {
    static constexpr ProjectTemplate all[] = {
${rows}    };
    return all;
}

} // namespace Mz::Commands
")
