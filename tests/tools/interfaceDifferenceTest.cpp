// SPDX-License-Identifier: BSL-1.0
/// The sentence about each property of a base or of a value in which two fingerprints can differ.
/// The tables are written here, because no edit of a header changes one property alone.
#include "components/componentTools/inspecting/interfaceDifference.h"

#include "components/componentManager/interfaceTable.h"

#include <gtest/gtest.h>

#include <string>

using namespace Mz;
using namespace Mz::Tools;

namespace {

InterfaceTable table() {
    InterfaceTable result{{1, 2, 3, 4}, 0, 8, 8, "Reader", 9, {}, {}, {}};
    result.bases.push_back({"Base", 3, 16, false});
    result.values.push_back({"Point", 12, 4, 0});
    return result;
}

/// Returns the sentence on a component whose table was changed, and a host whose table was not.
template <class Change>
std::wstring sentence(Change change) {
    InterfaceTable here = table();
    change(here);
    const auto finding = interfaceDifference({here}, {table()});
    if (!finding)
        return {};
    EXPECT_EQ(finding->verdict, Verdict::otherInterface);
    EXPECT_EQ(finding->subject, L"Reader");
    return finding->words;
}

TEST(InterfaceDifference, OfABaseIsItsSlotsOrItsSize) {
    EXPECT_EQ(sentence([](InterfaceTable&) {}), L"");
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.bases[0].slotCount = 4; }),
              L"Base, a base of Reader, has 4 slots here and 3 in the host");
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.bases[0].size = 24; }),
              L"Base, a base of Reader, has 24 bytes here and 16 in the host");
    EXPECT_EQ(sentence([](InterfaceTable& here) {
                  here.bases[0] = {"Base", 2, 24, false};
              }),
              L"Base, a base of Reader, has 2 slots here and 3 in the host")
        << "the slots come first";
}

TEST(InterfaceDifference, OfABaseIsItsDestructor) {
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.bases[0].virtualDestructor = true; }),
              L"Base, a base of Reader, has a virtual destructor only here");
    InterfaceTable host = table();
    host.bases[0].virtualDestructor = true;
    const auto finding = interfaceDifference({table()}, {host});
    ASSERT_TRUE(finding);
    EXPECT_EQ(finding->words, L"Base, a base of Reader, has a virtual destructor only in the host");
}

TEST(InterfaceDifference, OfTheSlotsNamesTheFirstThatOneHas) {
    InterfaceTable shorter = table(), longer = table();
    shorter.slotCount = 9;
    longer.slotCount = 11;
    longer.operations = {{9, "void open()"}, {10, "void close()"}};
    const auto words = [](const InterfaceTable& here, const InterfaceTable& host) {
        const auto finding = interfaceDifference({here}, {host});
        return finding ? finding->words : std::wstring();
    };
    EXPECT_EQ(words(longer, shorter), L"Reader has 11 slots here and 9 in the host: only here is "
                                      L"`void open()`");
    EXPECT_EQ(words(shorter, longer), L"Reader has 9 slots here and 11 in the host: only the host "
                                      L"has `void open()`");
}

TEST(InterfaceDifference, IsNoneIfClangOmitsAnInlineNamespace) {
    InterfaceTable gcc = table(), clang = table();
    clang.flags = interfaceFromClang;
    const auto differ = [&](const char* gccText, const char* clangText) {
        gcc.operations = {{9, gccText}};
        clang.operations = {{9, clangText}};
        const bool either = interfaceDifference({gcc}, {clang}).has_value();
        EXPECT_EQ(interfaceDifference({clang}, {gcc}).has_value(), either) << gccText;
        return either;
    };
    EXPECT_FALSE(differ("Text operator[](std::v1::Index)", "Text operator[](std::Index)"));
    EXPECT_FALSE(differ("std::v1::Text operator~()", "std::Text operator~()"));
    EXPECT_FALSE(differ("Z operator|(std::v1::Zone, a@b)", "Z operator|(std::Zone, a@b)"));
    EXPECT_TRUE(differ("Text operator[](std::v1::Index)", "Text operator{}(std::Index)"));
    EXPECT_TRUE(differ("v1::Text get()", "Text get()")) << "the first scope is the name's own";
}

TEST(InterfaceDifference, OfTheObjectIsItsSizeOrItsAlignment) {
    const std::wstring end = L" in the host, by another base or member";
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.objectSize = 16; }),
              L"Reader has 16 bytes here and 8" + end);
    EXPECT_NE(sentence([](InterfaceTable& here) { here.alignment = 16; }), L"");
}

TEST(InterfaceDifference, OfAValueIsItsSizeOrItsAlignment) {
    const std::wstring subject = L"Point, which Reader passes by value, ";
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.values[0].size = 16; }),
              subject + L"has 16 bytes here and 12 in the host");
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.values[0].alignment = 8; }),
              subject + L"is aligned to 8 bytes here and to 4 in the host");
}

TEST(InterfaceDifference, OfAnIncompleteOrAnotherValueIsNone) {
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.values[0] = {"Point", 0, 0, 0}; }), L"");
    InterfaceTable host = table();
    host.values[0].size = 0;
    EXPECT_FALSE(interfaceDifference({table()}, {host}));
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.values[0] = {"Pixel", 16, 8, 1}; }), L"");
    EXPECT_EQ(sentence([](InterfaceTable& here) { here.bases[0] = {"Other", 4, 24, true}; }), L"");
}

TEST(InterfaceDifference, OfCompilersIsNotAnInlineNamespaceWhateverItsLetters) {
    const auto differs = [](const char* gcc, const char* clang) {
        InterfaceTable here = table(), there = table();
        here.flags = interfaceFromClang;
        here.operations.push_back({3, clang});
        there.operations.push_back({3, gcc});
        return interfaceDifference({here}, {there}).has_value();
    };
    EXPECT_FALSE(differs("void use(a::v1::T)", "void use(a::T)"));
    EXPECT_FALSE(differs("void use(a::\xC3\x80::T)", "void use(a::T)"))
        << "the first non-ASCII byte";
    EXPECT_FALSE(differs("void use(a::\xC3\xBF::T)", "void use(a::T)"));
    EXPECT_TRUE(differs("void use(a::T)", "void use(a::v1::T)"));
}

} // namespace
