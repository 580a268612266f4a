#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Tests that each rule of checkTree.sh reports a tree that violates it.
set -u
here=$(cd "$(dirname "$0")" && pwd)
tree=$(mktemp -d)
trap 'rm -rf "$tree"' EXIT
status=0

# breaks RULE FILE LINE: the rule must fail for a tree that contains only that line.
breaks() {
    rm -rf "${tree:?}"/*
    mkdir -p "$tree/$(dirname "$2")"
    printf '%b\n' "$3" >"$tree/$2"
    if "$here/checkTree.sh" "$tree" "$1" 2>/dev/null; then
        echo "$1 does not notice: $3" >&2
        status=1
    fi
}

# keeps RULE FILE LINE: the rule must pass for such a tree.
keeps() {
    rm -rf "${tree:?}"/*
    mkdir -p "$tree/$(dirname "$2")"
    printf '%b\n' "$3" >"$tree/$2"
    "$here/checkTree.sh" "$tree" "$1" || {
        echo "$1 complains of: $3" >&2
        status=1
    }
}

manager=components/componentManager
breaks platformConditions $manager/a.cpp '#ifdef _WIN32'
breaks platformConditions examples/a/b.cpp '#  if defined(__linux__)'
breaks platformConditions tests/a.h '#elif __unix__'
keeps platformConditions components/platform/windows/a.cpp '#ifdef _WIN32'
keeps platformConditions components/base/export.h '#ifdef _WIN32'
keeps platformConditions $manager/a.cpp '#ifdef MZ_BUILDING'
breaks platformHeaders $manager/a.cpp '#include <windows.h>'
breaks platformHeaders components/platform/characters.cpp '#include <sys/stat.h>'
keeps platformHeaders components/platform/posix/a.cpp '#include <unistd.h>'
keeps platformHeaders components/componentTools/platform/posix/a.cpp '#include <unistd.h>'
breaks platformHeaders components/componentTools/a.cpp '#include <unistd.h>'
keeps platformHeaders $manager/a.cpp '#include <iostream>'
breaks sourcePositions $manager/a.cpp 'const char* source = "components/componentManager/b";'
breaks sourcePositions $manager/a.cpp 'throw QrStreamEx::ExRead("elsewhere", __LINE__);'
breaks sourcePositions $manager/a.cpp 'throw QrStreamEx::ExRead(source, 12);'
keeps sourcePositions $manager/a.cpp \
    'f("components/componentManager/a"); throw QrStreamEx::ExRead(source, __LINE__);'
breaks layers components/base/a.cpp '#include "components/componentManager/cast.h"'
breaks layers $manager/a.h '#include "tests/support/a.h"'
breaks layers $manager/a.h '#include <components/componentKit/componentKit.h>'
breaks layers components/platform/a.cpp '#include "components/componentManager/uid.h"'
breaks layers components/objectIO/a.cpp '#include "components/componentKit/componentKit.h"'
breaks privateHeaders examples/a/b.cpp '#include "components/componentManager/manager/a.h"'
breaks privateHeaders components/objectIO/a.cpp '#include "components/componentManager/text/a.h"'
breaks privateHeaders tools/a/b.cpp '#include "components/platform/platform.h"'
keeps privateHeaders $manager/a.cpp '#include "components/componentManager/text/a.h"'
keeps privateHeaders components/componentTools/a.cpp '#include "components/platform/platform.h"'
breaks sourcesOnce components/objectIO/CMakeLists.txt '  ../componentManager/a.cpp'
keeps sourcesOnce components/objectIO/CMakeLists.txt 'include(../componentManager/a.cmake)'
breaks layers tests/a/b.cpp '#include "../c.h"'
keeps layers components/componentKit/a.h '#include "components/componentManager/cast.h"'
breaks moduleOrder $manager/cast.h '#include "components/componentManager/bufferio.h"'
breaks moduleOrder $manager/bufferioInput.cpp '#include "components/componentManager/importer.h"'
breaks moduleOrder $manager/processControl.h '#include "components/componentManager/bufferio.h"'
breaks moduleOrder $manager/componentImp.cpp '#include "components/componentManager/importer.h"'
keeps moduleOrder $manager/importer.h '#include "components/componentManager/bufferio.h"'
breaks licence $manager/a.cpp '#include <string>'
keeps licence $manager/a.cpp '// SPDX-License-Identifier: BSL-1.0'
keeps headerCircles $manager/a.h '#include "components/componentManager/b.h"'

printf '#include "%s/b.h"\n' $manager >"$tree/$manager/a.h"
printf '#include "%s/a.h"\n' $manager >"$tree/$manager/b.h"
if "$here/checkTree.sh" "$tree" headerCircles 2>/dev/null; then
    echo "headerCircles does not notice a circle of two" >&2
    status=1
fi
exit $status
