// SPDX-License-Identifier: BSL-1.0
/// Checks single rules in the process of a test, with a library whose answers the test writes. What
/// a rule does then is seen at each of its steps, and a test takes milliseconds.
#pragma once

#include "components/componentKit/importBuilder.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/stream.h"
#include "components/componentManager/utf8.h"
#include "components/componentTools/checking/rules.h"
#include "components/platform/platform.h"
#include "tests/checks/obeying.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

namespace Mz::Test {

/// Returns a uid that differs from another one only in its last word.
constexpr QrUid scriptedUid(std::uint32_t number) {
    return {0x5E1D0100, 0x3C5A11EF, 0x8D1B2C00, number};
}

/// A builder that the test owns. It makes nothing unless the test says what.
class ScriptedBuilder
    : public Kit::SelfDescribing<
          QrCastMulti<ScriptedBuilder, QrComponentBuilder, QrBuilderDescription>> {
  public:
    explicit ScriptedBuilder(std::uint32_t number = 1, const wchar_t* label = L"Scripted")
        : SelfDescribing({.uid = Kit::BuilderUid::atRunTime(scriptedUid(number)),
                          .name = L"scripted",
                          .label = label}) {}

    QrRef<QrCastable> createObject() override { return create(); }

    std::function<QrRef<QrCastable>()> create = [] { return nullptr; };
};

/// An import builder that the test owns. It accepts everything and imports nothing.
class ScriptedImporter
    : public Kit::SelfDescribing<QrCastMulti<ScriptedImporter, QrComponentBuilder,
                                             QrBuilderDescription, QrImportBuilder>> {
  public:
    explicit ScriptedImporter(const wchar_t* label = L"Scripted")
        : SelfDescribing({.uid = Kit::BuilderUid::atRunTime(scriptedUid(1)),
                          .name = L"scripted",
                          .label = label}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrRef<QrCastable> createObject() override { return create(); }
    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        for (const wchar_t* extension : extensions)
            if (const QrEnum::Action action = e.process(extension))
                return action;
        return e.finished();
    }
    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return accept(std::move(io));
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        return make(std::move(io));
    }

    std::function<QrRef<QrCastable>()> create = [] { return nullptr; };
    std::vector<const wchar_t*> extensions{L"scripted"};
    std::function<bool(QrPtr<QrBufferedIO>)> accept = [](auto) { return true; };
    std::function<QrRef<QrCastable>(QrPtr<QrBufferedIO>)> make = [](auto) { return nullptr; };
};

/// A description that the test owns, with builders that it owns.
class ScriptedDescription : public QrCastImpl<ScriptedDescription, QrComponentDescription> {
  public:
    using Builders = QrEnumerator<QrCPtr<QrBuilderDescription>>;

    QrRef<QrCastable> createBuilder(const QrUid& uid) override {
        for (QrBuilderDescription* builder : builders)
            if (builder && builder->getUid() == uid)
                return builder->getCastable();
        return nullptr;
    }
    int64 getComponentValue() override { return 1; }
    const wchar_t* getComponentLabel() override { return L"Scripted"; }
    const wchar_t* getComponentText() override { return L"A library of a test"; }
    unsigned int getBuilderCount() override { return static_cast<unsigned int>(builders.size()); }
    QrEnum::Action enumerateBuilders(Builders& e) override {
        for (QrBuilderDescription* builder : builders)
            if (const QrEnum::Action action = e.process(QrCPtr<QrBuilderDescription>(builder)))
                return action;
        return e.finished();
    }

    std::vector<QrBuilderDescription*> builders;
};

/// An object that the test owns, which stores the number 4711.
class ScriptedObject : public QrCastImpl<ScriptedObject, QrPersistant> {
  public:
    const QrUid* getClassUid() const override { return &classUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << number; }
    void read(QrStream& stream) override { stream >> number; }

    QrUid classUid = scriptedUid(1);
    int number = 4711;
};

/// Loads the library, and answers for it.
class ObedientLibrary : public ::testing::Test {
  protected:
    ObedientLibrary() : module(platform::loadLibrary(file().native())) {
        if (!module)
            throw std::runtime_error("the library obedient cannot be loaded");
        describe = [this] { return &description; };
        runTest = [](int, Kit::TestReport&) { return false; };
        const Orders orders{
            [] { return describe(); },
            [](int number, Kit::TestReport& report) { return runTest(number, report); }};
        reinterpret_cast<Obey*>(platform::findSymbol(module, "mzTestObey"))(&orders);
    }
    ~ObedientLibrary() override { platform::unloadLibrary(module); }

    static std::filesystem::path file() {
        return std::filesystem::path(MZ_BUILD_PATH) / "components" / "checks" /
               (std::wstring(L"obedient") + MZ_LIBRARY_EXTENSION);
    }

    /// Checks one rule and returns what it says.
    Tools::CheckReport reportOf(const char* rule) {
        task.file = file();
        Tools::CheckReport report;
        Tools::CheckSender sender([&](std::string message) { decodeReport(message, report); });
        Tools::CheckContext context(task, sender);
        const Tools::RuleEntry& entry = Tools::ruleEntry(rule);
        context.begin(entry.facts);
        entry.check(context);
        return report;
    }

    /// Checks one rule and returns the findings of all rules, each as "RULE: SENTENCE".
    std::vector<std::string> check(const char* rule) {
        std::vector<std::string> findings;
        for (const Tools::CheckFinding& finding : reportOf(rule).findings)
            findings.push_back(std::string(finding.rule->id) + ": " + toUtf8(finding.sentence));
        return findings;
    }

    /// Names a call that ended an earlier process.
    void avoid(const std::wstring& what, const std::wstring& place) {
        task.avoided.insert(toUtf8(what + L" " + place));
    }

    static std::wstring placeOf(std::uint32_t number) {
        return Tools::placeOf(L"scripted", scriptedUid(number));
    }

    inline static std::function<QrCastable*()> describe;
    inline static std::function<Kit::RunComponentTest> runTest;

    ScriptedDescription description;
    Tools::CheckTask task;

  private:
    platform::Module module;
};

} // namespace Mz::Test
