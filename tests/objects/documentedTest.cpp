// SPDX-License-Identifier: BSL-1.0
// Tests the examples of docs/savedObjects.md, which tests/documentation extracts.
#include "gauge.h"
#include "saveGauge.h"

#include "components/componentManager/componentImp.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

namespace {

TEST(DocumentedGauges, AreSavedAndLoaded) {
    QrGetComponentManager()->initialize(MZ_BUILD_PATH L"/components/objects");
    const auto make = [](const wchar_t* name, float value) {
        const auto object = QrGetComponentManager()->createObject(needleGaugeUid);
        auto gauge = Mz::QrPtr<Gauge>::adopt(Mz::safeCast<Gauge>(object.get()));
        gauge->name = name;
        gauge->value = value;
        return gauge;
    };
    const Mz::QrPtr<Gauge> first = make(L"\u00FC\u20AC", 1.5F);
    first->next = make(L"second", -2);
    const Mz::Test::TemporaryDirectory folder;
    const std::string file = (folder.path() / "gauges").string();
    saveGauge(file.c_str(), first.get());
    const Mz::QrPtr<Gauge> read = loadGauge(file.c_str());
    ASSERT_TRUE(read);
    EXPECT_EQ(read->name, first->name);
    EXPECT_EQ(read->value, 1.5F);
    ASSERT_TRUE(read->next);
    EXPECT_EQ(read->next->name, L"second");
    EXPECT_FALSE(read->next->next);
}

TEST(DocumentedGauges, AreNotLoadedFromAFileThatCannotBeOpened) {
    const Mz::Test::TemporaryDirectory folder;
    EXPECT_THROW(loadGauge((folder.path() / "nothing").string().c_str()),
                 Mz::QrStreamEx::ExReadOpen);
}

} // namespace
