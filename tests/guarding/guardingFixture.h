// SPDX-License-Identifier: BSL-1.0
/// Fixture with a folder for files, and the hostile importers in the component manager.
#pragma once

#include "components/base/assertions.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/processControl.h"
#include "components/componentTools/guardedImport.h"
#include "tests/guarding/components/parcel.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <string>
#include <vector>

namespace Mz::Kit {

inline void PrintTo(ImportVerdict verdict, std::ostream* out) {
    *out << nameOf(verdict);
}

} // namespace Mz::Kit

namespace Mz::Test {

/// A process controller that stores what it receives.
class RecordingController final : public QrCastImpl<RecordingController, QrProcessControl> {
  public:
    void* getContext() override { return this; }
    void message(int code, const wchar_t* text) override { note(L"message", code, text); }
    bool isInterrupted() override { return interrupted; }
    bool warning(int code, const wchar_t* text) override {
        note(L"warning", code, text);
        return true;
    }
    bool isProgressShown() override { return true; }
    bool progress(float fraction, const wchar_t* text) override {
        note(L"progress", static_cast<int>(fraction * 100), text);
        return fraction < 1;
    }
    bool isStatusShown() override { return false; }
    void status(const wchar_t* text) override { note(L"status", 0, text); }
    bool error(int code, const wchar_t* text) override {
        note(L"error", code, text);
        return false;
    }
    bool isErrorShown() override { return true; }
    void log(int code, const wchar_t* text) override { note(L"log", code, text); }
    [[noreturn]] void abort(int code, const wchar_t* text) override {
        note(L"abort", code, text);
        Assertions::throwProgramAborted("tests/guarding/guardingFixture", __LINE__);
    }
    std::wstring findFile(const wchar_t* name, const wchar_t* path,
                          const wchar_t* fallback) override {
        note(L"findFile", fallback ? 1 : 0, path);
        return std::wstring(L"found ") + name;
    }

    std::vector<std::wstring> notes;
    bool interrupted = false;
    std::size_t kept = 1000; ///< how many notes to keep

  private:
    void note(const wchar_t* function, int code, const wchar_t* text) {
        if (notes.size() < kept)
            notes.push_back(std::wstring(function) + L" " + std::to_wstring(code) + L" " + text);
    }
};

class Guarding : public ::testing::Test {
  protected:
    void SetUp() override {
        QrSetSystemProcessController(&controller);
        QrGetComponentManager()->initialize(
            searchPathOf(std::filesystem::path(MZ_BUILD_PATH) / "components" / "hostile").c_str());
    }
    void TearDown() override {
        QrSetSystemProcessController(previous);
        EXPECT_FALSE(hasChildProcess());
    }

    std::filesystem::path file(const std::string& content,
                               const std::filesystem::path& name = "file.act") {
        const std::filesystem::path path = folder.path() / name;
        std::ofstream(path, std::ios::binary) << content;
        return path;
    }

    Kit::GuardedImport import(const std::string& content) {
        return Kit::importGuarded(file(content), limits);
    }

    static QrPtr<Parcel> parcelOf(const Kit::GuardedImport& import) {
        return queryCast<Parcel>(import.object.get());
    }

    TemporaryDirectory folder;
    QrProcessControl* const previous = QrGetSystemProcessController();
    RecordingController controller;
    Kit::ImportLimits limits;
};

} // namespace Mz::Test
