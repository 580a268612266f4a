// SPDX-License-Identifier: BSL-1.0
/// Writes a scene as the number of its instances and, for each, its name, its transformation and
/// its mesh as an object. Names go through `QrWriteExactText`, because a text stream carries no
/// other strings exactly. Reading builds a second list and replaces the instances only when all are
/// valid, so that a failure leaves the object unchanged.
#include "sceneObject.h"

#include "components/objectIO/objectIO.h"

#include <algorithm>
#include <limits>
#include <string>
#include <utility>

using namespace Mz;

namespace Meshes {

namespace {

constexpr const char* source = "examples/mesh/sceneObject";

Scene::Instance readInstance(QrStream& stream) {
    Scene::Instance instance;
    instance.name = QrReadExactText(stream);
    const auto wanted = static_cast<int>(instance.transform.size());
    if (stream.read(instance.transform[0], wanted) != wanted)
        throw QrStreamEx::ExReadError(source, __LINE__, "the scene ends too early");
    const QrRef<QrCastable> mesh = stream.readObject(&Mesh::uid, nullptr, nullptr);
    instance.mesh = queryCast<Mesh>(mesh.get());
    if (!instance.mesh)
        throw QrStreamEx::ExReadError(source, __LINE__, "an instance of the scene has no mesh");
    return instance;
}

} // namespace

void SceneObject::add(Instance instance) {
    static_cast<void>(QrPtr<Mesh>::adopt(safeCast<Mesh>(instance.mesh.get())));
    instances.push_back(std::move(instance));
}

void SceneObject::write(QrStream& stream) {
    if (instances.size() > std::numeric_limits<unsigned int>::max())
        throw QrStreamEx::ExWriteError(source, __LINE__, "the scene is too large");
    stream << static_cast<unsigned int>(instances.size());
    for (const Instance& instance : instances) {
        QrWriteExactText(stream, instance.name);
        stream.write(instance.transform[0], static_cast<int>(instance.transform.size()));
        stream << instance.mesh.get();
    }
}

void SceneObject::read(QrStream& stream) {
    unsigned int count = 0;
    stream >> count;
    std::vector<Instance> read;
    for (; count > 0; --count)
        read.push_back(readInstance(stream));
    instances = std::move(read);
}

} // namespace Meshes
