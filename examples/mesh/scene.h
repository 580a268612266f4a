/// What the scene component and its hosts agree on: scenes of meshes.
#pragma once

#include "mesh.h"

#include <array>
#include <string>

namespace Meshes {

/// Meshes that are placed in space, each as often as it is wanted. Scenes are persistent: a mesh
/// that several instances share is stored once, and shared again when it is loaded.
class Scene : public Mz::QrCastable {
  public:
    using Self = Scene;
    static constexpr Mz::QrUid uid{0x2D7C5A14, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

    /// Where a point goes: three rows of three factors and a distance. As `float`, which comes back
    /// from text exactly; `double` does to 16 digits.
    using Transform = std::array<float, 12>;

    static constexpr Transform identity{1, 0, 0, 0, 0, 1, 0, 0, 0, 0, 1, 0};

    /// One mesh in one place.
    struct Instance {
        std::wstring name; ///< of any characters
        Transform transform = identity;
        Mz::QrPtr<Mesh> mesh; ///< never null
    };

    virtual std::size_t instanceCount() const = 0;
    /// `index` is below `instanceCount()`; valid until an instance is added.
    virtual const Instance& instance(std::size_t index) const = 0;
    /// Throws `QrComponentManagerEx::ExBadCast` when the mesh is null.
    virtual void add(Instance instance) = 0;
};

/// The builder, and the class, of scenes.
inline constexpr Mz::QrUid sceneUid{0x2D7C5A15, 0x5B0E11EF, 0x8F1D7B10, 0x5D3E8F41};

} // namespace Meshes
