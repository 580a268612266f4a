// SPDX-License-Identifier: BSL-1.0
// Tests the vtable slot of every virtual function, since components were compiled with these slots.
#include "components/base/assertions.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/processControl.h"
#include "tests/abi/slots.h"

#include <gtest/gtest.h>

using namespace Mz;
using namespace Mz::Test;

namespace {

using Builders = QrEnumerator<QrCPtr<QrBuilderDescription>>;
using Texts = QrEnumerator<const wchar_t*>;

/// The first slot of an interface's own functions, after the nine of the root.
constexpr std::ptrdiff_t first = 9;

} // namespace

// The private functions at the end of each vtable.
namespace Mz::Test {

std::ptrdiff_t endSlot(const QrBufferedIO*);
std::ptrdiff_t endSlot(const QrBuilderDescription*);
std::ptrdiff_t endSlot(const QrComponentDescription*);
std::ptrdiff_t endSlot(const QrImporter*);
std::ptrdiff_t endSlot(const QrProcessControl*);
std::ptrdiff_t endSlot(const Texts*);

template struct RevealEnd<QrBufferedIO, &QrBufferedIO::forceVtblInstantiation>;
template struct RevealEnd<QrBuilderDescription, &QrBuilderDescription::forceVtblInstantiation>;
template struct RevealEnd<QrComponentDescription, &QrComponentDescription::forceVtblInstantiation>;
template struct RevealEnd<QrImporter, &QrImporter::forceVtblInstantiation>;
template struct RevealEnd<QrProcessControl, &QrProcessControl::forceVtblInstantiation>;
template struct RevealEnd<Texts, &Texts::forceVtblInstantiation>;

} // namespace Mz::Test

namespace {

TEST(Slots, OfQrCastable) {
    using C = QrCastable;
    EXPECT_EQ(slotOf(static_cast<const C* (C::*)() const>(&C::getCastable)), 0);
    EXPECT_EQ(slotOf(static_cast<C* (C::*)()>(&C::getCastable)), 1);
    EXPECT_EQ(slotOf(&C::getInterface), 2);
    EXPECT_EQ(slotOf(&C::hasInterface), 3);
    EXPECT_EQ(slotOf(&C::destroy), 4);
    EXPECT_EQ(slotOf(&C::newReference), 5);
    EXPECT_EQ(slotOf(&C::release), 6);
    EXPECT_EQ(slotCount<C>(), first) << "the destructors have two slots after release";
}

TEST(Slots, OfQrBufferedIO) {
    using B = QrBufferedIO;
    std::ptrdiff_t next = first;
    EXPECT_EQ(slotOf(&B::isBufferIgnored), next++);
    EXPECT_EQ(slotOf(&B::writeObject), next++);
    EXPECT_EQ(slotOf(&B::readObject), next++);
    EXPECT_EQ(slotOf(static_cast<void (B::*)(const void*, int)>(&B::write)), next++);
    EXPECT_EQ(slotOf(static_cast<void (B::*)(char)>(&B::write)), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(void*, int)>(&B::read)), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)()>(&B::read)), next++);
    EXPECT_EQ(slotOf(&B::writeEol), next++);
    EXPECT_EQ(slotOf(&B::writeSpace), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(const wchar_t*, int)>(&B::writeChar)), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(const char*, int)>(&B::writeChar)), next++);
    EXPECT_EQ(slotOf(static_cast<void (B::*)(wchar_t)>(&B::writeChar)), next++);
    EXPECT_EQ(slotOf(static_cast<void (B::*)(char)>(&B::writeChar)), next++);
    EXPECT_EQ(slotOf(&B::skipWhiteSpace), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(wchar_t*, int, int)>(&B::readChar)), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(char*, int, int)>(&B::readChar)), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(wchar_t&)>(&B::readChar)), next++);
    EXPECT_EQ(slotOf(static_cast<int (B::*)(char&)>(&B::readChar)), next++);
    EXPECT_EQ(slotOf(static_cast<void (B::*)(wchar_t)>(&B::ungetc)), next++);
    EXPECT_EQ(slotOf(static_cast<void (B::*)(char)>(&B::ungetc)), next++);
    EXPECT_EQ(slotOf(&B::canSeek), next++);
    EXPECT_EQ(slotOf(static_cast<int64 (B::*)(int64, int)>(&B::seek)), next++);
    EXPECT_EQ(slotOf(&B::tell), next++);
    EXPECT_EQ(endSlot(static_cast<const B*>(nullptr)), next++);
    EXPECT_EQ(next - first, 24);
    EXPECT_EQ(slotCount<B>(), next);
    EXPECT_EQ(slotCount<QrInBuffer>(), next) << "a buffer adds no virtual function";
    EXPECT_EQ(slotCount<QrOutBuffer>(), next);
}

TEST(Slots, OfQrEnumerator) {
    EXPECT_EQ(slotOf(&Texts::process), 2) << "after the two slots of the destructors";
    EXPECT_EQ(slotOf(&Texts::finished), 3);
    EXPECT_EQ(endSlot(static_cast<const Texts*>(nullptr)), 4);
    EXPECT_EQ(slotCount<Texts>(), 5);
    EXPECT_EQ(slotOf(&Builders::process), 2);
    EXPECT_EQ(slotCount<Builders>(), 5);
    EXPECT_EQ(slotCount<QrEnumerator<const QrImportBuilder*>>(), 5);
    EXPECT_EQ(slotCount<QrEnumerator<QrCPtr<QrImportBuilder>>>(), 5);
}

TEST(Slots, OfQrComponentBuilder) {
    using C = QrComponentBuilder;
    EXPECT_EQ(slotOf(&C::getBuilder), first);
    EXPECT_EQ(slotOf(&C::createObject), first + 1);
    EXPECT_EQ(slotCount<C>(), first + 2);
}

TEST(Slots, OfQrBuilderDescription) {
    using B = QrBuilderDescription;
    std::ptrdiff_t next = first;
    EXPECT_EQ(slotOf(&B::getUid), next++);
    EXPECT_EQ(slotOf(&B::getName), next++);
    EXPECT_EQ(slotOf(&B::getLabel), next++);
    EXPECT_EQ(slotOf(&B::getNumber), next++);
    EXPECT_EQ(slotOf(&B::getText), next++);
    EXPECT_EQ(slotOf(&B::getComponentLabel), next++);
    EXPECT_EQ(slotOf(&B::getComponentText), next++);
    EXPECT_EQ(slotOf(&B::getFlag), next++);
    EXPECT_EQ(slotOf(static_cast<QrRefPtr<QrComponentBuilder> (B::*)()>(&B::getBuilder)), next++);
    EXPECT_EQ(slotOf(static_cast<QrCRefPtr<QrComponentBuilder> (B::*)() const>(&B::getBuilder)),
              next++);
    EXPECT_EQ(endSlot(static_cast<const B*>(nullptr)), next++);
    EXPECT_EQ(slotCount<B>(), next);
}

TEST(Slots, OfQrComponentDescription) {
    using C = QrComponentDescription;
    std::ptrdiff_t next = first;
    EXPECT_EQ(slotOf(&C::createBuilder), next++);
    EXPECT_EQ(slotOf(&C::getComponentValue), next++);
    EXPECT_EQ(slotOf(&C::getComponentLabel), next++);
    EXPECT_EQ(slotOf(&C::getComponentText), next++);
    EXPECT_EQ(slotOf(&C::getBuilderCount), next++);
    EXPECT_EQ(slotOf(&C::enumerateBuilders), next++);
    EXPECT_EQ(endSlot(static_cast<const C*>(nullptr)), next++);
    EXPECT_EQ(slotCount<C>(), next);
}

TEST(Slots, OfQrComponentManager) {
    using C = QrComponentManager;
    EXPECT_EQ(slotOf(&C::getBuilder), first);
    EXPECT_EQ(slotOf(&C::enumerateBuilders), first + 1);
    EXPECT_EQ(slotOf(&C::initialize), first + 2);
    EXPECT_EQ(slotOf(&C::createObject), first + 3);
    EXPECT_EQ(slotCount<C>(), first + 4);
}

using Io = QrPtr<QrBufferedIO>;
using Object = QrRef<QrCastable>;
using Text = const wchar_t*;

TEST(Slots, OfQrImportBuilder) {
    using I = QrImportBuilder;
    std::ptrdiff_t next = first;
    EXPECT_EQ(slotOf(&I::enumerateExtensions), next++);
    EXPECT_EQ(slotOf(static_cast<bool (I::*)(Io, Text, Text) const>(&I::canImport)), next++);
    EXPECT_EQ(slotOf(static_cast<bool (I::*)(Text, Text) const>(&I::canImport)), next++);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Io, Text, Text) const>(&I::import)), next++);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Text, Text) const>(&I::import)), next++);
    EXPECT_EQ(slotCount<I>(), next);
}

TEST(Slots, OfQrImporter) {
    using I = QrImporter;
    EXPECT_EQ(slotOf(&I::getBuilderName), first);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Text, Text, bool&) const>(&I::import)), first + 1);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Text, Text) const>(&I::import)), first + 2);
    EXPECT_EQ(endSlot(static_cast<const I*>(nullptr)), first + 3);
    EXPECT_EQ(slotCount<I>(), first + 4);
}

TEST(Slots, OfQrBaseImporter) {
    using I = QrBaseImporter;
    std::ptrdiff_t next = slotCount<QrImporter>();
    EXPECT_EQ(slotOf(&I::enumerateObjects), next++);
    EXPECT_EQ(slotOf(&I::getFileTypes), next++);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Io, Text, Text) const>(&I::import)), next++);
    EXPECT_EQ(slotOf(&I::getDefaultSearch), next++);
    EXPECT_EQ(slotCount<I>(), next);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Text, Text, bool&) const>(&I::import)), first + 1);
    EXPECT_EQ(slotOf(static_cast<Object (I::*)(Text, Text) const>(&I::import)), first + 2);
}

TEST(Slots, OfQrProcessControl) {
    using P = QrProcessControl;
    std::ptrdiff_t next = first;
    EXPECT_EQ(slotOf(&P::getContext), next++);
    EXPECT_EQ(slotOf(&P::message), next++);
    EXPECT_EQ(slotOf(&P::isInterrupted), next++);
    EXPECT_EQ(slotOf(&P::warning), next++);
    EXPECT_EQ(slotOf(&P::isProgressShown), next++);
    EXPECT_EQ(slotOf(&P::progress), next++);
    EXPECT_EQ(slotOf(&P::isStatusShown), next++);
    EXPECT_EQ(slotOf(&P::status), next++);
    EXPECT_EQ(slotOf(&P::error), next++);
    EXPECT_EQ(slotOf(&P::isErrorShown), next++);
    EXPECT_EQ(slotOf(&P::log), next++);
    EXPECT_EQ(slotOf(&P::abort), next++);
    EXPECT_EQ(slotOf(&P::findFile), next++);
    EXPECT_EQ(endSlot(static_cast<const P*>(nullptr)), next++);
    EXPECT_EQ(slotCount<P>(), next);
}

TEST(Slots, OfExBase) {
    EXPECT_EQ(slotOf(&ExBase::getReason), 0);
    EXPECT_EQ(slotOf(&ExBase::getDetailedReason), 1);
    EXPECT_EQ(slotOf(&ExBase::clone), 4) << "after the two slots of the destructors";
    EXPECT_EQ(slotCount<ExBase>(), 5);
    EXPECT_EQ(slotCount<QrStreamEx>(), 5);
    EXPECT_EQ(slotCount<QrComponentManagerEx>(), 5);
}

/// The other tests rely on this.
TEST(SlotOf, KnowsAnOperationThatIsNotVirtual) {
    struct Plain {
        void operation() {}
    };
    EXPECT_EQ(slotOf(&Plain::operation), -1);
}

} // namespace
