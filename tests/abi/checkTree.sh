#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Checks one rule of the source tree by a search.
#   checkTree.sh SOURCE_DIRECTORY RULE
set -u
shopt -s lastpipe # so that a pipe that ends in "complain" can set the status
cd "$1" || exit 2
status=0

# complain TEXT reports the lines on standard input as violations. A no-op if there are none.
complain() {
    local lines
    lines=$(cat)
    [ -z "$lines" ] && return
    printf '%s:\n%s\n' "$1" "$lines" >&2
    status=1
}

sources() {
    find "$@" -type f \( -name '*.h' -o -name '*.cpp' -o -name '*.in' \) 2>/dev/null | sort
}

# search PATTERN FILES... prints the lines that match. No match is not a failure.
search() {
    local pattern=$1
    shift
    [ $# -eq 0 ] || grep -nE "$pattern" "$@" /dev/null || true
}

# included DIRECTORY NAMES prints the lines in a directory that include one of the directories.
included() {
    search "#[[:space:]]*include[[:space:]]*[\"<]($2)/" $(sources "$1")
}

case $2 in
platformConditions)
    # Code that depends on the system is in separate files, which the build selects.
    search '^[[:space:]]*#[[:space:]]*(if|ifdef|ifndef|elif|elifdef|elifndef)\b.*(WIN32|WIN64|_MSC_VER|MINGW|CYGWIN|linux|unix|APPLE|BSD|__GLIBC__)' \
        $(sources components examples tests tools benchmarks fuzz |
            grep -vE '^components/(platform|componentTools/platform)/|^components/base/export\.h$') |
        complain "conditions on the platform outside the platform layer"
    ;;
platformHeaders)
    search '#[[:space:]]*include[[:space:]]*<(windows|io|unistd|dlfcn|dirent|fcntl|link|elf|langinfo|direct|winbase|sys/[a-z]+)\.?h?>' \
        $(sources components | grep -vE '^components/(platform|componentTools/platform)/(windows|posix)/') |
        complain "headers of a system outside the platform layer"
    ;;
sourcePositions)
    # Every exception of the library names one of its own sources, without extension, as its first
    # argument. The name does not change when the source moves to a subfolder.
    grep -rnoE '"components/[^"]*"' --include='*.cpp' components |
        grep -vE '\.cpp:[0-9]+:"components/.*\.h"$' |
        while IFS=: read -r file _ name; do
            name=${name//\"/}
            library=$(dirname "$name")
            [[ $file == "$library"/* ]] && [ -f "$name.cpp" ] || echo "$file: $name"
        done | complain "source positions that name no source of the library"
    search '\bthrow Qr[A-Za-z]+Ex::|throw Ex[A-Z]' $(sources components) |
        grep -vE 'throw [A-Za-z:]+\((source|file|"components/[a-zA-Z]+/[a-zA-Z]+"), *(line|__LINE__|reportedLine)' |
        complain "exceptions without a source position"
    ;;
layers)
    # For each library, the libraries that it must not include.
    up='examples|tests|tools|benchmarks|fuzz'
    included components "$up" | complain "a library that needs what is above it"
    above() { # above LIBRARY "LIBRARIES"
        included "components/$1" "components/($2)" | complain "$1 needs what is above or beside it"
    }
    above base 'resmgt|platform|componentManager|componentKit|objectIO|componentTools'
    above resmgt 'base|platform|componentManager|componentKit|objectIO|componentTools'
    above platform 'componentManager|componentKit|objectIO|componentTools'
    above componentManager 'componentKit|objectIO|componentTools'
    above componentKit 'platform|objectIO|componentTools'
    above objectIO 'platform|componentKit|componentTools'
    # The tools run the tests of components, and know nothing else of the kit.
    included components/componentTools components/componentKit |
        grep -v 'components/componentKit/componentTest\.h"' |
        complain "componentTools needs what is above or beside it"
    included examples 'tests|benchmarks|fuzz' | complain "an example that needs the tests"
    search '#[[:space:]]*include[[:space:]]*"\.\./' $(sources components tests tools) |
        complain "includes that climb"
    ;;
privateHeaders)
    # The public headers are at the top of a library's folder. The subfolders are private; only
    # tests and fuzz targets include them.
    for file in $(sources components examples tools benchmarks); do
        search '#[[:space:]]*include[[:space:]]*"components/[a-zA-Z]+/[a-zA-Z]+/' "$file" |
            while IFS= read -r line; do
                library=$(grep -oE 'components/[a-zA-Z]+/' <<<"${line#*include}" | head -n 1)
                [[ $file == "$library"* ]] || echo "$line"
            done
    done | complain "private headers of another library"
    included examples 'components/platform' | complain "the platform layer is not for clients"
    included tools 'components/platform' | complain "the platform layer is not for clients"
    ;;
sourcesOnce)
    # If two libraries compile one source, its state exists twice.
    search '\.\./' $(find components tools -name CMakeLists.txt 2>/dev/null) | grep -E '\.\./[a-zA-Z/]+\.cpp' |
        complain "a source of another library"
    ;;
moduleOrder)
    # The layers inside the component manager: the object model, the buffers, the streams, the
    # manager, the importers.
    directory=components/componentManager
    lower() { # lower "FILES" "HEADERS that they must not include"
        search "#[[:space:]]*include[[:space:]]*\"$directory/([a-z]+/)?($2)\.h\"" \
            $(for file in $1; do find $directory -name "$file.*"; done)
    }
    lower 'uid reference castable castImpl cast exceptions translation enumerator' \
        'bufferio|stream|binaryStream|textStream|componentImp.*|import.*|processControl' |
        complain "the object model stands below everything"
    lower 'bufferio*' 'stream|binaryStream|textStream|componentImp.*|import.*|processControl' |
        complain "the buffers stand below the streams"
    lower 'processControl controllerRegistry' 'bufferio|.*[sS]tream|componentImp.*|import.*' |
        complain "process control needs the object model only"
    lower 'componentImp*' 'import.*|processControl' |
        complain "the manager stands below the importers"
    ;;
licence)
    # Each source names its licence in one of its first two lines.
    for file in $(sources components examples tests tools benchmarks fuzz | grep -v '\.in$'); do
        head -n 2 "$file" | grep -q 'SPDX-License-Identifier: BSL-1.0' || echo "$file"
    done | complain "sources without a licence"
    ;;
headerCircles)
    # Sorts the headers topologically, which fails if includes form a cycle.
    for header in $(sources components | grep '\.h$'); do
        echo "$header $header"
        grep -oE '#include "components/[^"]+"' "$header" | cut -d'"' -f2 |
            while read -r needed; do echo "$needed $header"; done
    done | tsort 2>&1 >/dev/null | complain "headers in a circle"
    ;;
*)
    echo "no such rule: $2" >&2
    exit 2
    ;;
esac
exit $status
