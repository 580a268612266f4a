// SPDX-License-Identifier: BSL-1.0
// Tests what compiled components rely on: the size of the public types, the uids, and the
// signatures of the exported functions. Most of it is checked at compile time.
#include "components/base/assertions.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/processControl.h"
#include "components/resmgt/lkCounter.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>
#include <type_traits>

using namespace Mz;

namespace {

constexpr std::size_t pointer = 8;

static_assert(sizeof(void*) == pointer);
static_assert(sizeof(QrUid) == 16 && alignof(QrUid) == 4);
static_assert(offsetof(QrUid, w0) == 0 && offsetof(QrUid, w1) == 4 && offsetof(QrUid, w2) == 8 &&
              offsetof(QrUid, w3) == 12);
static_assert(std::is_aggregate_v<QrUid> && std::is_trivially_copyable_v<QrUid>);
static_assert(sizeof(int64) == 8 && std::is_same_v<int64, long long>);
static_assert(sizeof(LkCounterWindows<long>) == 4);
static_assert(sizeof(QrRef<QrCastable>) == pointer);
static_assert(sizeof(QrCPtr<QrBufferedIO>) == pointer);
static_assert(sizeof(QrEnum::Action) == 4);

// An interface has no data but its vtable pointer.
static_assert(sizeof(QrCastable) == pointer);
static_assert(sizeof(QrBufferedIO) == pointer);
static_assert(sizeof(QrEnumerator<const wchar_t*>) == pointer);
static_assert(sizeof(QrComponentBuilder) == pointer);
static_assert(sizeof(QrBuilderDescription) == pointer);
static_assert(sizeof(QrComponentDescription) == pointer);
static_assert(sizeof(QrComponentManager) == pointer);
static_assert(sizeof(QrImportBuilder) == pointer);
static_assert(sizeof(QrImporter) == pointer);
static_assert(sizeof(QrProcessControl) == pointer);

static_assert(sizeof(QrInBuffer) == 2 * pointer);
static_assert(sizeof(QrOutBuffer) == 2 * pointer);
static_assert(sizeof(QrBaseImporter) == pointer + sizeof(std::wstring));
static_assert(sizeof(ExBase) == pointer + 3 * sizeof(std::string));
static_assert(sizeof(QrStreamEx::ExRead) == sizeof(std::runtime_error) + sizeof(ExBase));

TEST(Layout, OfUidsIsFourLittleEndianWords) {
    const unsigned char expected[16] = {0x23, 0xDF, 0xC8, 0x81, 0xD1, 0x11, 0x81, 0xA7,
                                        0x45, 0x44, 0x8A, 0x98, 0x00, 0x00, 0x54, 0x53};
    unsigned char bytes[16];
    std::memcpy(bytes, &QrBufferedIO::uid, sizeof bytes);
    EXPECT_EQ(std::memcmp(bytes, expected, sizeof bytes), 0);
}

// The uids with which existing components were built. clientUids.cpp tests that they can be linked.
static_assert(QrBufferedIO::uid == QrUid{0x81C8DF23, 0xA78111D1, 0x988A4445, 0x53540000});
static_assert(QrBuilderDescription::uid == QrUid{0xAD148680, 0x719A11D1, 0xA3BB0060, 0x9707609D});
static_assert(QrComponentBuilder::uid == QrUid{0xAD148681, 0x719A11D1, 0xA3BB0060, 0x9707609D});
static_assert(QrImportBuilder::uid == QrUid{0xAD148682, 0x719A11D1, 0xA3BB0060, 0x9707609D});
static_assert(QrComponentDescription::uid == QrUid{0xAD148683, 0x719A11D1, 0xA3BB0060, 0x9707609D});
static_assert(QrComponentManager::uid == QrUid{0xAD148684, 0x719A11D1, 0xA3BB0060, 0x9707609D});
static_assert(QrImporter::uid == QrUid{0xAD148685, 0x719A11D1, 0xA3BB0060, 0x9707609D});
static_assert(QrProcessControl::uid == QrUid{0xEB719621, 0xC02011D1, 0xAA7A00C0, 0x4FB1532A});

TEST(PlainFunctions, HaveTheirSignatures) {
    static_assert(std::is_same_v<decltype(QrGetComponentManager), QrComponentManager*()>);
    static_assert(std::is_same_v<decltype(QrGetProcessController), QrProcessControl*()>);
    static_assert(std::is_same_v<decltype(QrGetSystemProcessController), QrProcessControl*()>);
    static_assert(std::is_same_v<decltype(QrSetSystemProcessController), void(QrProcessControl*)>);
    static_assert(std::is_same_v<decltype(QrGetThreadProcessController), QrProcessControl*()>);
    static_assert(std::is_same_v<decltype(QrSetThreadProcessController), void(QrProcessControl*)>);
    static_assert(
        std::is_same_v<decltype(QrTranslateInterface), QrCastable*(QrCastable*, const QrUid&)>);
    static_assert(std::is_same_v<decltype(QrRemoveTranslation), void(QrCastable*, QrCastable*)>);
    static_assert(std::is_same_v<decltype(QrAddTranslation),
                                 void(QrCastable*, QrCastable*, bool (*)(const QrUid&))>);
    static_assert(std::is_same_v<QrGetComponentDescriptionFunction, QrCastable*()>);
    EXPECT_NE(QrGetComponentManager(), nullptr);
    EXPECT_EQ(QrGetComponentManager(), QrGetComponentManager());
}

} // namespace
