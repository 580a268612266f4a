// SPDX-License-Identifier: BSL-1.0
/// Tests the map from names to library records that discovery fills.
#include "tests/integration/managerFixture.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class DiscoveryMap : public ManagerTest {};

TEST_F(DiscoveryMap, KeepsTheFirstOfTwoRecordsOfOneNameInTheMap) {
    folder.write("a", "1");
    folder.write("b", "2");
    ComponentManager::LibraryList found;
    ComponentManager::LibraryMap byName;
    std::vector<std::wstring> unlisted;
    manager->discover(searchPathOf(folder.path()).c_str(), found, byName, unlisted);
    ASSERT_EQ(found.size(), 2u);
    EXPECT_EQ(byName.size(), 2u);
    ComponentManager::LibraryList::iterator* a =
        byName.find({found.front().directory, found.front().fileName});
    ASSERT_TRUE(a);
    EXPECT_EQ(&**a, &found.front());
    EXPECT_EQ(found.front().fileName, L"a");
    EXPECT_FALSE(found.front().module);
    EXPECT_EQ(found.front().fileTime, 0u);
    EXPECT_EQ(found.front().fileSize, 0);
    // A second walk appends records but keeps the entries of the map.
    manager->discover(searchPathOf(folder.path()).c_str(), found, byName, unlisted);
    EXPECT_EQ(byName.size(), 2u);
    EXPECT_EQ(&**byName.find({found.front().directory, L"a"}), &found.front());
}

TEST_F(DiscoveryMap, HashesARecordsNameByBothParts) {
    const ComponentManager::LibraryKeyHash hash;
    const std::hash<std::wstring> text;
    EXPECT_EQ(hash({L"folder", L"file"}), text(L"folder") ^ text(L"file"));
}

} // namespace
