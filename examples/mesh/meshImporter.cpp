// SPDX-License-Identifier: BSL-1.0
/// The component that makes the mesh importer. The base importer does all the work: it finds the
/// file, selects a builder by name and content, and calls it. The component is separate from the
/// formats, so that a format can be added or left out without it.
#include "mesh.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;
using namespace Meshes;

namespace {

/// Answers for `QrImporter` too, for hosts that do not know `MeshImporter`.
class Importer final
    : public QrCastRef<QrCastHeap<
          QrCastImpl2<Importer, MeshImporter, Kit::BaseInterface<Importer, QrImporter>>>> {};

} // namespace

MZ_COMPONENT(L"Mesh importer", L"Imports meshes through all builders of the family",
             Kit::builderOf<Importer>({.uid = meshImporterBuilderUid,
                                       .name = L"mesh importer",
                                       .label = L"Importer of meshes"}))
