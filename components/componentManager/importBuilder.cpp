// SPDX-License-Identifier: BSL-1.0
/// Implements the file forms of `canImport` and `import` by the buffer forms.
///
/// File stream and buffer are locals, so that the file is closed on every return and exception. An
/// object that kept the buffer would therefore hold a dangling pointer.
#include "components/componentManager/importBuilder.h"

#include "components/componentManager/importing/inputFile.h"

#include <iosfwd>

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
