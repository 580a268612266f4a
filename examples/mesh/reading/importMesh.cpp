// SPDX-License-Identifier: BSL-1.0
/// Calls a format and translates its outcome. The exceptions of the formats end here: they become
/// an error of the process controller and a null result, because callers in other libraries know
/// neither these exceptions nor the formats.
#include "importMesh.h"

#include "failure.h"

#include "components/componentManager/processControl.h"

#include <algorithm>
#include <functional>
#include <new>
#include <string>
#include <string_view>

namespace Meshes {

namespace {

std::wstring_view textOf(const wchar_t* text) {
    return text ? std::wstring_view(text) : std::wstring_view();
}

wchar_t lowerAscii(wchar_t c) {
    return c >= L'A' && c <= L'Z' ? static_cast<wchar_t>(c - L'A' + L'a') : c;
}

/// Returns whether `path` ends with "." and `extension`, ignoring case. `extension` is lower case.
bool hasExtension(std::wstring_view path, std::wstring_view extension) {
    if (path.size() <= extension.size())
        return false;
    const std::wstring_view end = path.substr(path.size() - extension.size());
    return path[path.size() - extension.size() - 1] == L'.' &&
           std::ranges::equal(end, extension, {}, lowerAscii);
}

void report(Mz::QrProcessControl* controller, const wchar_t* path, std::string_view reason) {
    if (!controller)
        return;
    std::wstring text(textOf(path));
    if (!text.empty())
        text.append(L": ");
    text.append(reason.begin(), reason.end());
    controller->error(0, text.c_str());
}

/// Reports that the import is complete.
void reportDone(Mz::QrProcessControl* controller) {
    if (controller && controller->isProgressShown())
        controller->progress(1.0F, L"Reading");
}

} // namespace

bool recognisesMesh(const MeshFormat& format, Mz::QrBufferedIO& io, const wchar_t* path,
                    const wchar_t* extension) {
    try {
        ByteReader bytes(io);
        return format.recognises(bytes, hasExtension(textOf(path), extension));
    } catch (const ImportFailure&) {
        return false;
    } catch (const Mz::QrStreamEx&) {
        return false;
    } catch (const std::bad_alloc&) {
        return false;
    }
}

Mz::QrRef<Mz::QrCastable> importMesh(const MeshFormat& format, Mz::QrBufferedIO& io,
                                     const wchar_t* path, const wchar_t* label) {
    Mz::QrProcessControl* const controller = QrGetProcessController();
    try {
        MeshBuilder mesh;
        ByteReader bytes(io, controller);
        format.read(bytes, mesh);
        Mz::QrRef<Mz::QrCastable> object = MeshObject::make(mesh.finish(), label);
        reportDone(controller);
        return object;
    } catch (const ImportInterrupted&) {
        return nullptr;
    } catch (const ImportFailure& failure) {
        report(controller, path, failure.reason);
    } catch (const Mz::QrStreamEx& failure) {
        report(controller, path, failure.getReason());
    } catch (const std::bad_alloc&) {
        report(controller, path, "there is not enough memory for this mesh");
    }
    return nullptr;
}

} // namespace Meshes
