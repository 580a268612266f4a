// SPDX-License-Identifier: BSL-1.0
/// Tests the registries of translations and of process controllers while allocations fail.
#include "components/componentKit/controller.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/processControl.h"
#include "components/componentManager/translation.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

#include <memory>
#include <thread>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Plain final : public QrCastImpl<Plain, QrComponentBuilder> {
    QrRef<QrCastable> createObject() override { return nullptr; }
};

TEST(RegistryWithoutMemory, KeepsTheTranslationsThatItHas) {
    // Enough objects to make the table grow.
    std::vector<std::unique_ptr<Plain>> objects(40);
    for (auto& object : objects)
        object = std::make_unique<Plain>();
    Plain translator;
    const auto accepts = [](const QrUid& uid) { return uid == QrComponentBuilder::uid; };
    failEachAllocation([&](Attempt& attempt) {
        std::size_t added = 0;
        const bool done = attempt.run([&] {
            for (const auto& object : objects) {
                QrAddTranslation(object.get(), &translator, accepts);
                ++added;
            }
        });
        EXPECT_EQ(done, !attempt.failed);
        for (std::size_t index = 0; index < objects.size(); ++index) {
            QrCastable* const object = objects[index].get();
            EXPECT_EQ(QrTranslateInterface(object, QrComponentBuilder::uid) != nullptr,
                      index < added);
            if (index >= added)
                QrAddTranslation(object, &translator, accepts);
            EXPECT_TRUE(QrTranslateInterface(object, QrComponentBuilder::uid));
            QrRemoveTranslation(object, &translator);
            EXPECT_FALSE(QrTranslateInterface(object, QrComponentBuilder::uid));
        }
    });
}

TEST(RegistryWithoutMemory, KeepsTheControllersThatItHas) {
    Kit::Controller first, second;
    QrProcessControl* const own = QrGetSystemProcessController();
    failEachAllocation([&](Attempt& attempt) {
        // The registry has no entry of a new thread.
        std::thread([&] {
            // Returns the controller in spite of a failure: a lookup inserts nothing.
            QrProcessControl* found = nullptr;
            const bool done = attempt.run([&] {
                found = QrGetProcessController();
                QrSetThreadProcessController(&first);
            });
            EXPECT_EQ(found, own);
            EXPECT_EQ(done, !attempt.failed);
            EXPECT_EQ(QrGetThreadProcessController(), done ? &first : nullptr);
            EXPECT_EQ(QrGetProcessController(), done ? &first : own);
            QrSetThreadProcessController(&second);
            EXPECT_EQ(QrGetProcessController(), &second);
            QrSetThreadProcessController(nullptr);
            EXPECT_EQ(QrGetProcessController(), own);
        }).join();
    });
}

} // namespace
