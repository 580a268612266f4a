// SPDX-License-Identifier: BSL-1.0
/// Sound classes for libraries that break one rule: each library derives from one of them and gets
/// one thing wrong.
#pragma once

#include "components/componentKit/componentKit.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/processControl.h"
#include "components/componentManager/stream.h"
#include "tests/components/plain.h"

#include <cstdint>
#include <string>

namespace Mz::Test {

/// The uid of the only builder of such a library.
inline constexpr QrUid brokenUid{0x5E1D0001, 0x3C5A11EF, 0x8D1B2C00, 0x6F40A9D7};

/// An object that stores a number.
class Stored : public QrCastRef<QrCastHeap<QrCastImpl<Stored, QrPersistant>>> {
  public:
    const QrUid* getClassUid() const override { return &brokenUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << number; }
    void read(QrStream& stream) override { stream >> number; }

  protected:
    int number = 4711;
};

/// An import builder that accepts everything, reads one byte and imports an object.
template <class Impl>
class Importing : public Kit::ImportBuilder<Impl> {
  public:
    explicit Importing(std::initializer_list<const wchar_t*> extensions = {L"broken"})
        : Kit::ImportBuilder<Impl>({.uid = brokenUid, .name = L"broken", .label = L"Broken"},
                                   extensions) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        io->read();
        return true;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t*,
                             const wchar_t*) const override {
        io->read();
        return (new Stored)->getCastable();
    }
};

/// A builder of `Object` that may be derived from.
template <class Impl, class Object = Stored>
class Building : public Kit::Builder<Impl> {
  public:
    Building() : Kit::Builder<Impl>({.uid = brokenUid, .name = L"broken", .label = L"Broken"}) {}
    QrRef<QrCastable> createObject() override { return (new Object)->getCastable(); }
};

/// Writes where no memory is.
inline int crash() {
    static volatile std::uintptr_t nowhere = 64;
    *reinterpret_cast<volatile int*>(nowhere) = 1;
    return 0;
}

} // namespace Mz::Test

/// A library whose only builder makes objects of a class.
#define MZ_BROKEN_OBJECT(Object)                                                                   \
    MZ_COMPONENT(L"Broken", L"Breaks one rule",                                                    \
                 Mz::Kit::builderOf<Object>(                                                       \
                     {.uid = Mz::Test::brokenUid, .name = L"broken", .label = L"Broken"}))

/// A library with one builder of its own.
#define MZ_BROKEN_BUILDER(Class)                                                                   \
    MZ_COMPONENT(L"Broken", L"Breaks one rule", Mz::Kit::builder<Class>())

/// A library whose description, a `PlainDescription`, gets something wrong.
#define MZ_BROKEN_DESCRIPTION(Class)                                                               \
    extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {                             \
        static Class description("broken",                                                         \
                                 {{Mz::Test::brokenUid, L"broken", L"Broken", L"One builder"}});   \
        return &description;                                                                       \
    }
