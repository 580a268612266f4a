// SPDX-License-Identifier: BSL-1.0
/// What the rules of import builders see, call by call.
#include "tests/checks/obedientLibrary.h"

#include "components/componentManager/bufferio.h"
#include "components/componentManager/exceptions.h"
#include "components/componentTools/checking/allocationLimit.h"
#include "components/componentTools/checking/checkController.h"
#include "components/componentTools/checking/importing.h"
#include "tests/support/temporaryDirectory.h"

#include <clocale>
#include <limits>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::SizeIs;
using ::testing::StartsWith;

namespace {

class ImportRules : public ObedientLibrary {
  protected:
    ImportRules() {
        description.builders = {&importer};
        importer.make = [this](QrPtr<QrBufferedIO> io) {
            io->read();
            return object.getCastable();
        };
    }

    ScriptedObject object;
    ScriptedImporter importer;
};

TEST_F(ImportRules, SeeNoFaultInAPlainImporter) {
    for (const char* rule :
         {"extension-form", "extension-case", "import-label", "canimport-survives",
          "canimport-restores", "import-survives", "import-releases", "import-reports",
          "import-progress", "import-stops"})
        EXPECT_THAT(check(rule), IsEmpty()) << rule;
}

TEST_F(ImportRules, TryOneInputIfTheTaskNamesIt) {
    int imports = 0;
    importer.make = [&](auto) {
        ++imports;
        return nullptr;
    };
    task.input = 3;
    const CheckReport report = reportOf("import-reports");
    EXPECT_EQ(imports, 1);
    ASSERT_EQ(report.findings.size(), 1u);
    EXPECT_EQ(report.findings[0].reproduce, "import-reports:0:3:1");
    EXPECT_THAT(toUtf8(report.findings[0].sentence),
                StartsWith("import returns null without a message for input 3 (one letter)"));
}

TEST_F(ImportRules, AcceptCapitalsBesideTheirLowerCase) {
    importer.extensions = {nullptr, L"OBJ", L"obj", L"Stl", nullptr};
    EXPECT_THAT(check("extension-case"),
                ElementsAre("extension-case: the extension \"Stl\" has no lower-case form, and "
                            "importers compare extensions exactly. Enumerate \"stl\" too."));
    EXPECT_THAT(check("extension-form"), SizeIs(2)) << "the null ones";
}

TEST_F(ImportRules, ExpectALabelThatIsNotEmpty) {
    ScriptedImporter empty(L""), absent(nullptr);
    description.builders = {&empty};
    EXPECT_THAT(check("import-label"), ElementsAre(StartsWith("import-label: its label is empty")));
    description.builders = {&absent};
    EXPECT_THAT(check("import-label"), IsEmpty()) << "the finding of another rule";
}

TEST_F(ImportRules, ExpectAnInputWhosePositionCanBeRestored) {
    importer.accept = [](QrPtr<QrBufferedIO> io) {
        io->ungetc('x'); // There is no byte that was read before.
        return true;
    };
    EXPECT_THAT(check("canimport-restores"),
                ElementsAre(StartsWith("canimport-restores: canImport leaves the input where its "
                                       "position cannot be restored, with input 0 (empty). ")));
}

TEST_F(ImportRules, NameTheFunctionThatKeepsTheInput) {
    std::vector<QrPtr<QrBufferedIO>> kept;
    importer.accept = [&](QrPtr<QrBufferedIO> io) {
        kept.push_back(io);
        return true;
    };
    EXPECT_THAT(check("import-releases"),
                ElementsAre(StartsWith("import-releases: canImport keeps a reference to the input, "
                                       "with input 0 (empty). ")));
    for (QrPtr<QrBufferedIO>& io : kept)
        io->release(); // The rule has left its reference, because the input may be used later.
}

TEST_F(ImportRules, AcceptEachReasonForNoObject) {
    importer.make = [](auto) { return nullptr; };
    EXPECT_THAT(check("import-reports"), ElementsAre(StartsWith("import-reports: import returns "
                                                                "null without a message for ")));
    importer.make = [](auto) -> QrRef<QrCastable> {
        throw QrStreamEx::ExReadError("importRulesTest", __LINE__);
    };
    EXPECT_THAT(check("import-reports"), IsEmpty()) << "an exception";
    importer.make = [](auto) {
        QrGetProcessController()->message(0, L"No object today");
        return nullptr;
    };
    EXPECT_THAT(check("import-reports"), IsEmpty()) << "a message";
    importer.make = [](auto) { return nullptr; };
    importer.accept = [](auto) { return false; };
    EXPECT_THAT(check("import-reports"), IsEmpty()) << "it did not accept the input";
    importer.accept = [](auto) { return true; };
    avoid(L"import", placeOf(1));
    EXPECT_THAT(check("import-reports"), IsEmpty()) << "a call that is not made";
}

TEST_F(ImportRules, CountTheQuestionsOfAnImportThatGoesOn) {
    int questions = 3; // Two more, to end, are tolerated.
    importer.make = [&](auto) {
        for (int question = 0; question < questions; ++question)
            static_cast<void>(QrGetProcessController()->isInterrupted());
        return nullptr;
    };
    EXPECT_THAT(check("import-stops"), IsEmpty());
    questions = 5;
    EXPECT_THAT(check("import-stops"),
                ElementsAre(StartsWith("import-stops: import was told to stop, and asked 4 times "
                                       "more, for input 0 (empty). ")));
}

TEST_F(ImportRules, ReportTheFirstProgressOutside) {
    importer.make = [&](auto) {
        for (const float fraction : {0.0f, 1.0f, -0.5f, 3.0f})
            QrGetProcessController()->progress(fraction, L"");
        return object.getCastable();
    };
    EXPECT_THAT(check("import-progress"),
                ElementsAre(StartsWith("import-progress: import reports the progress -0.5")));
    importer.make = [&](auto) {
        QrGetProcessController()->progress(std::numeric_limits<float>::quiet_NaN(), L"");
        return object.getCastable();
    };
    EXPECT_THAT(check("import-progress"), ElementsAre(HasSubstr("the progress ")));
}

TEST_F(ImportRules, RestoreTheLocaleThatACallChanges) {
    const std::string before = std::setlocale(LC_ALL, nullptr);
    const char* other = nullptr;
    for (const char* name : {"C.UTF-8", "English_United States.1252", "German"})
        if (!other && std::setlocale(LC_ALL, name) && std::setlocale(LC_ALL, nullptr) != before)
            other = name;
    std::setlocale(LC_ALL, before.c_str());
    if (!other)
        GTEST_SKIP() << "there is no other locale";
    importer.accept = [&](auto) {
        std::setlocale(LC_ALL, other);
        return true;
    };
    EXPECT_THAT(check("canimport-restores"),
                ElementsAre(StartsWith("canimport-restores: canImport changes the settings of the "
                                       "process (")));
    EXPECT_EQ(std::setlocale(LC_ALL, nullptr), before);
}

TEST_F(ImportRules, FailAllocationsUnlessTheImporterEndedAProcess) {
    static constexpr AllocationLimit none{[](int) {}, [] { return false; }};
    setAllocationLimit(&none);
    int questions = 0;
    importer.accept = [&](auto) { return ++questions % 2 == 0; };
    EXPECT_THAT(check("allocation-failure"), IsEmpty());
    EXPECT_EQ(questions, 1);
    importer.accept = [&](auto) -> bool {
        ++questions;
        throw QrStreamEx::ExReadError("importRulesTest", __LINE__);
    };
    EXPECT_THAT(check("allocation-failure"), IsEmpty());
    EXPECT_EQ(questions, 301) << "a failure asks for one more allocation, 300 times at most";
    for (const wchar_t* call : {L"canImport", L"import"}) {
        task.avoided.clear();
        avoid(call, placeOf(1));
        EXPECT_THAT(check("allocation-failure"), IsEmpty());
        EXPECT_EQ(questions, 301);
    }
    setAllocationLimit(nullptr);
}

TEST(CheckInputs, AreWithoutSamplesThatCannotBeRead) {
    const TemporaryDirectory folder;
    const CheckInputs inputs(1, {folder.write("sample", "12345678"), folder.path() / "missing"});
    EXPECT_EQ(inputs.at(0).bytes, "12345678");
    EXPECT_TRUE(inputs.at(0).valid);
    EXPECT_EQ(inputs.at(1).bytes, "1");
    EXPECT_FALSE(inputs.at(1).valid);
    EXPECT_EQ(inputs.fixedCount(), CheckInputs(1, {}).fixedCount() + 4);
}

} // namespace
