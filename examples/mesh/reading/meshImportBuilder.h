/// The import builder of a mesh format: the one thing that a component of the family has to name.
#pragma once

#include "importMesh.h"

#include "components/componentKit/componentKit.h"

namespace Meshes {

/// `Format` is a `MeshFormat` with three constants: `uid`, `label` and `extension`.
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
