// SPDX-License-Identifier: BSL-1.0
/// The fingerprints of this library's own interfaces: see `fingerprint.h`. The library contains
/// them, and so does each component library, by its stamp (`stamp.h` of the kit), so that the tools
/// can compare the headers with which a component was compiled with the library that is in use.
///
/// \since 0.2
#pragma once

#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/fingerprint.h"
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/processControl.h"

/// The fingerprints of all interfaces of this library, for one source of a library or program. Use
/// it outside all namespaces.
#define MZ_LIBRARY_INTERFACES                                                                      \
    namespace Mz {                                                                                 \
    MZ_INTERFACE(QrBufferedIO, isBufferIgnored, writeObject, readObject,                           \
                 MZ_OPERATION(write, void(const void*, int)), MZ_OPERATION(write, void(char)),     \
                 MZ_OPERATION(read, int(void*, int)), MZ_OPERATION(read, int()), writeEol,         \
                 writeSpace, MZ_OPERATION(writeChar, int(const wchar_t*, int)),                    \
                 MZ_OPERATION(writeChar, int(const char*, int)),                                   \
                 MZ_OPERATION(writeChar, void(wchar_t)), MZ_OPERATION(writeChar, void(char)),      \
                 skipWhiteSpace, MZ_OPERATION(readChar, int(wchar_t*, int, int)),                  \
                 MZ_OPERATION(readChar, int(char*, int, int)),                                     \
                 MZ_OPERATION(readChar, int(wchar_t&)), MZ_OPERATION(readChar, int(char&)),        \
                 MZ_OPERATION(ungetc, void(wchar_t)), MZ_OPERATION(ungetc, void(char)), canSeek,   \
                 seek, tell)                                                                       \
    MZ_INTERFACE(QrPersistant, getClassUid, getVersion, write, read, loadFinished)                 \
    MZ_INTERFACE(QrComponentBuilder, getBuilder, createObject)                                     \
    MZ_INTERFACE(QrBuilderDescription, getUid, getName, getLabel, getNumber, getText,              \
                 getComponentLabel, getComponentText, getFlag,                                     \
                 MZ_OPERATION(getBuilder, QrRefPtr<QrComponentBuilder>()),                         \
                 MZ_OPERATION(getBuilder, QrCRefPtr<QrComponentBuilder>() const))                  \
    MZ_INTERFACE(QrComponentDescription, createBuilder, getComponentValue, getComponentLabel,      \
                 getComponentText, getBuilderCount, enumerateBuilders)                             \
    MZ_GROWING_INTERFACE(QrComponentManager, getBuilder, enumerateBuilders, initialize,            \
                         createObject)                                                             \
    MZ_INTERFACE(QrImportBuilder, enumerateExtensions,                                             \
                 MZ_OPERATION(canImport,                                                           \
                              bool(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const),    \
                 MZ_OPERATION(canImport, bool(const wchar_t*, const wchar_t*) const),              \
                 MZ_OPERATION(import, QrRef<QrCastable>(QrPtr<QrBufferedIO>, const wchar_t*,       \
                                                        const wchar_t*) const),                    \
                 MZ_OPERATION(import, QrRef<QrCastable>(const wchar_t*, const wchar_t*) const))    \
    MZ_INTERFACE(QrImporter, getBuilderName,                                                       \
                 MZ_OPERATION(import,                                                              \
                              QrRef<QrCastable>(const wchar_t*, const wchar_t*, bool&) const),     \
                 MZ_OPERATION(import, QrRef<QrCastable>(const wchar_t*, const wchar_t*) const))    \
    MZ_INTERFACE(QrProcessControl, getContext, message, isInterrupted, warning, isProgressShown,   \
                 progress, isStatusShown, status, error, isErrorShown, log, abort, findFile)       \
    }                                                                                              \
    static_assert(true)
