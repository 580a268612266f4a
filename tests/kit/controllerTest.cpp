// SPDX-License-Identifier: BSL-1.0
// The kit's process controller: its defaults, and where it is installed.
#include "components/componentKit/hostKit.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/unit/standardError.h"

#include <gtest/gtest.h>

#include <thread>

using namespace Mz;
using Mz::Test::StandardErrorCapture;

namespace {

class Log final : public Kit::Controller {
  public:
    void show(Kind kind, const wchar_t* text) override {
        shown += std::to_wstring(static_cast<int>(kind)) + text + L';';
    }
    std::wstring shown;
};

TEST(KitController, HasADefaultForEachFunction) {
    Kit::Controller controller;
    StandardErrorCapture captured;
    EXPECT_EQ(controller.getContext(), nullptr);
    EXPECT_FALSE(controller.isInterrupted());
    EXPECT_FALSE(controller.isProgressShown());
    EXPECT_FALSE(controller.isStatusShown());
    EXPECT_TRUE(controller.isErrorShown());
    EXPECT_TRUE(controller.progress(0.5F, L"half"));
    controller.status(L"status");
    controller.log(0, L"log");
    EXPECT_EQ(captured.text(), "");
    controller.message(0, L"a message");
    EXPECT_TRUE(controller.warning(0, L"a warning"));
    EXPECT_FALSE(controller.error(0, L"an error \u4E00"));
    controller.message(0, nullptr);
    EXPECT_THROW(controller.abort(0, L"the end"), Assertions::ExProgramAborted);
    EXPECT_EQ(captured.text(), "a message\na warning\nan error ?\n\nthe end\n");
}

TEST(KitController, ShowsEachTextThroughOneFunction) {
    Log log;
    log.message(1, L"a");
    log.warning(2, L"b");
    log.error(3, L"c");
    EXPECT_THROW(log.abort(4, nullptr), Assertions::ExProgramAborted);
    EXPECT_EQ(log.shown, L"0a;1b;2c;3;");
}

TEST(KitController, StopsProgressWhenTheWorkIsInterrupted) {
    class Impatient final : public Kit::Controller {
        bool isInterrupted() override { return true; }
    };
    Impatient controller;
    EXPECT_FALSE(static_cast<Kit::Controller&>(controller).progress(0.5F, L""));
}

TEST(KitController, FindsFilesLikeTheControllerBeforeIt) {
    const Mz::Test::TemporaryDirectory folder;
    folder.write("some.txt", "x");
    Kit::Controller controller;
    const Kit::ControllerScope scope(controller);
    EXPECT_EQ(QrGetProcessController()->findFile(L"some.txt", folder.text().c_str(), nullptr),
              folder.text() + L"/some.txt");
    EXPECT_EQ(controller.findFile(L"other.txt", folder.text().c_str(), nullptr), L"");

    class Changed final : public Kit::Controller {
        std::wstring findFile(const wchar_t* name, const wchar_t*, const wchar_t*) override {
            return std::wstring(L"found ") + name;
        }
    };
    Changed changed;
    const Kit::ControllerScope inner(changed);
    EXPECT_EQ(QrGetProcessController()->findFile(L"it", nullptr, nullptr), L"found it");
}

TEST(KitController, FindsNothingWithoutAControllerBeforeIt) {
    QrProcessControl* const before = QrGetSystemProcessController();
    QrSetSystemProcessController(nullptr);
    Kit::Controller controller;
    QrSetSystemProcessController(before);
    EXPECT_EQ(controller.findFile(L"some.txt", nullptr, nullptr), L"");
}

TEST(KitController, IsInstalledUntilItsScopeEnds) {
    QrProcessControl* const before = QrGetSystemProcessController();
    Log log;
    Log own;
    {
        const Kit::ControllerScope scope(log);
        EXPECT_EQ(QrGetSystemProcessController(), &log);
        const Kit::ControllerScope inner(own, Kit::ControllerScope::thread);
        EXPECT_EQ(QrGetProcessController(), &own);
        std::thread([&] { EXPECT_EQ(QrGetProcessController(), &log); }).join();
    }
    EXPECT_EQ(QrGetSystemProcessController(), before);
    EXPECT_EQ(QrGetThreadProcessController(), nullptr);
}

} // namespace
