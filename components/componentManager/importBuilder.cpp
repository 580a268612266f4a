#include "components/componentManager/importBuilder.h"

#include "components/componentManager/importing/inputFile.h"

namespace Mz {

QrImportBuilder::~QrImportBuilder() = default;

bool QrImportBuilder::canImport(const wchar_t* path, const wchar_t* hint) const {
    std::ifstream stream;
    if (!openInputFile(stream, path))
        return false;
    QrInBuffer buffer(&stream);
    return canImport(&buffer, path, hint);
}

QrRef<QrCastable> QrImportBuilder::import(const wchar_t* path, const wchar_t* hint) const {
    std::ifstream stream;
    if (!openInputFile(stream, path))
        return nullptr;
    QrInBuffer buffer(&stream);
    return import(&buffer, path, hint);
}

} // namespace Mz
