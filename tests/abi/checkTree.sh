#!/usr/bin/env bash
# The rules of the house that a search through the tree can check.
#   checkTree.sh SOURCE_DIRECTORY RULE
set -u
shopt -s lastpipe # so that a pipe that ends in "complain" can set the status
cd "$1" || exit 2
status=0

# complain TEXT, with the offending lines on standard input; silent when there are none.
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

# search PATTERN FILES...: the lines that match, none being no failure.
search() {
    local pattern=$1
    shift
    [ $# -eq 0 ] || grep -nE "$pattern" "$@" /dev/null || true
}

# included DIRECTORY NAMES: the lines of a directory that include one of the directories.
included() {
    search "#[[:space:]]*include[[:space:]]*[\"<]($2)/" $(sources "$1")
}

case $2 in
platformConditions)
    # What differs by system stands in files of its own, chosen by the build.
    search '^[[:space:]]*#[[:space:]]*(if|ifdef|ifndef|elif|elifdef|elifndef)\b.*(WIN32|WIN64|_MSC_VER|MINGW|CYGWIN|linux|unix|APPLE|BSD|__GLIBC__)' \
        $(sources components examples tests tools benchmarks fuzz |
            grep -vE '^components/component(Manager|Tools)/platform/|^components/base/export\.h$') |
        complain "conditions on the platform outside the platform layer"
    ;;
platformHeaders)
    search '#[[:space:]]*include[[:space:]]*<(windows|io|unistd|dlfcn|dirent|fcntl|link|elf|langinfo|direct|winbase|sys/[a-z]+)\.?h?>' \
        $(sources components | grep -vE '^components/component(Manager|Tools)/platform/(windows|posix)/') |
        complain "headers of a system outside the platform layer"
    ;;
sourcePositions)
    # The first argument of every exception that the library makes names one of its own sources,
    # without extension.
    grep -rnoE '"components/[^"]*"' --include='*.cpp' components |
        grep -vE '\.cpp:[0-9]+:"components/.*\.h"$' |
        while IFS=: read -r file _ name; do
            name=${name//\"/}
            directory=$(dirname "$file")
            [ "$(dirname "$name")" = "$directory" ] && [ -f "$name.cpp" ] ||
                echo "$file: $name"
        done | complain "source positions that name no source of the library"
    search '\bthrow Qr[A-Za-z]+Ex::|throw Ex[A-Z]' $(sources components) |
        grep -vE 'throw [A-Za-z:]+\((source|file|"components/[a-zA-Z]+/[a-zA-Z]+"), *(line|__LINE__|reportedLine)' |
        complain "exceptions without a source position"
    ;;
layers)
    up='examples|tests|tools|benchmarks|fuzz'
    included components "$up" | complain "a library that needs what stands above it"
    included components/base 'components/(resmgt|componentManager|componentKit|objectIO|componentTools)' |
        complain "base needs nothing"
    included components/resmgt 'components/(base|componentManager|componentKit|objectIO|componentTools)' |
        complain "resmgt needs nothing"
    included components/componentManager 'components/(componentKit|objectIO|componentTools)' |
        complain "the component manager stands below the kit and the tools"
    included components/componentKit 'components/(objectIO|componentTools)' |
        complain "the kit needs the component manager only"
    included examples 'tests|benchmarks|fuzz' | complain "an example that needs the tests"
    search '#[[:space:]]*include[[:space:]]*"\.\./' $(sources components tests tools) |
        complain "includes that climb"
    search '#[[:space:]]*include[[:space:]]*"components/[^"]*(Private|platform/|hashMap|ioGuard|neverDestroyed|systemController|threadHash|inputFile)' \
        $(sources components/componentKit examples) |
        complain "a client that needs what is private"
    ;;
moduleOrder)
    # Inside the component manager: the object model, the buffers, and the importers on top.
    directory=components/componentManager
    lower() { # lower "FILES" "HEADERS that they must not include"
        search "#[[:space:]]*include[[:space:]]*\"$directory/($2)\.h\"" \
            $(for file in $1; do find $directory -maxdepth 1 -name "$file.*"; done)
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
headerCircles)
    # Every header after those that it includes, or there is a circle.
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
