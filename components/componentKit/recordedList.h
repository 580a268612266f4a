// SPDX-License-Identifier: BSL-1.0
/// The recorded list in a file, so that a start loads only the libraries that are new or have
/// changed.
///
///     Mz::Kit::readList(list);              // before the manager is initialised
///     Mz::Kit::initialize(components);
///     Mz::Kit::writeList(list);             // throws if it cannot be written
///
/// With `listFromEnvironment(list)` in place of `list`, `mzcomponents bisect` can find the
/// component with which the host fails.
///
/// The list helps, and is never needed: whatever is missing from it is read from the libraries. Its
/// texts are in the encoding of the locale, so read it under the locale under which it was written.
///
/// Threads: as for the initialisation of the component manager.
///
/// \since 0.2
#pragma once

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/files.h"
#include "components/componentManager/listVariable.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/persistant.h"

#include <filesystem>
#include <fstream>
#include <ostream>
#include <string>
#include <system_error>

namespace Mz::Kit {

namespace detail {

/// Returns the interface of the component manager that reads and writes the list.
inline QrPtr<QrPersistant> recordsOfManager() {
    return QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
}

} // namespace detail

/// Returns the list that the environment variable MZ_COMPONENT_LIST names, else `list`.
///
/// A search for a faulty component starts the host with other lists by this variable. Use the
/// result for all that the host does with its list, so that such a start does not change the host's
/// own.
///
///     const auto list = Mz::Kit::listFromEnvironment(folder / "components.list");
///
/// \param list  the host's own list
inline std::filesystem::path listFromEnvironment(const std::filesystem::path& list) {
    return environmentPath(listVariable).value_or(list);
}

/// The result of `readList`.
struct ListReading {
    /// Whether there is such a file.
    bool found = false;
    /// Why not all of the file was read, as a sentence that names the file; empty if all was.
    std::wstring problem;

    /// Returns whether a list was found and read completely.
    explicit operator bool() const { return found && problem.empty(); }
};

/// Reads the recorded list in `file` into the component manager, which must not be initialised yet.
///
/// Of a damaged list, the records before the damage stay, and `problem` reports the damage. That is
/// safe: `initialize` compares each record with its file, and loads the libraries that have none.
/// A host may therefore ignore the result.
///
/// \return what was found; never an exception of a stream
/// \throws std::bad_alloc  if memory runs out
inline ListReading readList(const std::filesystem::path& file) {
    ListReading result;
    std::error_code unknown;
    // A file that cannot be queried may exist: opening it tells.
    result.found =
        std::filesystem::status(file, unknown).type() != std::filesystem::file_type::not_found;
    if (!result.found)
        return result;
    const std::wstring name = displayName(file);
    std::ifstream in(file, std::ios::binary);
    if (!in || std::filesystem::is_directory(file, unknown)) {
        result.problem = name + L": this list cannot be opened. It is not used.";
        return result;
    }
    try {
        QrInBuffer bytes(&in);
        QrBinaryStream stream(&bytes); // A text stream would not carry the names.
        detail::recordsOfManager()->read(stream);
        if (bytes.tell() == 0)
            result.problem = name + L": this list was not read, because the component manager is"
                                    L" initialised. Read the list earlier.";
        else if (bytes.read() >= 0)
            result.problem = name + L": this list is damaged: more data follows its end.";
    } catch (const QrStreamEx& failure) {
        result.problem = name + L": this list is damaged: " + displayText(failure.getReason()) +
                         L" Libraries that were not read from it are loaded.";
    }
    return result;
}

/// Replaces the content of `file` by the recorded list of the component manager, which must be
/// initialised. The file has the whole new list or, if the function throws, its old content
/// (`replaceFile`).
///
/// The list cannot be written if the locale cannot represent a name or text in it, for example in
/// the "C" locale a text beyond Latin-1. The host then works without a new list.
///
/// \throws QrStreamEx::ExWriteOpen, QrStreamEx::ExWriteError  with the file's name, if the list
///     cannot be written
inline void writeList(const std::filesystem::path& file) {
    constexpr const char* source = "components/componentKit/recordedList";
    replaceFile(file, [&](std::ostream& out) {
        const auto refuse = [&](const char* reason) {
            throw QrStreamEx::ExWriteError(source, __LINE__, (utf8Name(file) + reason).c_str());
        };
        QrOutBuffer bytes(&out);
        QrBinaryStream stream(&bytes);
        bool carried = true;
        try {
            detail::recordsOfManager()->write(stream);
        } catch (const QrStreamEx::ExWriteError&) {
            if (out.good()) // The medium took everything, so the text was at fault.
                carried = false;
            else
                throw;
        }
        if (!carried)
            refuse(": the locale cannot represent a name or text of the list");
        if (bytes.tell() == 0)
            refuse(": the component manager is not initialised, so there is no list");
    });
}

} // namespace Mz::Kit
