// SPDX-License-Identifier: BSL-1.0
/// Tests discovery on a file system that gives several files the same number.
#include "tests/integration/managerFixture.h"

#include <dirent.h>
#include <dlfcn.h>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// The number of every file in a listing, unless it is 0.
ino_t commonNumber = 0;

} // namespace

/// Replaces the C library's function in this program and its libraries.
extern "C" [[gnu::visibility("default")]] dirent* readdir(DIR* directory) {
    using Function = dirent*(DIR*);
    static const auto next = reinterpret_cast<Function*>(::dlsym(RTLD_NEXT, "readdir"));
    dirent* const entry = next(directory);
    if (entry && commonNumber != 0)
        entry->d_ino = commonNumber;
    return entry;
}

namespace {

class FileNumbers : public ManagerTest {
  protected:
    void initializeWithOneNumber() {
        commonNumber = 7;
        initialize();
        commonNumber = 0;
    }
};

TEST_F(FileNumbers, OfDifferentFilesMayBeTheSame) {
    add(L"goodByHand", "a");
    add(L"goodWithKit", "b");
    initializeWithOneNumber();
    EXPECT_EQ(manager->libraries.size(), 2u);
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third", L"kit"}));
    EXPECT_EQ(maker(goodUid), "good");
    EXPECT_EQ(maker(kitUid), "kit");
}

TEST_F(FileNumbers, OfOneFileAreFoundAmongThoseOfOthers) {
    const auto first = add(L"goodByHand", "a");
    add(L"goodWithKit", "b");
    std::filesystem::create_hard_link(first, folder.path() / "c");
    initializeWithOneNumber();
    EXPECT_EQ(manager->libraries.size(), 2u);
    EXPECT_EQ(names(), (Names{L"Name", L"name", L"third", L"kit"}));
}

} // namespace
