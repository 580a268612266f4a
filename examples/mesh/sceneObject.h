// SPDX-License-Identifier: BSL-1.0
/// The implementation of `Scene`: a counted, persistent object.
#pragma once

#include "scene.h"

#include "components/componentManager/persistant.h"

#include <cstddef>
#include <vector>

namespace Meshes {

class SceneObject final
    : public Mz::QrCastRef<Mz::QrCastHeap<Mz::QrCastMulti<SceneObject, Scene, Mz::QrPersistant>>> {
  public:
    std::size_t instanceCount() const override { return instances.size(); }
    const Instance& instance(std::size_t index) const override { return instances[index]; }
    void add(Instance instance) override;

    const Mz::QrUid* getClassUid() const override { return &sceneUid; }
    unsigned int getVersion() const override { return 1; }
    void write(Mz::QrStream& stream) override;
    /// Replaces the instances by those in the stream.
    ///
    /// \throws QrStreamEx::ExReadError if the data is not a scene; the object is then unchanged
    void read(Mz::QrStream& stream) override;

  private:
    std::vector<Instance> instances;
};

} // namespace Meshes
