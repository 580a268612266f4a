// SPDX-License-Identifier: BSL-1.0
// Tests meshes and scenes that are stored and loaded.
#include "meshTestSupport.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"
#include "examples/mesh/scene.h"

#include <gmock/gmock.h>

#include <random>
#include <sstream>

using namespace Mz;
using namespace Meshes;

namespace {

template <class Stream>
std::string saved(const QrCastable* object) {
    std::ostringstream sink;
    QrOutBuffer buffer(&sink);
    QrObjectOutBuffer objects(&buffer);
    Stream stream(&objects);
    stream << object;
    return sink.str();
}

template <class Stream, class Kind>
QrPtr<Kind> loaded(const std::string& bytes) {
    std::istringstream source(bytes);
    QrInBuffer buffer(&source);
    QrObjectInBuffer objects(&buffer);
    Stream stream(&objects);
    const QrRef<QrCastable> object = stream.readObject(&Kind::uid, nullptr, nullptr);
    return queryCast<Kind>(object.get());
}

QrPtr<Mesh> sampleMesh(const Sample& sample) {
    return meshOf(contentOf(samplePath(sample.name)), sample.name);
}

QrPtr<Scene> newScene() {
    meshImporter(); // Initialises the manager.
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(sceneUid);
    return QrPtr<Scene>::adopt(safeCast<Scene>(object.get()));
}

/// Returns a scene with two meshes, one of them in three instances.
QrPtr<Scene> sampleScene() {
    const QrPtr<Mesh> corners = sampleMesh(samples[1]);
    const QrPtr<Mesh> plain = sampleMesh(samples[2]);
    const QrPtr<Scene> scene = newScene();
    scene->add({L"first", Scene::identity, corners});
    scene->add({std::wstring(L"\u00FC\u4E16\U0001F600\0\n ", 6), {1, 2.5F, -3e-30F}, plain});
    scene->add({L"", {}, corners});
    scene->add({L"last", Scene::identity, corners});
    return scene;
}

template <class Stream>
class StoredMesh : public testing::Test {};
using StreamKinds = testing::Types<QrBinaryStream, QrTextStream>;
TYPED_TEST_SUITE(StoredMesh, StreamKinds);

TYPED_TEST(StoredMesh, ComesBackEqual) {
    for (const Sample& sample : samples) {
        const QrPtr<Mesh> mesh = sampleMesh(sample);
        const QrPtr<Mesh> read = loaded<TypeParam, Mesh>(saved<TypeParam>(mesh.get()));
        ASSERT_TRUE(read);
        EXPECT_TRUE(areEqual(*mesh, *read));
        EXPECT_EQ(mesh->bounds(), read->bounds());
        expectSound(*read);
        // It is stored as the same bytes again.
        EXPECT_EQ(saved<TypeParam>(read.get()), saved<TypeParam>(mesh.get()));
    }
}

TYPED_TEST(StoredMesh, OfManyPolygonsAndAllFloatsComesBackEqual) {
    std::mt19937 random(5);
    std::ostringstream text;
    text.precision(9);
    for (int vertex = 0; vertex < 3000; ++vertex) {
        text << 'v';
        for (int axis = 0; axis < 3; ++axis)
            text << ' ' << std::bit_cast<float>(static_cast<std::uint32_t>(random()) & 0xFEFFFFFF);
        text << '\n';
    }
    for (int face = 0; face < 50; ++face) {
        text << 'f';
        for (auto corner = random() % 100 + 3; corner > 0; --corner)
            text << ' ' << random() % 3000 + 1;
        text << '\n';
    }
    const QrPtr<Mesh> mesh = meshOf(text.str(), L"many.obj");
    EXPECT_TRUE(areEqual(*mesh, *loaded<TypeParam, Mesh>(saved<TypeParam>(mesh.get()))));
}

TYPED_TEST(StoredMesh, WithoutAnythingComesBackEqual) {
    meshImporter();
    const QrRef<QrCastable> empty = QrGetComponentManager()->createObject(storedMeshUid);
    const QrPtr<Mesh> mesh = queryCast<Mesh>(empty.get());
    ASSERT_TRUE(mesh);
    EXPECT_TRUE(areEqual(*mesh, *loaded<TypeParam, Mesh>(saved<TypeParam>(mesh.get()))));
}

TYPED_TEST(StoredMesh, EqualityNoticesEveryDifference) {
    const auto mesh = [](const char* text) { return meshOf(text, L"a.obj"); };
    const QrPtr<Mesh> one = mesh("v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 1\nvn 0 0 1\nf 1/1/1 2/1/1 3\n");
    for (const char* other :
         {"v 0 0 0\nv 1 0 0\nv 0 2 0\nvt 0 1\nvn 0 0 1\nf 1/1/1 2/1/1 3\n",
          "v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 2\nvn 0 0 1\nf 1/1/1 2/1/1 3\n",
          "v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 1\nvn 0 0 2\nf 1/1/1 2/1/1 3\n",
          "v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 1\nvn 0 0 1\nf 1/1/1 2/1/1 3/1\n",
          "v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 1\nvn 0 0 1\nf 1/1/1 2/1/1 3 3\n",
          "v 0 0 0\nv 1 0 0\nv 0 1 0\nvt 0 1\nvn 0 0 1\nf 1/1/1 2/1/1 3\nf 1 2 3\n"})
        EXPECT_FALSE(areEqual(*one, *mesh(other))) << other;
    EXPECT_TRUE(areEqual(*one, *loaded<TypeParam, Mesh>(saved<TypeParam>(one.get()))));
}

TYPED_TEST(StoredMesh, CutAnywhereIsNoMesh) {
    const std::string bytes = saved<TypeParam>(sampleMesh(samples[1]).get());
    for (std::size_t length = 0; length < bytes.size(); ++length)
        EXPECT_THROW((loaded<TypeParam, Mesh>(bytes.substr(0, length))), QrStreamEx::ExReadObject)
            << length;
}

TYPED_TEST(StoredMesh, ChangedAnywhereIsNoMeshOrASoundOne) {
    const std::string bytes = saved<TypeParam>(sampleMesh(samples[1]).get());
    std::mt19937 random(8);
    int refused = 0;
    for (std::size_t at = 0; at < bytes.size(); ++at)
        for (int round = 0; round < 6; ++round) {
            std::string damaged = bytes;
            damaged[at] = round < 4 ? static_cast<char>(bytes[at] ^ (1 << (2 * round)))
                                    : static_cast<char>(random() % 256);
            try {
                const QrPtr<Mesh> mesh = loaded<TypeParam, Mesh>(damaged);
                if (mesh)
                    expectSound(*mesh);
            } catch (const QrStreamEx::ExReadObject&) {
                ++refused;
            }
        }
    EXPECT_GT(refused, 100);
}

/// A loaded scene shares its meshes as the stored one did.
TYPED_TEST(StoredMesh, InASceneIsStoredOnceAndSharedAgain) {
    const QrPtr<Scene> scene = sampleScene();
    const std::string bytes = saved<TypeParam>(scene.get());
    const QrPtr<Scene> read = loaded<TypeParam, Scene>(bytes);
    ASSERT_TRUE(read);
    ASSERT_EQ(read->instanceCount(), 4U);
    for (std::size_t index = 0; index < 4; ++index) {
        const Scene::Instance& a = scene->instance(index);
        const Scene::Instance& b = read->instance(index);
        EXPECT_EQ(a.name, b.name);
        EXPECT_EQ(a.transform, b.transform);
        EXPECT_TRUE(areEqual(*a.mesh, *b.mesh));
        EXPECT_EQ(b.mesh == read->instance(0).mesh, index != 1);
    }
    // Each instance has a size, but the shared mesh is stored once.
    const std::size_t meshes = saved<TypeParam>(scene->instance(0).mesh.get()).size() +
                               saved<TypeParam>(scene->instance(1).mesh.get()).size();
    EXPECT_LT(bytes.size(), meshes + 600);
}

TYPED_TEST(StoredMesh, InASceneCutAnywhereIsNoScene) {
    const std::string bytes = saved<TypeParam>(sampleScene().get());
    for (std::size_t length = 0; length < bytes.size(); ++length)
        EXPECT_THROW((loaded<TypeParam, Scene>(bytes.substr(0, length))), QrStreamEx::ExReadObject)
            << length;
}

TEST(Scene, RefusesToHoldNothing) {
    const QrPtr<Scene> scene = newScene();
    EXPECT_THROW(scene->add({L"empty", Scene::identity, nullptr}), QrComponentManagerEx::ExBadCast);
    EXPECT_EQ(scene->instanceCount(), 0U);
}

/// Returns the reason why a stored mesh with the content of `edit` cannot be loaded, or "none".
template <class Edit>
std::string reasonOf(Edit&& edit) {
    meshImporter();
    std::ostringstream sink;
    QrOutBuffer buffer(&sink);
    QrObjectOutBuffer objects(&buffer);
    QrBinaryStream stream(&objects);
    stream << 1U << storedMeshUid << 1U;
    QrWriteExactText(stream, L"by hand");
    edit(stream);
    stream << 0x454F424BU;
    try {
        loaded<QrBinaryStream, Mesh>(sink.str());
    } catch (const QrStreamEx::ExReadObject& failure) {
        return failure.getReason();
    }
    return "none";
}

TEST(StoredMeshData, ThatBreaksAPromiseIsRefusedWithTheReason) {
    const auto mesh = [](float x, unsigned int corners, unsigned int last) {
        return [=](QrStream& s) {
            s << 1U << x << 0.0F << 0.0F << 0U << 0U << 1U << corners;
            for (unsigned int corner = 0; corner < corners; ++corner)
                s << (corner == 2 ? last : 0U) << Mesh::absent << Mesh::absent;
        };
    };
    EXPECT_EQ(reasonOf(mesh(0, 3, 0)), "none");
    EXPECT_THAT(reasonOf(mesh(0, 3, 1)),
                testing::HasSubstr("a face of the mesh refers to what is not there"));
    EXPECT_THAT(reasonOf(mesh(0, 2, 0)), testing::HasSubstr("fewer than three corners"));
    EXPECT_THAT(reasonOf(mesh(std::numeric_limits<float>::infinity(), 3, 0)),
                testing::HasSubstr("a value of the mesh is not finite"));
    EXPECT_THAT(reasonOf(mesh(std::numeric_limits<float>::quiet_NaN(), 3, 0)),
                testing::HasSubstr("not finite"));
}

} // namespace
