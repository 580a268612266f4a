// SPDX-License-Identifier: BSL-1.0
/// The fingerprints of interfaces: what is read from a file, and which edits are found. The
/// libraries are built by each compiler of the system: see `interfaces/CMakeLists.txt`.
#include "components/componentManager/interfaceTable.h"
#include "components/componentTools/fingerprints.h"
#include "components/componentTools/images/libraryImage.h"
#include "components/componentTools/inspecting/interfaceDifference.h"
#include "components/componentTools/platform/system.h"
#include "tests/tools/toolsFixture.h"

#include <algorithm>
#include <cstring>
#include <random>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::AllOf;
using ::testing::HasSubstr;

namespace {

const std::filesystem::path interfaces = buildFolder / "interfaces";

/// The compilers whose libraries were built.
std::vector<std::string> compilers() {
    std::vector<std::string> result{"own"};
    if (std::filesystem::exists(interfaces / "other"))
        result.push_back("other");
    return result;
}

std::filesystem::path library(const std::string& compiler, const std::string& edit) {
    return interfaces / compiler / (edit + ".library");
}

/// Returns the difference between a component with this edit and the host.
std::optional<Finding> difference(const std::string& edit, const std::string& compiler = "own",
                                  const std::string& hostCompiler = "own") {
    return interfaceDifference(library(compiler, edit), {library(hostCompiler, "none")});
}

class Interfaces : public ToolsTest {};

TEST_F(Interfaces, EachEditThatMovesOrChangesAnOperationIsFound) {
    for (const std::string& compiler : compilers())
        for (const std::string& hostCompiler : compilers())
            for (const char* edit :
                 {"appended",      "argument",         "argumentAdded",  "base",
                  "baseRemoved",   "basesReordered",   "constRemoved",   "enumerationWidened",
                  "inserted",      "insertedUnlisted", "member",         "noexceptAdded",
                  "overloadAdded", "privateAppended",  "removed",        "renamed",
                  "reordered",     "result",           "valueDestroyed", "valueGrown",
                  "valueVirtual",  "virtualDestructor"}) {
                const auto found = difference(edit, compiler, hostCompiler);
                ASSERT_TRUE(found) << edit << ", " << compiler << " with " << hostCompiler;
                EXPECT_EQ(found->verdict, Verdict::otherInterface);
                EXPECT_EQ(found->subject, L"Greeter");
                EXPECT_THAT(sentenceOf(*found), AllOf(HasSubstr(L"Greeter"), HasSubstr(L" here")));
                EXPECT_THAT(cureOf(*found), HasSubstr(L"uid of its own"));
            }
}

TEST_F(Interfaces, WhatChangesNothingForAComponentIsAccepted) {
    for (const std::string& compiler : compilers())
        for (const std::string& hostCompiler : compilers())
            for (const char* edit : {"none", "alias", "defaultArgument", "fewerListed", "helper",
                                     "nodiscard", "ownUid", "parameterRenamed"}) {
                const auto found = difference(edit, compiler, hostCompiler);
                EXPECT_FALSE(found) << edit << ", " << compiler << " with " << hostCompiler << ": "
                                    << std::filesystem::path(found->words);
            }
}

TEST_F(Interfaces, WithoutAFingerprintNothingIsCompared) {
    EXPECT_FALSE(difference("noMacro"));
    EXPECT_FALSE(interfaceDifference(library("own", "inserted"), {library("own", "noMacro")}));
    EXPECT_FALSE(interfaceDifference(library("own", "inserted"), {}));
    EXPECT_FALSE(interfaceDifference(folder.write("text", "no library"), {library("own", "none")}));
    EXPECT_FALSE(interfaceDifference(folder.path() / "missing", {folder.path() / "missing"}));
}

TEST_F(Interfaces, TheSentenceNamesTheFirstSlotThatDiffers) {
    EXPECT_EQ(sentenceOf(difference("inserted").value()),
              L"slot 10 of Greeter is `void added()` here and "
              L"`void setGreeting(const std::string&)` in the host");
    EXPECT_EQ(
        cureOf(difference("inserted").value()),
        L"rebuild it with the Greeter of its host, or give the changed interface a uid of its "
        L"own");
    EXPECT_EQ(difference("constRemoved")->words,
              L"slot 9 of Greeter is `const char* greeting()` here and "
              L"`const char* greeting() const` in the host");
    EXPECT_EQ(difference("appended")->words,
              L"Greeter has 15 slots here and 14 in the host: only here is `void added()`");
    EXPECT_EQ(
        difference("valueGrown")->words,
        L"Edited::Place, which Greeter passes by value, has 24 bytes here and 16 in the host");
    EXPECT_EQ(difference("virtualDestructor")->words,
              L"Edited::Watched, a base of Greeter, has a virtual destructor only here");
    EXPECT_EQ(difference("member")->words,
              L"Greeter has 24 bytes here and 16 in the host, by another base or member");
}

TEST_F(Interfaces, AreFoundInTheProgramOfAHostToo) {
    const auto program = interfaces / "own" / "host.program";
    EXPECT_FALSE(interfaceDifference(library("own", "none"), {program}));
    EXPECT_TRUE(interfaceDifference(library("own", "inserted"), {program}));
    EXPECT_TRUE(
        interfaceDifference(library("own", "inserted"), {library("own", "noMacro"), program}));
}

TEST_F(Interfaces, OfTheLibraryAreInItsFileAndInEachComponent) {
    const auto names = [](const std::filesystem::path& file) {
        std::vector<std::string> result;
        for (const Tools::InterfaceTable& table : interfaceTablesOf(file))
            result.push_back(table.name);
        return result;
    };
    const auto own = ::testing::UnorderedElementsAre(
        "QrBufferedIO", "QrPersistant", "QrComponentBuilder", "QrBuilderDescription",
        "QrComponentDescription", "QrComponentManager", "QrImportBuilder", "QrImporter",
        "QrProcessControl");
    EXPECT_THAT(names(System::managerFile()), own);
    EXPECT_THAT(names(builtComponent(L"goodWithKit")), own);
    EXPECT_FALSE(interfaceDifference(builtComponent(L"goodWithKit"), {}));
}

TEST_F(Interfaces, HaveNamesForCallers) {
    EXPECT_EQ(fingerprintsOf(library("own", "none")),
              (std::vector<std::string>{"Greeter", "Other"}));
    EXPECT_TRUE(fingerprintsOf(folder.write("text", "no library")).empty());
    EXPECT_TRUE(fingerprintsOf(folder.path() / "missing").empty());
}

/// The tables of the library, to be changed.
class ChangedInterfaces : public ::testing::Test {
  protected:
    static Tools::InterfaceTable& named(std::vector<Tools::InterfaceTable>& tables,
                                        const std::string& name) {
        return *std::find_if(tables.begin(), tables.end(),
                             [&](const auto& table) { return table.name == name; });
    }

    std::vector<Tools::InterfaceTable> ours = interfaceTablesOf(System::managerFile());
    std::vector<Tools::InterfaceTable> theirs = ours;
};

TEST_F(ChangedInterfaces, AnInterfaceThatGrowsMayHaveMoreOperationsOnEitherSide) {
    Tools::InterfaceTable& manager = named(theirs, "QrComponentManager");
    manager.operations.push_back({manager.slotCount++, "void later()"});
    EXPECT_FALSE(interfaceDifference(theirs, ours));
    EXPECT_FALSE(interfaceDifference(ours, theirs));
    manager.operations[1].text = "void other()";
    EXPECT_TRUE(interfaceDifference(theirs, ours));
    EXPECT_TRUE(interfaceDifference(ours, theirs));
}

TEST_F(ChangedInterfaces, AnotherInterfaceMustNotGrow) {
    ++named(theirs, "QrProcessControl").slotCount;
    EXPECT_TRUE(interfaceDifference(theirs, ours));
    EXPECT_TRUE(interfaceDifference(ours, theirs));
}

/// Returns whether a table of GCC with the operation `gcc` fits one of Clang with `clang`.
bool fit(const std::string& gcc, const std::string& clang) {
    Tools::InterfaceTable ofGcc{{1, 2, 3, 4}, 0, 8, 8, "I", 9, {{8, gcc}}, {}, {}};
    Tools::InterfaceTable ofClang = ofGcc;
    ofClang.operations[0].text = clang;
    ofClang.flags = interfaceFromClang;
    const bool there = !interfaceDifference({ofGcc}, {ofClang});
    EXPECT_EQ(there, !interfaceDifference({ofClang}, {ofGcc})) << gcc << ", " << clang;
    return there;
}

TEST(InterfaceNames, MayLackInlineNamespacesByClangOnly) {
    EXPECT_TRUE(fit("a::v1::B f(a::v1::w2::C&)", "a::B f(a::C&)"));
    EXPECT_TRUE(fit("a::v1::B f()", "a::v1::B f()"));
    EXPECT_FALSE(fit("a::B f()", "a::v1::B f()"));
    EXPECT_FALSE(fit("a::v1::B f()", "a::C f()"));
    EXPECT_FALSE(fit("a::v1::B f()", "a::BB f()"));
    EXPECT_FALSE(fit("a::v1::B f()", "b::B f()"));
    EXPECT_FALSE(fit("a::B f()", "B f()"));
    EXPECT_FALSE(fit("a::B f()", "a::B f() const"));
    EXPECT_FALSE(fit("a::B f(int)", "a::B f(long)"));
    EXPECT_FALSE(fit("a::B f()", ""));
}

TEST(InterfaceNames, OfOneCompilerMustBeEqual) {
    Tools::InterfaceTable table{{1, 2, 3, 4}, 0, 8, 8, "I", 9, {{8, "a::v1::B f()"}}, {}, {}};
    Tools::InterfaceTable other = table;
    other.operations[0].text = "a::B f()";
    EXPECT_TRUE(interfaceDifference({table}, {other}));
}

/// The sections of a library, to be damaged.
class InterfaceBytes : public ::testing::Test {
  protected:
    InterfaceHead headAt(std::size_t offset) const {
        InterfaceHead head;
        std::memcpy(&head, content.data() + offset, sizeof head);
        return head;
    }

    std::string content = sectionsOf(library("own", "none"), interfaceSection);
};

TEST_F(InterfaceBytes, OfAnotherLayoutAreSkipped) {
    ASSERT_EQ(parseInterfaceTables(content).size(), 2u);
    content[offsetof(InterfaceHead, layout)] = 2;
    EXPECT_EQ(parseInterfaceTables(content).size(), 1u);
}

TEST_F(InterfaceBytes, MayHaveEntriesOfLaterVersions) {
    content[sizeof(InterfaceHead)] = 77; // the kind of the first entry
    const auto tables = parseInterfaceTables(content);
    ASSERT_EQ(tables.size(), 2u);
    EXPECT_EQ(tables[0].name, "");
    EXPECT_FALSE(tables[0].operations.empty());
}

TEST_F(InterfaceBytes, MayBeSeparatedByZeros) {
    EXPECT_EQ(
        parseInterfaceTables(std::string(64, '\0') + content + std::string(24, '\0') + content)
            .size(),
        4u);
}

TEST_F(InterfaceBytes, ThatAreCutOffGiveTheTablesBeforeOnly) {
    const std::size_t second = content.find("MZiface", sizeof(InterfaceHead));
    ASSERT_NE(second, std::string::npos);
    const std::size_t firstEnd = headAt(0).size, secondEnd = second + headAt(second).size;
    ASSERT_LE(firstEnd, second);
    for (std::size_t length = 0; length <= content.size(); ++length)
        EXPECT_EQ(parseInterfaceTables(content.substr(0, length)).size(),
                  std::size_t{length >= firstEnd} + std::size_t{length >= secondEnd})
            << length;
}

TEST_F(InterfaceBytes, ThatAreDamagedAreReadWithoutHarm) {
    std::mt19937 random(7);
    for (int round = 0; round < 20000; ++round) {
        std::string damaged = content;
        for (unsigned int count = random() % 4 + 1; count > 0; --count) {
            static constexpr char values[] = {0, 1, 2, 7, 8, 16, 127, '\x80', '\xFF'};
            damaged[random() % damaged.size()] = values[random() % sizeof values];
        }
        std::size_t texts = 0;
        for (const Tools::InterfaceTable& table : parseInterfaceTables(damaged))
            for (const InterfaceOperation& operation : table.operations)
                texts += operation.text.size();
        EXPECT_LE(texts, damaged.size());
    }
}

TEST_F(Interfaces, InADamagedFileAreReadWithoutHarm) {
    const std::string content = contentOf(library("own", "none"));
    std::mt19937 random(11);
    for (int round = 0; round < 300; ++round) {
        std::string damaged =
            content.substr(0, random() % 8 ? content.size() : random() % content.size());
        for (int count = 0; count < 20 && !damaged.empty(); ++count) {
            // The tables of sections are at the ends of the file, or close to its begin.
            const std::size_t reach = std::min<std::size_t>(damaged.size(), 2600);
            const std::size_t place = random() % reach;
            damaged[random() % 2 ? place : damaged.size() - 1 - place] =
                static_cast<char>(random());
        }
        EXPECT_LE(interfaceTablesOf(folder.write("damaged", damaged)).size(), content.size());
    }
}

} // namespace
