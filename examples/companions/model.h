// SPDX-License-Identifier: BSL-1.0
/// What the import builders of models and their hosts agree on.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <cstddef>
#include <string>
#include <vector>

using namespace Mz::literals; // "..."_uid

/// A model that was read from a file. It does not change, so any thread may use it.
class Model : public Mz::QrCastable {
  public:
    using Self = Model;
    static constexpr Mz::QrUid uid = "C41A7E01-83D2-4F60-9B1E-5D07A2F83C94"_uid;

    /// A material and the number of faces that have it.
    struct Material {
        std::string name; ///< in the encoding of the file
        float red = 0.5F, green = 0.5F, blue = 0.5F;
        std::size_t faces = 0;
    };

    /// Returns the number of vertices.
    virtual std::size_t vertexCount() const = 0;

    /// Returns the materials that have faces, in the order of their first face. A material that no
    /// file defines is grey.
    virtual const std::vector<Material>& materials() const = 0;
};

/// The builder name of all import builders whose objects are models.
inline constexpr const wchar_t* modelBuilders = L"model";
