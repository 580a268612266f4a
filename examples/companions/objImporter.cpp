// SPDX-License-Identifier: BSL-1.0
/// The component: an import builder for OBJ files. It asks the process controller for the material
/// libraries, by the names that the OBJ file has for them. Which file that is, and whether the
/// component gets one at all, is for the host to decide: the names come from an untrusted file.
#include "objFormat.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"

#include <exception>
#include <filesystem>
#include <fstream>
#include <optional>
#include <sstream>
#include <utility>

using namespace Mz;

namespace {

class ReadModel final : public Kit::Object<ReadModel, Model> {
  public:
    explicit ReadModel(ObjData read) : data(std::move(read)) {}
    std::size_t vertexCount() const override { return data.vertices; }
    const std::vector<Material>& materials() const override { return data.materials; }

  private:
    ObjData data;
};

/// Returns the rest of the input, or its first `most` bytes.
std::istringstream textOf(QrBufferedIO& io, std::size_t most) {
    std::string text;
    char block[4096];
    for (int count = 1; count > 0 && text.size() < most;) {
        count = io.read(block, sizeof block);
        text.append(block, static_cast<std::size_t>(count));
    }
    return std::istringstream(std::move(text));
}

/// Returns the materials in the library `name`. A model without its colours is better than none, so
/// a library that is missing or invalid is a warning.
std::vector<Model::Material> materialsIn(const std::string& name, QrProcessControl& controller) {
    std::string problem = "was not found";
    const std::wstring found = controller.findFile(displayText(name).c_str(), nullptr, nullptr);
    const std::optional<std::filesystem::path> file = toNativePath(found);
    if (!found.empty() && file) {
        try {
            std::ifstream in(*file, std::ios::binary);
            return readMtl(in);
        } catch (const ObjError& error) {
            problem = error.what();
        }
    }
    controller.warning(0, displayText("material library " + name + ": " + problem).c_str());
    return {};
}

class ObjImporter final : public Kit::ImportBuilder<ObjImporter> {
  public:
    static constexpr QrUid builderUid = "C41A7E02-83D2-4F60-9B1E-5D07A2F83C94"_uid;

    ObjImporter()
        : ImportBuilder({.uid = builderUid, .name = modelBuilders, .label = L"Wavefront OBJ"},
                        {L"obj"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        std::istringstream in = textOf(*io, 4096);
        return looksLikeObj(in);
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        QrProcessControl* const controller = QrGetProcessController();
        try {
            std::istringstream in = textOf(*io, std::string::npos);
            return new ReadModel(readObj(in, [&](const std::string& name) {
                return controller ? materialsIn(name, *controller) : std::vector<Model::Material>();
            }));
        } catch (const std::exception& failure) { // of the format, the input or the memory
            if (controller)
                controller->error(0, displayText(failure.what()).c_str());
            return nullptr;
        }
    }
};

} // namespace

MZ_COMPONENT(L"OBJ models", L"Reads models and their materials", Kit::builder<ObjImporter>())
