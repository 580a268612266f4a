#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Tries which builds of libMZcomponentManager, host and component fit together: compiles each, lets
# mzcomponents judge the component, and lets the host use it.
#   compatibility.sh [--quick] [--only TEXT] [--check PAGE] BUILD WORK
#
# BUILD is a build folder with the libraries and mzcomponents, for Linux or for Windows. WORK receives
# what is compiled. Each row of the result is
#   library | host | component | result | what happened
# where the first three are the commands that compiled them ("as built" is BUILD's library). The
# result is
#   works      the host does everything with the component
#   refused    the compiler, the linker, the loader or mzcomponents rejects one of them
#   undefined  nothing rejects them, and the host crashes or gets wrong results
#
# --quick tries only what the tests' own compiler can do, in less than a minute. --only tries the rows
# whose commands contain TEXT. --check fails for each row that the table in PAGE does not have.
# Compilers that are not installed are skipped, and named on standard error.
set -euo pipefail
here=$(cd "$(dirname "$0")" && pwd)
source=$(cd "$here/../../.." && pwd)
quick=no page='' only=''
while [[ $1 == --* ]]; do
    case $1 in
    --quick) quick=yes ;;
    --only) only=$2 && shift ;;
    --check) page=$(realpath "$2") && shift ;;
    *) echo "no such option: $1" >&2 && exit 2 ;;
    esac
    shift
done
build=$(realpath "$1")
mkdir -p "$2"
work=$(realpath "$2")
touch "$work/started"
status=0

if [ -e "$build/bin/mzcomponents.exe" ]; then
    system=windows program=.exe library=.dll emulator=$source/cmake/wine-run
    own=x86_64-w64-mingw32-g++-posix
else
    system=linux program='' library=.so emulator=env
    own=g++-12
fi

# ---- Building -----------------------------------------------------------------------------------

# folder_of NAME: a folder for what is built under that name.
folder_of() {
    local folder=$work/${1//[^A-Za-z0-9.+-]/_}
    mkdir -p "$folder"
    echo "$folder"
}

# log_of FILE: what the compiler said of it. It is not in the file's folder, which the host searches.
log_of() {
    echo "$(dirname "$1").log"
}

# build_folder COMMAND: the build folder of the libraries that COMMAND compiles.
build_folder() {
    if [ "$1" = "as built" ]; then
        echo "$build"
    else
        folder_of "library $1"
    fi
}

# build_libraries COMMAND FOLDER: builds the libraries and the tools; false if that fails.
build_libraries() {
    [ "$1" != "as built" ] || return 0
    local words
    read -ra words <<<"$1"
    {
        cmake -S "$source" -B "$2" -G Ninja -DCMAKE_BUILD_TYPE=Release \
            -DCMAKE_CXX_COMPILER="${words[0]}" -DCMAKE_CXX_FLAGS="${words[*]:1}" \
            -DMZ_BUILD_TESTS=OFF -DMZ_BUILD_EXAMPLES=OFF && cmake --build "$2"
    } >"$(log_of "$2/lib")" 2>&1
}

# compile SOURCE LIBRARIES OUTPUT COMMAND [OPTIONS...]: once for each run; false if it fails.
compile() {
    local file=$1 libraries=$2 output=$3 words log
    log=$(log_of "$3")
    read -ra words <<<"$4"
    shift 4
    if [ "$log" -nt "$work/started" ]; then
        [ -e "$output" ]
        return
    fi
    rm -f "$output"
    local link=(-L"$libraries" -lMZcomponentManager -lMZbase)
    [ $system = linux ] ||
        link=("$libraries/libMZcomponentManager.dll.a" "$libraries/libMZbase.dll.a")
    # In the folder with the specs.
    (cd "$work" && "${words[0]}" -std=c++20 -O2 -I"$source" "${words[@]:1}" "$@" "$file" \
        -o "$output" "${link[@]}") >"$log" 2>&1
}

# What some commands name: specs that link UCRT, the C runtime of current Windows, instead of msvcrt;
# and the folders in which Clang finds the libraries of MinGW-w64 GCC.
write_options() {
    local gcc
    gcc=$(dirname "$($own -print-libgcc-file-name)")
    $own -dumpspecs | sed 's/-lmsvcrt/-lucrt/g' >"$work/ucrt.specs"
    echo "-nostdinc++ -isystem $gcc/include/c++ -isystem $gcc/include/c++/x86_64-w64-mingw32
        -isystem /usr/x86_64-w64-mingw32/include -B$gcc -L$gcc" >"$work/mingw.options"
}

# ---- Trying -------------------------------------------------------------------------------------

have() { # have COMMAND: whether its compiler is installed.
    local words
    read -ra words <<<"$1"
    [ "${words[0]}" = as ] || command -v "${words[0]}" >/dev/null || {
        echo "skipped, not installed: $1" >&2
        return 1
    }
}

# verdict_on FILE BUILD: what mzcomponents of BUILD says of a component when it loads it.
verdict_on() {
    LD_LIBRARY_PATH=$2/lib "$emulator" "$2/bin/mzcomponents$program" explain --load --json "$1" 2>/dev/null |
        tr -d '\r' | sed -n 's/^ *"verdict": "\(.*\)",*$/\1/p' | head -n 1 || true
}

# run_host HOST COMPONENT-FOLDER BUILD: how the host ended, and its steps, in one line. A debugger may
# write what else it knows of a crash.
run_host() {
    local host=$1 components=$2 libraries=$3/lib steps ended=0
    if [ $system = windows ]; then
        cp -u "$3"/bin/*.dll "$(dirname "$host")"
        components=Z:$components
    fi
    steps=$(LD_LIBRARY_PATH=$libraries timeout 60 "$emulator" "$host" "$components" 2>"$host.err" |
        tr -d '\r' | grep -E '^(not )?[a-z]+$' | paste -sd' '; exit "${PIPESTATUS[0]}") || ended=$?
    echo "$ended ${steps:-nothing}"
}

# try LIBRARY HOST COMPONENT: prints a row.
try() {
    [[ "$1 | $2 | $3" == *"$only"* ]] && have "$1" && have "$2" && have "$3" || return 0
    local libraries host component result happened verdict ended
    libraries=$(build_folder "$1")
    host=$(folder_of "host $1 $2")/trialHost$program
    component=$(folder_of "component $1 $3")/trial$library
    if ! build_libraries "$1" "$libraries"; then
        result=refused happened="the libraries: $(first_error "$(log_of "$libraries/lib")")"
    elif ! compile "$here/trialComponent.cpp" "$libraries/lib" "$component" "$3" -shared -fPIC \
        -fvisibility=hidden; then
        result=refused happened="the component: $(first_error "$(log_of "$component")")"
    elif ! compile "$here/trialHost.cpp" "$libraries/lib" "$host" "$2"; then
        result=refused happened="the host: $(first_error "$(log_of "$host")")"
    else
        verdict=$(verdict_on "$component" "$libraries")
        read -r ended happened < <(run_host "$host" "$(dirname "$component")" "$libraries")
        case "$verdict: $ended $happened" in
        otherAbi:* | *'not loaded'*) result=refused ;;
        *' 0 '*not*) result=undefined ;;
        *' 0 '*done) result=works ;;
        works:*) result=undefined ;;
        *) result=refused ;;
        esac
        happened="verdict $verdict; host: $happened, status $ended"
    fi
    row "$1" "$2" "$3" "$result" "$happened"
}

first_error() {
    grep -m 1 -E 'error|undefined reference|multiple definition' "$1" | sed 's/.*error: //; s/.*: undefined/undefined/' ||
        tail -n 1 "$1"
}

# row LIBRARY HOST COMPONENT RESULT HAPPENED
row() {
    printf '%s | %s | %s | %s | %s\n' "$@"
    [ -n "$page" ] || return 0
    local cells
    cells="| \`$1\` | \`$2\` | \`$3\` | $4 |"
    cells=${cells/\`as built\`/as built}
    grep -qF -- "$cells" "$page" || {
        echo "not in $(basename "$page"): $cells" >&2
        status=1
    }
}

# ---- What is tried ------------------------------------------------------------------------------

components() { # components OPTIONS...: components of the own compiler, each with other options.
    for options in "$@"; do
        try "as built" $own "$own${options:+ $options}"
    done
}
hosts() { # hosts OPTIONS...: and hosts.
    for options in "$@"; do
        try "as built" "$own $options" $own
    done
}

have "$own" || exit 77

components '' -D_GLIBCXX_ASSERTIONS -D_GLIBCXX_DEBUG -D_GLIBCXX_USE_CXX11_ABI=0 -flto \
    '-static-libstdc++ -static-libgcc'
if [ $quick = yes ]; then
    exit $status
fi

components -O0 -std=c++23 -fno-rtti -fno-exceptions '-fno-exceptions -DMZ_TRIAL_BY_HAND' \
    -fvisibility=default -fsanitize=undefined -fshort-wchar -funsigned-char
hosts -D_GLIBCXX_ASSERTIONS -D_GLIBCXX_DEBUG -D_GLIBCXX_USE_CXX11_ABI=0 -flto \
    '-static-libstdc++ -static-libgcc' -fno-rtti -fno-exceptions -fshort-wchar
if [ $system = linux ]; then
    components -static-libgcc -fsanitize=address -fsanitize=thread -march=x86-64-v2
    hosts -fsanitize=address -fsanitize=thread
    try "as built" "$own -fsanitize=address" "$own -fsanitize=address"
    for compiler in g++-11 clang++-14 clang++-16; do
        try "as built" $own $compiler
        try "as built" $compiler $own
        try "as built" $compiler $compiler
    done
    libcxx='clang++-14 -stdlib=libc++'
    try "as built" $own "$libcxx"
    try "as built" "$libcxx" $own
    # Libraries of another kind.
    for other in "$libcxx" "$own -D_GLIBCXX_USE_CXX11_ABI=0" "$own -D_GLIBCXX_DEBUG"; do
        try "$other" "$other" "$other"
    done
    try "$own -D_GLIBCXX_DEBUG" "$own -D_GLIBCXX_DEBUG" $own
else
    write_options
    ucrt='-D_UCRT -specs=ucrt.specs'
    components -static "$ucrt" -specs=ucrt.specs
    hosts -static "$ucrt" -specs=ucrt.specs
    try "as built" "$own -specs=ucrt.specs" "$own -specs=ucrt.specs"
    try "as built" "$own -static" "$own -static"
    threads=x86_64-w64-mingw32-g++-win32
    try "as built" $own $threads
    try "as built" $threads $own
    for compiler in clang++-14 clang++-16; do
        clang="$compiler --target=x86_64-w64-mingw32 @mingw.options"
        try "as built" $own "$clang"
        try "as built" "$clang" $own
    done
fi
exit $status
