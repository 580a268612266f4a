// SPDX-License-Identifier: BSL-1.0
/// What the import builders of settings and their hosts agree on.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <string>
#include <string_view>
#include <vector>

using namespace Mz::literals; // "..."_uid

/// Settings that were read from a file: keys with values, in sections. They do not change, so any
/// thread may use them. All texts are in the encoding of the file.
class Settings : public Mz::QrCastable {
  public:
    using Self = Settings;
    static constexpr Mz::QrUid uid = "8C2F4E01-7A31-11EF-B6D0-1F93C5A0E274"_uid;

    struct Entry {
        std::string section, key, value;
    };

    /// Returns all entries in the order of the file.
    virtual const std::vector<Entry>& entries() const = 0;

    /// Returns the value of the last entry with this key, or null if there is none.
    const std::string* find(std::string_view section, std::string_view key) const {
        const std::string* found = nullptr;
        for (const Entry& entry : entries())
            if (entry.section == section && entry.key == key)
                found = &entry.value;
        return found;
    }
};

/// The builder name of all import builders whose objects are `Settings`. It is also the argument of
/// `Kit::newImporter` in the host.
#define SETTINGS_BUILDERS L"settings"
