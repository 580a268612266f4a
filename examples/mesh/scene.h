// SPDX-License-Identifier: BSL-1.0
/// What the scene component shares with its hosts: the interface of scenes of meshes.
#pragma once

#include "mesh.h"

#include <array>
#include <string>

namespace Meshes {

/// Meshes placed in space, each any number of times. Scenes are persistent: a mesh that several
/// instances share is stored once, and is shared again after a load.
class Scene : public Mz::QrCastable {
  public:
    using Self = Scene;
    static constexpr Mz::QrUid uid{0x2D7C5A14, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

    /// An affine transformation: three rows of three factors and an offset. The values are `float`,
    /// which a text stream reads back exactly; it reads `double` back to 16 digits.
    using Transform = std::array<float, 12>;

    static constexpr Transform identity{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0};

    /// One mesh at one position.
    struct Instance {
        std::wstring name; ///< of any characters
        Transform transform = identity;
        Mz::QrPtr<Mesh> mesh; ///< never null
    };

    /// Returns the number of instances.
    virtual std::size_t instanceCount() const = 0;
    /// Returns an instance; the reference is valid until an instance is added.
    ///
    /// \param index below `instanceCount()`; otherwise the behaviour is undefined
    virtual const Instance& instance(std::size_t index) const = 0;
    /// Appends an instance.
    ///
    /// \throws QrComponentManagerEx::ExBadCast if the mesh is null
    virtual void add(Instance instance) = 0;
};

/// The class of scenes, and the uid of its builder.
inline constexpr Mz::QrUid sceneUid{0x2D7C5A15, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

} // namespace Meshes
