// SPDX-License-Identifier: BSL-1.0
/// The part of an import that is common to all mesh formats: recognition, failures and progress.
#pragma once

#include "byteReader.h"
#include "meshBuilder.h"

#include <string_view>

namespace Meshes {

/// The interface of a format.
class MeshFormat {
  public:
    /// Returns whether the data has this format.
    ///
    /// \param named whether the file has the extension of the format. If so, accept damaged data
    ///     that can hardly be anything else: `read` then reports the damage. Otherwise accept only
    ///     data that certainly has this format.
    virtual bool recognises(ByteReader& bytes, bool named) const = 0;

    /// Reads the data into `mesh`.
    ///
    /// \throws ImportFailure if the data is invalid
    virtual void read(ByteReader& bytes, MeshBuilder& mesh) const = 0;

  protected:
    ~MeshFormat() = default;
};

/// Returns whether the data of `io` has this format; false if it cannot be read.
bool recognisesMesh(const MeshFormat& format, Mz::QrBufferedIO& io, const wchar_t* path,
                    const wchar_t* extension);

/// Returns the mesh in `io`, or null. The caller owns the reference.
///
/// Reports progress to the process controller of the thread. Invalid data, a failure of the IO and
/// a lack of memory are reported there as an error, "path: position: reason". Null without an error
/// means that the user stopped the import.
Mz::QrRef<Mz::QrCastable> importMesh(const MeshFormat& format, Mz::QrBufferedIO& io,
                                     const wchar_t* path, const wchar_t* label);

} // namespace Meshes
