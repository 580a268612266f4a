// SPDX-License-Identifier: BSL-1.0
/// The import builder of a mesh format, as each component of the family describes it.
#pragma once

#include "importMesh.h"

#include "components/componentKit/componentKit.h"

namespace Meshes {

/// An import builder for `Format`, a `MeshFormat` with the constants `uid`, `label` and
/// `extension`.
template <class Format>
class MeshImportBuilder final : public Mz::Kit::ImportBuilder<MeshImportBuilder<Format>> {
  public:
    MeshImportBuilder()
        : Mz::Kit::ImportBuilder<MeshImportBuilder>(
              {.uid = Format::uid, .name = meshBuilderName, .label = Format::label},
              {Format::extension}) {}

    using Mz::QrImportBuilder::canImport;
    using Mz::QrImportBuilder::import;

    bool canImport(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t* path,
                   const wchar_t*) const override {
        return recognisesMesh(Format(), *io, path, Format::extension);
    }

    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t*) const override {
        return importMesh(Format(), *io, path, Format::label);
    }
};

} // namespace Meshes
