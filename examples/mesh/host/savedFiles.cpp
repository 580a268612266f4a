// SPDX-License-Identifier: BSL-1.0
/// Saves each object in both forms, loads it and compares: the example shows that both forms are
/// exact. Equal scenes must also share their meshes in the same way, so the comparison keeps a map
/// between the meshes of both, in both directions.
#include "savedFiles.h"

#include "description.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/utf8.h"
#include "examples/mesh/console/console.h"
#include "examples/mesh/saving/objectFile.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <iostream>
#include <map>
#include <stdexcept>
#include <string>
#include <utility>

using namespace Mz;

namespace Meshes {

namespace {

constexpr const char* binaryExtension = ".binary";
constexpr const char* textExtension = ".text";

/// Returns whether two scenes are equal and share their meshes in the same way.
bool areEqual(const Scene& a, const Scene& b) {
    std::map<const Mesh*, const Mesh*> counterparts;
    std::map<const Mesh*, const Mesh*> back;
    for (std::size_t index = 0; index < a.instanceCount(); ++index) {
        if (index >= b.instanceCount())
            return false;
        const Scene::Instance& one = a.instance(index);
        const Scene::Instance& other = b.instance(index);
        const Mesh* mesh = one.mesh.get();
        const Mesh* counterpart = other.mesh.get();
        const bool isNew = counterparts.try_emplace(mesh, counterpart).second;
        back.try_emplace(counterpart, mesh);
        if (counterparts[mesh] != counterpart || back[counterpart] != mesh ||
            one.name != other.name || one.transform != other.transform ||
            (isNew && !areEqual(*mesh, *counterpart)))
            return false;
    }
    return a.instanceCount() == b.instanceCount();
}

/// Saves an object in both forms, as `name` with an extension, loads it and compares.
template <class Kind>
void saveAndCompare(const std::filesystem::path& name, Kind& object) {
    const auto saveAs = [&](const char* extension, Form form) {
        std::filesystem::path file = name;
        file += extension;
        saveObject(file, object, form);
        const QrRef<QrCastable> read = loadObject(file, &Kind::uid, form);
        const QrPtr<Kind> same = queryCast<Kind>(read.get());
        if (!same || !areEqual(object, *same))
            throw std::runtime_error("what was saved did not come back equal");
        return std::filesystem::file_size(file);
    };
    const auto binary = saveAs(binaryExtension, Form::Binary);
    const auto text = saveAs(textExtension, Form::Text);
    std::cout << "  saved: " << binary << " bytes in binary, " << text
              << " as text; both were read back and are equal" << std::endl;
}

} // namespace

SavedFiles::SavedFiles(std::filesystem::path savingFolder) : folder(std::move(savingFolder)) {
    std::filesystem::create_directories(folder);
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(sceneUid);
    scene = QrPtr<Scene>::adopt(safeCast<Scene>(object.get()));
}

void SavedFiles::save(const std::filesystem::path& file, const QrPtr<Mesh>& mesh) {
    std::filesystem::path name = std::to_string(++meshes) + "-";
    name += file.filename();
    saveAndCompare(folder / name, *mesh);

    Scene::Instance instance{fromUtf8(utf8Name(file.filename())), Scene::identity, mesh};
    scene->add(instance);
    const Mesh::Box box = mesh->bounds();
    instance.name += L" (beside)";
    instance.transform[3] = box.high.x - box.low.x;
    scene->add(instance);
}

void SavedFiles::saveScene() {
    describe("All together", *scene);
    saveAndCompare(folder / "scene", *scene);
}

std::vector<std::filesystem::path> savedFiles(const std::filesystem::path& folder) {
    std::vector<std::filesystem::path> files;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        if (entry.path().extension() == binaryExtension ||
            entry.path().extension() == textExtension)
            files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    return files;
}

void loadSavedFile(const std::filesystem::path& file) {
    const Form form = file.extension() == textExtension ? Form::Text : Form::Binary;
    const QrRef<QrCastable> object = loadObject(file, nullptr, form);
    if (!object)
        throw std::runtime_error("no object was saved there");
    describe(console::outputText(displayName(file.filename())), *object);
}

} // namespace Meshes
