// SPDX-License-Identifier: BSL-1.0
// Tests every sample file: the same mesh in each format, recognised under any name, and cut at
// every byte.
#include "meshTestSupport.h"

#include "components/componentManager/componentImp.h"

#include <filesystem>
#include <random>
#include <sstream>

using namespace Mz;
using namespace Meshes;

namespace {

struct NamedBuilder {
    std::wstring label;
    std::wstring extension;
    QrCPtr<QrImportBuilder> builder;
};

class FirstExtension final : public QrEnumerator<const wchar_t*> {
  public:
    Action process(const wchar_t* found) override {
        extension = found;
        return Stop;
    }
    std::wstring extension;
};

class Collector final : public QrEnumerator<QrCPtr<QrImportBuilder>> {
  public:
    Action process(QrCPtr<QrImportBuilder> builder) override {
        const auto description = queryCast<QrBuilderDescription>(builder.get());
        FirstExtension first;
        builder->enumerateExtensions(first);
        builders.push_back({description->getLabel(), first.extension, builder});
        return Continue;
    }
    std::vector<NamedBuilder> builders;
};

std::vector<NamedBuilder> importBuilders() {
    Collector collector;
    meshImporter()->enumerateObjects(collector);
    return collector.builders;
}

bool canImport(const NamedBuilder& builder, const std::string& data, const std::wstring& path) {
    std::istringstream stream(data);
    QrInBuffer buffer(&stream);
    return builder.builder->canImport(&buffer, path.c_str(), L"");
}

} // namespace

TEST(MeshSamples, HoldTheSameMeshInEveryFormat) {
    const QrPtr<Mesh> first = meshOf(contentOf(samplePath(samples[0].name)), samples[0].name);
    EXPECT_EQ(first->vertexCount(), 12U);
    EXPECT_EQ(first->faceCount(), 20U);
    const Mesh::Box box{{-0.8506508F, -0.8506508F, -0.8506508F},
                        {0.8506508F, 0.8506508F, 0.8506508F}};
    EXPECT_EQ(first->bounds(), box);
    for (const Sample& sample : samples) {
        const QrPtr<Mesh> mesh = meshOf(contentOf(samplePath(sample.name)), sample.name);
        EXPECT_TRUE(haveSameGeometry(*first, *mesh)) << std::filesystem::path(sample.name);
        EXPECT_EQ(std::wstring(mesh->formatLabel()), sample.label);
    }
}

TEST(MeshSamples, AreImportedAsFilesByTheirNames) {
    RecordingController controller;
    const QrPtr<MeshImporter> importer = meshImporter();
    for (const Sample& sample : samples) {
        bool found = false;
        const QrRef<QrCastable> object =
            importer->import(samplePath(sample.name).c_str(), nullptr, found);
        EXPECT_TRUE(found);
        const auto mesh = QrPtr<Mesh>::adopt(safeCast<Mesh>(object.get()));
        EXPECT_EQ(mesh->faceCount(), 20U);
    }
    EXPECT_TRUE(controller.errors.empty());
}

TEST(MeshSamples, AreImportedUnderAWrongMissingOrUpperCaseExtension) {
    for (const Sample& sample : samples) {
        const std::string data = contentOf(samplePath(sample.name));
        for (const wchar_t* path : {L"a.obj", L"a.off", L"a.ply", L"a.stl", L"a", L"a.OBJ",
                                    L"a.STL", L"a.PLY", L"a.OFF", L"a.txt", L""}) {
            const QrPtr<Mesh> mesh = meshOf(data, path);
            EXPECT_EQ(std::wstring(mesh->formatLabel()), sample.label);
        }
    }
}

TEST(MeshSamples, AreRecognisedByOneBuilderOnly) {
    const std::vector<NamedBuilder> builders = importBuilders();
    ASSERT_EQ(builders.size(), 4U);
    for (const Sample& sample : samples) {
        const std::string data = contentOf(samplePath(sample.name));
        for (const NamedBuilder& builder : builders) {
            const bool own = builder.label == sample.label;
            EXPECT_EQ(canImport(builder, data, L"file"), own);
            EXPECT_EQ(canImport(builder, data, L"file." + builder.extension), own);
        }
    }
}

TEST(MeshSamples, CutAnywhereGiveNoMeshOrASoundOne) {
    for (const Sample& sample : samples) {
        const std::string data = contentOf(samplePath(sample.name));
        const QrPtr<Mesh> whole = meshOf(data, sample.name);
        for (std::size_t size = 0; size < data.size(); ++size) {
            const Imported imported = importData(data.substr(0, size), sample.name);
            ASSERT_LE(imported.errors.size(), 1U);
            if (!imported.mesh)
                continue;
            ASSERT_TRUE(imported.errors.empty());
            expectSound(*imported.mesh);
            // Only a name or a line end after the last number can be missing without an error.
            if (sample.tellsItsEnd) {
                ASSERT_TRUE(haveSameGeometry(*whole, *imported.mesh)) << size;
            }
        }
    }
}

TEST(MeshSamples, CutAnywhereInTheirDataSayWhatIsWrong) {
    for (const Sample& sample : samples) {
        if (!sample.tellsItsEnd)
            continue;
        const std::string data = contentOf(samplePath(sample.name));
        for (std::size_t size = 100; size + 25 < data.size(); ++size) {
            const Imported imported = importData(data.substr(0, size), sample.name);
            ASSERT_FALSE(imported.mesh) << size;
            ASSERT_EQ(imported.errors.size(), 1U) << size;
            ASSERT_TRUE(imported.errors[0].starts_with(sample.name + std::wstring(L": ")));
        }
    }
}

TEST(MeshSamples, WithFlippedBitsGiveNoMeshOrASoundOne) {
    std::mt19937 random(20240229);
    for (const Sample& sample : samples) {
        const std::string data = contentOf(samplePath(sample.name));
        for (int round = 0; round < 500; ++round) {
            std::string damaged = data;
            for (unsigned int flips = random() % 4 + 1; flips > 0; --flips) {
                char& byte = damaged[random() % damaged.size()];
                byte = static_cast<char>(byte ^ (1 << random() % 8));
            }
            const Imported imported = importData(damaged, sample.name);
            ASSERT_LE(imported.errors.size(), imported.mesh ? 0U : 1U);
            if (imported.mesh)
                expectSound(*imported.mesh);
        }
    }
}

TEST(MeshSamples, WithForeignBytesGiveNoMeshOrASoundOne) {
    std::mt19937 random(77);
    constexpr std::string_view pieces[] = {"-",         "4294967295", "\n", "\r",          "\\\n",
                                           "#",         " ",          "/",  "nan",         "1e999",
                                           "f 1 2 3\n", "\xff",       "v",  "999999999999"};
    for (const Sample& sample : samples) {
        const std::string data = contentOf(samplePath(sample.name));
        for (int round = 0; round < 500; ++round) {
            std::string damaged = data;
            damaged.replace(random() % damaged.size(), random() % 6,
                            pieces[random() % std::size(pieces)]);
            const Imported imported = importData(damaged, sample.name);
            ASSERT_LE(imported.errors.size(), imported.mesh ? 0U : 1U);
            if (imported.mesh)
                expectSound(*imported.mesh);
        }
    }
}
