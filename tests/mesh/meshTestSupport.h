// SPDX-License-Identifier: BSL-1.0
/// Imports test data through the mesh components and records what the import reports.
#pragma once

#include "components/componentManager/processControl.h"
#include "examples/mesh/mesh.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <vector>

namespace Meshes {

/// Returns a new importer from its builder. The first call in a process loads the mesh components.
Mz::QrPtr<MeshImporter> meshImporter();

/// Records the reports of an import. It is this thread's controller while it lives.
class RecordingController final : public Mz::QrCastImpl<RecordingController, Mz::QrProcessControl> {
  public:
    RecordingController() { QrSetThreadProcessController(this); }
    ~RecordingController() override { QrSetThreadProcessController(nullptr); }

    std::vector<std::wstring> errors;
    std::vector<float> fractions;
    int questions = 0; ///< the calls of `isInterrupted`
    bool progressShown = true;
    int interruptAfter = -1;     ///< `isInterrupted` returns true after this many calls; -1: never
    std::size_t refuseAfter = 0; ///< the number of the call in which `progress` returns false

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

/// Imports `data` as a file of that name.
Imported importData(std::string_view data, const wchar_t* path);

/// Returns the mesh in `data`, which must be valid.
Mz::QrPtr<Mesh> meshOf(std::string_view data, const wchar_t* path);

/// Expects that `data` gives no mesh and exactly this error.
void expectError(std::string_view data, const wchar_t* path, const std::wstring& error);

/// Expects that the mesh satisfies its interface.
void expectSound(const Mesh& mesh);

/// Returns the indices of the vertices of a face.
std::vector<std::uint32_t> faceOf(const Mesh& mesh, std::size_t index);

struct Sample {
    const wchar_t* name;
    const wchar_t* label; ///< of the builder that reads it
    bool tellsItsEnd;     ///< whether a file that is cut is seen to be incomplete
};

/// The sample files.
extern const std::vector<Sample> samples;

std::wstring samplePath(const std::wstring& name);
std::string contentOf(const std::wstring& path);

/// Returns `bytes` with the NULs that it contains.
template <std::size_t size>
std::string_view withNuls(const char (&bytes)[size]) {
    return {bytes, size - 1};
}

} // namespace Meshes
