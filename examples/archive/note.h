// SPDX-License-Identifier: BSL-1.0
/// What the import builders of notes and their hosts agree on.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <string>

using namespace Mz::literals; // "..."_uid

/// A note that was read from a file. It does not change, so any thread may use it.
class Note : public Mz::QrCastable {
  public:
    using Self = Note;
    static constexpr Mz::QrUid uid = "E7D09B01-2C64-4A3F-8D15-96B0F4C7A238"_uid;

    /// Returns the title, in the encoding of the file.
    virtual const std::string& title() const = 0;

    /// Returns the text. Other notes that it quotes are part of it.
    virtual const std::string& text() const = 0;
};

/// The builder name of all import builders whose objects are notes.
inline constexpr const wchar_t* noteBuilders = L"note";
