// SPDX-License-Identifier: BSL-1.0
// Tests the file functions of QrImportBuilder: opening, closing and exceptions.
#include "tests/support/temporaryDirectory.h"
#include "tests/unit/importTestObjects.h"
#include "tests/unit/openFiles.h"

#include <gtest/gtest.h>

#include <fstream>

using namespace Mz;
using namespace Mz::Test;

namespace {

constexpr QrUid builderUid{0x7D2E0011, 0x33B14C5A, 0x9A40C6D1, 0x20F7E8B3};

class ImportBuilder : public testing::Test {
  protected:
    ImportBuilder()
        : file(directory.write("data.xyz", "abc")),
          builder(new TestImportBuilder({.uid = builderUid, .label = L"A"}, {}, calls)),
          path(file.wstring()) {}

    TemporaryDirectory directory;
    Calls calls;
    std::filesystem::path file;
    QrPtr<TestImportBuilder> builder;
    std::wstring path;
};

TEST_F(ImportBuilder, OpensNothingForANullOrEmptyPath) {
    EXPECT_FALSE(builder->canImport(nullptr, L"hint"));
    EXPECT_FALSE(builder->canImport(L"", L"hint"));
    EXPECT_FALSE(builder->import(nullptr, L"hint"));
    EXPECT_FALSE(builder->import(L"", L"hint"));
    EXPECT_EQ(calls, Calls{});
}

TEST_F(ImportBuilder, IsNotAskedAboutFilesThatCannotBeOpened) {
    for (const std::wstring& missing :
         {directory.text() + L"/missing.xyz", directory.text() + L"/nowhere/data.xyz",
          directory.text(), directory.text() + L"/"}) {
        EXPECT_FALSE(builder->canImport(missing.c_str(), L"hint"));
        EXPECT_FALSE(builder->import(missing.c_str(), L"hint"));
    }
    EXPECT_EQ(calls, Calls{});
}

TEST_F(ImportBuilder, IsAskedWithAnOpenFileAndBothTextsUnchanged) {
    builder->onCanImport = [&](QrBufferedIO& io) {
        EXPECT_TRUE(isOpen(file));
        EXPECT_EQ(io.tell(), 0);
        char content[4];
        EXPECT_EQ(io.read(content, 4), 3);
        return std::string(content, 3) == "abc";
    };
    EXPECT_TRUE(builder->canImport(path.c_str(), L"hint"));
    EXPECT_EQ(calls, Calls{L"A can [" + path + L"] [hint]"});
    EXPECT_FALSE(isOpen(file));
    builder->onCanImport = [](QrBufferedIO&) { return false; };
    EXPECT_FALSE(builder->canImport(path.c_str(), nullptr));
    EXPECT_EQ(calls.back(), L"A can [" + path + L"] [(null)]");
}

TEST_F(ImportBuilder, ImportsFromTheFileAndClosesItBeforeItReturns) {
    builder->onImport = [&](QrBufferedIO& io) {
        EXPECT_TRUE(isOpen(file));
        return io.read() == 'a';
    };
    const QrRef<QrCastable> object = builder->import(path.c_str(), L"hint");
    EXPECT_EQ(makerOf(object), L"A");
    EXPECT_FALSE(isOpen(file));
    EXPECT_EQ(calls, Calls{L"A import [" + path + L"] [hint]"});
    builder->onImport = [](QrBufferedIO&) { return false; };
    EXPECT_FALSE(builder->import(path.c_str(), nullptr));
    EXPECT_FALSE(isOpen(file));
}

TEST_F(ImportBuilder, LetsExceptionsThroughAndLeavesNoFileOpen) {
    builder->onCanImport = [](QrBufferedIO&) -> bool { throw 42; };
    builder->onImport = [](QrBufferedIO& io) -> bool { return io.seek(100000, -7) == 0; };
    EXPECT_THROW(builder->canImport(path.c_str(), nullptr), int);
    EXPECT_FALSE(isOpen(file));
    EXPECT_THROW(builder->import(path.c_str(), nullptr), QrStreamEx::ExReadError);
    EXPECT_FALSE(isOpen(file));
}

TEST_F(ImportBuilder, OpensTheFileInBinary) {
    const std::wstring binary = directory.write("binary.xyz", "a\r\n\x1A\nb").wstring();
    std::string content;
    builder->onCanImport = [&](QrBufferedIO& io) {
        for (int byte = io.read(); byte != -1; byte = io.read())
            content += static_cast<char>(byte);
        return true;
    };
    EXPECT_TRUE(builder->canImport(binary.c_str(), nullptr));
    EXPECT_EQ(content, "a\r\n\x1A\nb");
}

TEST_F(ImportBuilder, DeniesNothingToOtherOpeners) {
    std::ofstream writer(file, std::ios::binary | std::ios::in);
    ASSERT_TRUE(writer.good());
    builder->onCanImport = [&](QrBufferedIO&) {
        std::ifstream reader(file, std::ios::binary);
        std::ofstream second(file, std::ios::binary | std::ios::in);
        EXPECT_TRUE(reader.good());
        EXPECT_TRUE(second.good());
        return true;
    };
    EXPECT_TRUE(builder->canImport(path.c_str(), nullptr));
}

TEST_F(ImportBuilder, TakesAnEmptyFile) {
    const std::wstring empty = directory.write("empty.xyz", "").wstring();
    builder->onCanImport = [](QrBufferedIO& io) { return io.read() == -1; };
    EXPECT_TRUE(builder->canImport(empty.c_str(), nullptr));
}

TEST_F(ImportBuilder, StandsForItself) {
    const QrPtr<QrComponentBuilder> component =
        queryCast<QrComponentBuilder>(builder->getCastable());
    ASSERT_TRUE(component);
    EXPECT_EQ(component->QrComponentBuilder::getBuilder(), component);
    EXPECT_TRUE(queryCast<QrImportBuilder>(component.get()));
    EXPECT_TRUE(queryCast<QrBuilderDescription>(component.get()));
    EXPECT_EQ(component->newReference(), 2) << "three references; the count of the first is 0";
    EXPECT_EQ(component->release(), 1);
}

} // namespace
