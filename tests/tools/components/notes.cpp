// SPDX-License-Identifier: BSL-1.0
/// Imports files with the extension "note" as persistent objects: a number, and an inner object
/// that is stored twice.
#include "components/componentKit/componentKit.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/stream.h"
#include "tests/components/testUids.h"

using namespace Mz;

namespace {

constexpr QrUid noteUid = Test::testUid(0x30010);

class Note final : public QrCastRef<QrCastHeap<QrCastImpl<Note, QrPersistant>>> {
  public:
    const QrUid* getClassUid() const override { return &noteUid; }
    unsigned int getVersion() const override { return 7; }

    void write(QrStream& stream) override {
        stream << number;
        stream << inner.get() << inner.get();
    }
    void read(QrStream& stream) override {
        stream >> number;
        inner = stream.readObject(nullptr, nullptr, nullptr);
        inner = stream.readObject(nullptr, nullptr, nullptr);
    }

    int number = 0;
    QrRef<QrCastable> inner;
};

QrRef<QrCastable> newNote(int number, QrRef<QrCastable> inner) {
    const QrPtr<Note> note(new Note);
    note->number = number;
    note->inner = std::move(inner);
    return note->getCastable();
}

class NoteImporter final : public Kit::ImportBuilder<NoteImporter> {
  public:
    NoteImporter()
        : ImportBuilder({.uid = noteUid, .name = L"notes", .label = L"Notes"}, {L"note"}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return io->read() == 'N';
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        io->read();
        return newNote(io->read(), newNote(2, nullptr));
    }
    QrRef<QrCastable> createObject() override { return newNote(0, nullptr); }
};

} // namespace

MZ_COMPONENT(L"Notes", L"Imports notes", Kit::builder<NoteImporter>())
