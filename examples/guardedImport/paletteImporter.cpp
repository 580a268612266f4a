// SPDX-License-Identifier: BSL-1.0
/// A component that reads palettes, and that trusts its files: a colour is a line "rrggbb", and a
/// line "@N" repeats colour number N. Nothing checks N.
#include "palette.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/processControl.h"
#include "components/componentManager/stream.h"

#include <cstdlib>
#include <string>

using namespace Mz;

namespace {

/// Can be stored, so that it can leave the process of the importer.
class StoredPalette final
    : public QrCastRef<QrCastHeap<QrCastMulti<StoredPalette, Palette, QrPersistant>>> {
  public:
    const QrUid* getClassUid() const override { return &storedPaletteUid; }
    unsigned int getVersion() const override { return 1; }

    void write(QrStream& stream) override {
        stream << static_cast<unsigned int>(colours.size());
        for (const std::uint32_t colour : colours)
            stream << colour;
    }

    /// Runs in the host. Trusts no count: a missing colour throws.
    void read(QrStream& stream) override {
        unsigned int count = 0;
        for (stream >> count; count > 0; --count)
            stream >> colours.emplace_back();
    }
};

/// Returns the colour `number` of a palette, whether it is there or not.
std::uint32_t repeated(const Palette& palette, long number) {
    const volatile std::uint32_t* const first = palette.colours.data();
    return first[number];
}

class PaletteImport final : public Kit::ImportBuilder<PaletteImport> {
  public:
    static constexpr QrUid builderUid{0x8E52C212, 0x6A1F11EF, 0x9D3C7B10, 0x5D3E8F41};

    PaletteImport()
        : ImportBuilder({.uid = builderUid, .name = L"palette", .label = L"Palettes"}, {L"pal"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return true;
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        const QrPtr<Palette> palette = new StoredPalette;
        std::string line;
        for (int byte = 0; (byte = io->read()) >= 0;) {
            if (byte != '\n') {
                line += static_cast<char>(byte);
                continue;
            }
            if (line.starts_with('@'))
                palette->colours.push_back(repeated(*palette, std::atol(line.c_str() + 1)));
            else
                palette->colours.push_back(
                    static_cast<std::uint32_t>(std::strtoul(line.c_str(), nullptr, 16)));
            line.clear();
        }
        QrGetProcessController()->message(0, L"  the importer has read the file");
        return QrRef<QrCastable>(palette.get());
    }
};

} // namespace

MZ_COMPONENT(L"Palettes", L"Reads palettes", Kit::builder<PaletteImport>(),
             Kit::builderOf<StoredPalette>({.uid = storedPaletteUid}))
