// SPDX-License-Identifier: BSL-1.0
// Tests the mesh importer: its builder, its formats and file types, and what it imports.
#include "meshTestSupport.h"

#include "components/componentManager/componentImp.h"

#include <set>

using namespace Mz;
using namespace Meshes;

namespace {

constexpr QrUid importerUid = QrImporter::uid;

class NameCounter final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        names.insert(builder->getName());
        return Continue;
    }
    std::multiset<std::wstring> names;
};

} // namespace

TEST(MeshImporter, IsMadeByABuilder) {
    meshImporter();
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(meshImporterBuilderUid);
    ASSERT_TRUE(object);
    EXPECT_TRUE(object->hasInterface(MeshImporter::uid));
    EXPECT_TRUE(object->hasInterface(importerUid));
    EXPECT_FALSE(object->hasInterface(Mesh::uid));
    EXPECT_EQ(queryCast<Mesh>(object.get()), nullptr);
}

TEST(MeshImporter, AnswersForTheImporterItIs) {
    const QrPtr<MeshImporter> importer = meshImporter();
    const auto base =
        QrPtr<QrImporter>::adopt(static_cast<QrImporter*>(importer->getInterface(importerUid)));
    ASSERT_TRUE(base);
    EXPECT_EQ(base.get(), importer.get());
    EXPECT_EQ(base->newReference(), 2);
    EXPECT_EQ(base->release(), 1);
    EXPECT_EQ(std::wstring(base->getBuilderName()), L"mesh");
}

TEST(MeshImporter, IsANewObjectEachTime) {
    EXPECT_FALSE(meshImporter() == meshImporter());
}

TEST(MeshImporter, FindsOneBuilderForEachFormat) {
    meshImporter();
    NameCounter counter;
    QrGetComponentManager()->enumerateBuilders(counter);
    EXPECT_EQ(counter.names,
              (std::multiset<std::wstring>{L"mesh", L"mesh", L"mesh", L"mesh", L"mesh importer",
                                           L"scene", L"stored mesh"}));
}

TEST(MeshImporter, ListsTheFileTypes) {
    const wchar_t expected[] = L"Wavefront OBJ|*.obj|"
                               L"Object File Format (OFF)|*.off|"
                               L"Polygon File Format (PLY)|*.ply|"
                               L"Stereolithography (STL)|*.stl|\0";
    const QrPtr<MeshImporter> importer = meshImporter();
    const wchar_t* text = importer->getFileTypes();
    EXPECT_EQ(std::wstring(text, std::size(expected)), std::wstring(expected, std::size(expected)));
    EXPECT_EQ(importer->getFileTypes(), text);
}

TEST(MeshImporter, TellsAMissingFileFromAnUnknownOne) {
    RecordingController controller;
    const QrPtr<MeshImporter> importer = meshImporter();
    bool found = true;
    EXPECT_FALSE(importer->import(samplePath(L"missing.obj").c_str(), nullptr, found));
    EXPECT_FALSE(found);
    EXPECT_FALSE(importer->import(samplePath(L"makeSamples.py").c_str(), nullptr, found));
    EXPECT_TRUE(found);
    EXPECT_TRUE(controller.errors.empty());
}

TEST(MeshImporter, LeavesUnknownContentToOthers) {
    for (const char* data : {"", " ", "\n\n", "# only a comment\n", "hello\n", "solid state\n",
                             "OFF with his head\n", "ply\nwood\n", "plywood", "v one two three\n",
                             "g\ng\ng\n", "\xff\xd8\xff\xe0 picture", "element vertex 3\n"}) {
        const Imported imported = importData(data, L"file");
        EXPECT_FALSE(imported.mesh) << data;
        EXPECT_TRUE(imported.errors.empty()) << data;
    }
}

TEST(MeshImporter, LooksForFilesAlongASearchPath) {
    RecordingController controller;
    bool found = false;
    const std::wstring search = L"nowhere;" + samplePath(L"");
    EXPECT_TRUE(meshImporter()->import(L"icosahedron.off", search.c_str(), found));
    EXPECT_TRUE(found);
}

TEST(MeshImporter, GivesMeshesThatOutliveIt) {
    QrPtr<Mesh> mesh = meshOf(contentOf(samplePath(samples[0].name)), samples[0].name);
    EXPECT_EQ(mesh->newReference(), 1);
    EXPECT_EQ(mesh->release(), 0);
    EXPECT_EQ(mesh->release(), -1);
    static_cast<void>(mesh.detach());
}
