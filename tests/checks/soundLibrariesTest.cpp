// SPDX-License-Identifier: BSL-1.0
/// Libraries that break no rule: a checker that finds faults in good components is not used for
/// long. They are those of the examples, those of other tests, and those of `sound/`, each of which
/// does something that authors do.
#include "tests/checks/checking.h"

#include <algorithm>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::Not;

namespace {

/// A library, by its folder below the build folder, and its name.
struct Sound {
    const char* folder;
    const char* name;
    bool threadSafe = true; ///< what its author would say
};

void PrintTo(const Sound& sound, std::ostream* out) {
    *out << sound.folder << '/' << sound.name;
}

class SoundLibrary : public ::testing::TestWithParam<Sound> {};

TEST_P(SoundLibrary, HasNoFinding) {
    const Sound& sound = GetParam();
    const std::filesystem::path file =
        buildFolder / sound.folder / (std::filesystem::path(sound.name) += MZ_LIBRARY_EXTENSION);
    CheckOptions checked = options();
    checked.threadSafe = sound.threadSafe;
    const CheckResult result = checkLibrary(file, checked);
    EXPECT_THAT(result.findings, IsEmpty()) << textOf(result);
    EXPECT_EQ(result.notRun.size(), (limitsAllocations ? 0u : 1u) + (sound.threadSafe ? 0u : 1u));
    EXPECT_THAT(result.builders, Not(IsEmpty()));
    EXPECT_FALSE(result.interrupted);
}

std::string nameOfTest(const ::testing::TestParamInfo<Sound>& test) {
    return test.param.name;
}

constexpr const char* sound = "components/sound";

INSTANTIATE_TEST_SUITE_P(
    Own, SoundLibrary,
    ::testing::Values(
        Sound{sound, "severalInterfaces"}, Sound{sound, "translates", false},
        Sound{sound, "aggregates"}, Sound{sound, "oneForAll"}, Sound{sound, "cachesInStatics"},
        Sound{sound, "workerThread"}, Sound{sound, "opensAFile"}, Sound{sound, "usesAnother"},
        Sound{sound, "findsItsFile"}, Sound{sound, "missesItsHost"}, Sound{sound, "doesWithLess"},
        Sound{sound, "catchesInside"}, Sound{sound, "buildersOfATable"}, Sound{sound, "wideTexts"},
        Sound{sound, "everyType"}, Sound{sound, "bigState"}, Sound{sound, "formatsText"},
        Sound{sound, "newerVersion"}, Sound{sound, "sharesObjects"}, Sound{sound, "linksAfterLoad"},
        Sound{sound, "crates"}, Sound{sound, "importsTables"}, Sound{sound, "passesStreamErrors"},
        Sound{sound, "reportsEachWay"}),
    nameOfTest);

INSTANTIATE_TEST_SUITE_P(OfOtherTests, SoundLibrary,
                         ::testing::Values(Sound{"components/goodByHand", "goodByHand"},
                                           Sound{"components/goodWithKit", "goodWithKit"},
                                           Sound{"components/countedDescription",
                                                 "countedDescription"},
                                           Sound{"components/notes", "notes"},
                                           Sound{"components/checks", "soundImporter"},
                                           Sound{"components/checks", "succeedsOwnTest"},
                                           Sound{"components/numbered", "numbered10"}),
                         nameOfTest);

#if MZ_HAS_EXAMPLES
INSTANTIATE_TEST_SUITE_P(Mesh, SoundLibrary,
                         ::testing::Values(Sound{"components/mesh", "meshObj"},
                                           Sound{"components/mesh", "meshOff"},
                                           Sound{"components/mesh", "meshPly"},
                                           Sound{"components/mesh", "meshStl"},
                                           Sound{"components/mesh", "meshScene"},
                                           Sound{"components/mesh", "meshImporter"}),
                         nameOfTest);

INSTANTIATE_TEST_SUITE_P(Example, SoundLibrary,
                         ::testing::Values(Sound{"examples/companions/components", "objImporter"},
                                           Sound{"examples/controller/components", "primeCounter"},
                                           Sound{"examples/fingerprint/components/greetings",
                                                 "greetings"},
                                           Sound{"examples/importer/components", "iniImporter"},
                                           Sound{"examples/pluginList/plugins", "shapes"},
                                           Sound{"examples/safeMode/components", "brush"},
                                           Sound{"examples/safeMode/components", "cloud"},
                                           Sound{"examples/savedObjects/components", "people"},
                                           Sound{"examples/translation/components", "thermometer"}),
                         nameOfTest);
#endif

#if MZ_HAS_IMAGES
INSTANTIATE_TEST_SUITE_P(Images, SoundLibrary,
                         ::testing::Values(Sound{"examples/images/components", "imageImporters"}),
                         nameOfTest);
#endif
#if MZ_HAS_ARCHIVE
INSTANTIATE_TEST_SUITE_P(Archive, SoundLibrary,
                         ::testing::Values(Sound{"examples/archive/components", "noteImporter"}),
                         nameOfTest);
#endif

TEST(SoundLibraries, MayStoreObjectsWhoseBuilderAnotherLibraryHas) {
    const auto folder = buildFolder / sound;
    std::vector<CheckResult> results;
    for (const wchar_t* name : {L"storesCrates", L"crates"})
        results.push_back(checkLibrary(
            folder / (std::filesystem::path(name) += MZ_LIBRARY_EXTENSION), options()));
    EXPECT_THAT(rulesOf(results[0]), ElementsAre("persistant-class")) << textOf(results[0]);
    EXPECT_EQ(results[0].findings.size(), 2u);
    EXPECT_THAT(results[1].findings, IsEmpty()) << textOf(results[1]);

    std::vector<CheckResult> alone{results[0]};
    compareLibraries(alone);
    EXPECT_EQ(alone[0].findings.size(), 2u);

    compareLibraries(results);
    EXPECT_THAT(results[0].findings, IsEmpty()) << textOf(results[0]);
}

} // namespace
