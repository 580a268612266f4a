// SPDX-License-Identifier: BSL-1.0
/// Importing test data through the mesh components, and hearing what is said about it.
#pragma once

#include "components/componentManager/processControl.h"
#include "examples/mesh/mesh.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

namespace Meshes {

/// The importer, made by its builder. The components of this build are loaded at the first call of
/// the process.
Mz::QrPtr<MeshImporter> meshImporter();

/// Keeps what it is told; this thread's controller for as long as it lives.
class RecordingController final : public Mz::QrCastImpl<RecordingController, Mz::QrProcessControl> {
  public:
    RecordingController() { QrSetThreadProcessController(this); }
    ~RecordingController() override { QrSetThreadProcessController(nullptr); }

    std::vector<std::wstring> errors;
    std::vector<float> fractions;
    int questions = 0; ///< how often `isInterrupted` was asked
    bool progressShown = true;
    int interruptAfter = -1;     ///< `isInterrupted` says yes from then on
    std::size_t refuseAfter = 0; ///< the number of the report that `progress` answers with false

    void* getContext() override { return nullptr; }
    void message(int, const wchar_t*) override {}
    bool isInterrupted() override { return ++questions > interruptAfter && interruptAfter >= 0; }
    bool warning(int, const wchar_t*) override { return true; }
    bool isProgressShown() override { return progressShown; }
    bool progress(float fraction, const wchar_t*) override {
        fractions.push_back(fraction);
        return fractions.size() != refuseAfter;
    }
    bool isStatusShown() override { return false; }
    void status(const wchar_t*) override {}
    bool error(int, const wchar_t* text) override {
        errors.emplace_back(text);
        return true;
    }
    bool isErrorShown() override { return true; }
    void log(int, const wchar_t*) override {}
    [[noreturn]] void abort(int, const wchar_t*) override { throw 0; }
    std::wstring findFile(const wchar_t* name, const wchar_t* search,
                          const wchar_t* fallback) override {
        return QrGetSystemProcessController()->findFile(name, search, fallback);
    }
};

struct Imported {
    Mz::QrPtr<Mesh> mesh;
    std::vector<std::wstring> errors;
};

/// What becomes of `data` in a file of that name.
Imported importData(std::string_view data, const wchar_t* path);

/// The mesh in `data`, which must be faultless.
Mz::QrPtr<Mesh> meshOf(std::string_view data, const wchar_t* path);

/// Expects that `data` gives no mesh, and this one error.
void expectError(std::string_view data, const wchar_t* path, const std::wstring& error);

/// Expects that a mesh keeps what its interface promises.
void expectSound(const Mesh& mesh);

/// The vertices that a face refers to.
std::vector<std::uint32_t> faceOf(const Mesh& mesh, std::size_t index);

struct Sample {
    const wchar_t* name;
    const wchar_t* label; ///< of the builder that reads it
    bool tellsItsEnd;     ///< whether every shorter file is known to be damaged
};

/// All sample files.
extern const std::vector<Sample> samples;

std::wstring samplePath(const std::wstring& name);
std::string contentOf(const std::wstring& path);

/// `bytes` with the NULs in it.
template <std::size_t size>
std::string_view withNuls(const char (&bytes)[size]) {
    return {bytes, size - 1};
}

} // namespace Meshes
