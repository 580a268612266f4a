#include "mesh.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;
using namespace Meshes;

namespace {

/// All the work is the base importer's. Hosts that know only importers find one here as well.
class Importer final
    : public QrCastRef<QrCastHeap<
          QrCastImpl2<Importer, MeshImporter, Kit::BaseInterface<Importer, QrImporter>>>> {};

} // namespace

MZ_COMPONENT(L"Mesh importer", L"Imports meshes through all builders of the family",
             Kit::builderOf<Importer>({.uid = meshImporterBuilderUid,
                                       .name = L"mesh importer",
                                       .label = L"Importer of meshes"}))
