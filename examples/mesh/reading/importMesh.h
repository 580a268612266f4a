/// What all builders of the family do around the reading of their own format.
#pragma once

#include "byteReader.h"
#include "meshBuilder.h"

#include <string_view>

namespace Meshes {

/// One format: how to tell it and how to read it.
class MeshFormat {
  public:
    /// Whether the data is of this format. `named` says that the file's extension is the format's:
    /// then damaged data that can hardly be anything else is better accepted, so that its reading
    /// tells what is wrong with it. Otherwise only data that is clearly of this format is.
    virtual bool recognises(ByteReader& bytes, bool named) const = 0;

    /// Reads the data into `mesh`, or gives up with an `ImportFailure`.
    virtual void read(ByteReader& bytes, MeshBuilder& mesh) const = 0;

  protected:
    ~MeshFormat() = default;
};

/// Whether the data of `io` is of this format; false when it cannot be read.
bool recognisesMesh(const MeshFormat& format, Mz::QrBufferedIO& io, const wchar_t* path,
                    const wchar_t* extension);

/// The mesh in `io`, or null. Reports progress to the thread's process controller, and there as an
/// error, "path: place: reason", whatever is wrong with the data, its reading or the memory for it.
/// Null without an error means that the user wants no more.
Mz::QrRef<Mz::QrCastable> importMesh(const MeshFormat& format, Mz::QrBufferedIO& io,
                                     const wchar_t* path, const wchar_t* label);

} // namespace Meshes
