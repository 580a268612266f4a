// SPDX-License-Identifier: BSL-1.0
// Tests the console controller: messages, progress on a terminal and in a file, and interrupts.
#include "components/componentTools/console.h"
#include "components/base/assertions.h"
#include "components/base/surrogates.h"
#include "components/componentTools/consoleText.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <clocale>
#include <csignal>
#include <cstdint>
#include <limits>
#include <sstream>
#include <string>
#include <utility>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class Console : public ::testing::Test {
  protected:
    std::ostringstream stream;
};

TEST_F(Console, WritesMessagesAsText) {
    ConsoleController controller(stream, false);
    controller.message(1, L"hello");
    EXPECT_TRUE(controller.warning(1, L"doubtful"));
    EXPECT_FALSE(controller.error(1, L"wrong"));
    controller.log(1, L"noted");
    controller.status(L"busy");
    controller.message(1, nullptr);
    EXPECT_EQ(stream.str(), "hello\nwarning: doubtful\nerror: wrong\nnoted\nbusy\n\n");
    EXPECT_EQ(controller.errorCount(), 1);
    EXPECT_TRUE(controller.isProgressShown() && controller.isStatusShown() &&
                controller.isErrorShown());
    EXPECT_EQ(controller.getContext(), nullptr);
    EXPECT_EQ(queryCast<QrProcessControl>(&controller).get(), &controller);
}

TEST_F(Console, WritesWhatTheEncodingLacksAsAQuestionMark) {
    std::setlocale(LC_ALL, "C");
    ConsoleController controller(stream, false);
    controller.message(0, L"a\u4E2Db");
    EXPECT_EQ(stream.str(), "a?b\n");
}

TEST_F(Console, ShowsProgressInPlainLinesWhereThereIsNoTerminal) {
    ConsoleController controller(stream, false);
    for (int percent = 0; percent <= 25; ++percent)
        EXPECT_TRUE(controller.progress(static_cast<float>(percent) / 100, L"work"));
    EXPECT_EQ(stream.str(), "0% work\n10% work\n20% work\n");
}

TEST_F(Console, ShowsABarOnATerminalAndTakesItFromTheLine) {
    ConsoleController controller(stream, true);
    controller.progress(0.5f, L"long text");
    EXPECT_EQ(stream.str(), "\r[###############               ]  50% long text");
    stream.str("");
    controller.progress(1.0f, L"x");
    EXPECT_EQ(stream.str(), "\r[##############################] 100% x        ");
    stream.str("");
    controller.message(0, L"m");
    EXPECT_EQ(stream.str(), "\r" + std::string(39, ' ') + "\rm\n");
}

TEST_F(Console, CutsABarThatWouldNotFitItsLine) {
    ConsoleController controller(stream, true);
    controller.progress(0.0f, std::wstring(500, L'x').c_str());
    EXPECT_EQ(stream.str().size(), 80u);
}

TEST_F(Console, CutsNoCharacterThatHasTwoUnits) {
    ConsoleController controller(stream, true);
    const std::wstring pair{static_cast<wchar_t>(0xD83D), static_cast<wchar_t>(0xDE00)};
    const std::string line(78, 'x');
    controller.status((std::wstring(78, L'x') + pair).c_str());
    EXPECT_EQ(stream.str(), "\r" + line);
    stream.str("");
    controller.status(L"y");
    EXPECT_EQ(stream.str(), "\ry" + std::string(77, ' '));
}

TEST_F(Console, CountsColumnsAndKeepsToOneLine) {
    ConsoleController controller(stream, true);
    controller.status(std::wstring(60, L'\u4E2D').c_str()); // Each takes two columns.
    stream.str("");
    controller.clearLine();
    EXPECT_EQ(stream.str(), "\r" + std::string(78, ' ') + "\r");
    controller.status(std::wstring(60, L'\u00E4').c_str());
    stream.str("");
    controller.clearLine();
    EXPECT_EQ(stream.str(), "\r" + std::string(60, ' ') + "\r");
    stream.str("");
    controller.status(L"a\nb");
    EXPECT_EQ(stream.str(), "\ra\\x0Ab");
}

TEST_F(Console, KnowsTheFirstAndLastCharacterOfEachWideRange) {
    const auto columns = [this](std::uint32_t code) {
        ConsoleController controller(stream, true);
        std::wstring text;
        detail::appendCodePoint(text, code);
        controller.status(text.c_str());
        stream.str("");
        controller.clearLine();
        return static_cast<int>(stream.str().size()) - 2; // Between the two carriage returns.
    };
    const std::pair<std::uint32_t, std::uint32_t> ranges[] = {
        {0x1100, 0x115F}, {0x2600, 0x27BF}, {0x2E80, 0xA4CF}, {0xAC00, 0xD7A3},
        {0xF900, 0xFAFF}, {0xFE30, 0xFE6F}, {0xFF00, 0xFF60}, {0xFFE0, 0xFFE6}};
    for (const auto& [first, last] : ranges) {
        EXPECT_EQ(columns(first - 1), 1) << first;
        EXPECT_EQ(columns(first), 2) << first;
        EXPECT_EQ(columns(last), 2) << last;
        EXPECT_EQ(columns(last + 1), 1) << last;
    }
    // Where a character has two units, each counts as one column.
    const int single = detail::wideTextHasSurrogates ? 2 : 1;
    for (const auto& [first, last] :
         {std::pair{0x1F000U, 0x1FAFFU}, std::pair{0x20000U, 0x3FFFDU}}) {
        EXPECT_EQ(columns(first - 1), single) << first;
        EXPECT_EQ(columns(first), 2) << first;
        EXPECT_EQ(columns(last), 2) << last;
        EXPECT_EQ(columns(last + 1), single) << last;
    }
    EXPECT_EQ(columns(0xE000), 1);
    EXPECT_EQ(columns(0x10FFFF), single);
}

TEST_F(Console, EscapesControlCharactersOnly) {
    EXPECT_EQ(withoutControls(L"\x01\x1F ~\x7F\x80\x9F\xA0\xFF", {}),
              L"\\x01\\x1F ~\\x7F\\x80\\x9F\xA0\xFF");
    EXPECT_EQ(withoutControls(L"\t\n\r\xE000\xFFFF", L"\n"), L"\\x09\n\\x0D\xE000\xFFFF");
    if constexpr (sizeof(wchar_t) > 2) {
        // With and without the highest bit, which is a sign on some processors.
        const std::wstring extremes{static_cast<wchar_t>(0x7FFFFFFF),
                                    static_cast<wchar_t>(0x80000000), static_cast<wchar_t>(-1)};
        EXPECT_EQ(withoutControls(extremes, {}), extremes);
    }
}

TEST_F(Console, LeavesNoControlCharacterToTheTerminal) {
    ConsoleController controller(stream, false);
    controller.message(0, L"\x1B[2J\ttab\nline\x9B");
    EXPECT_EQ(stream.str(), "\\x1B[2J\ttab\nline\\x9B\n");
    EXPECT_EQ(withoutControls(L"a\n\x7F"), L"a\\x0A\\x7F");
}

TEST_F(Console, ShowsNoProgressIfTold) {
    ConsoleController controller(stream, false);
    controller.showProgress(false);
    EXPECT_FALSE(controller.isProgressShown());
    EXPECT_TRUE(controller.progress(0.5f, L"work"));
    std::raise(SIGINT);
    EXPECT_FALSE(controller.progress(0.7f, L"work"));
    EXPECT_EQ(stream.str(), "");
    controller.showProgress(true);
    EXPECT_TRUE(controller.isProgressShown());
}

TEST_F(Console, TakesAnyFraction) {
    ConsoleController controller(stream, false);
    controller.progress(-3.0f, L"a");
    controller.progress(7.0f, L"b");
    controller.progress(std::numeric_limits<float>::quiet_NaN(), L"c");
    controller.progress(std::numeric_limits<float>::infinity(), L"d");
    EXPECT_EQ(stream.str(), "0% a\n100% b\n0% c\n100% d\n");
    stream.str("");
    controller.progress(0.29f, L"e");
    EXPECT_EQ(stream.str(), "29% e\n");
}

TEST_F(Console, AnswersThatTheUserWantsToStopAfterTheFirstInterrupt) {
    ConsoleController controller(stream, false);
    EXPECT_FALSE(controller.isInterrupted());
    std::raise(SIGINT);
    EXPECT_TRUE(controller.isInterrupted());
    EXPECT_FALSE(controller.progress(0.5f, L""));
    EXPECT_FALSE(controller.warning(0, L""));
}

void ownHandler(int) {}

TEST_F(Console, GivesInterruptsBackAtTheEnd) {
    std::signal(SIGINT, ownHandler);
    {
        ConsoleController outer(stream, false);
        ConsoleController inner(stream, false);
        std::raise(SIGINT);
        EXPECT_TRUE(outer.isInterrupted());
    }
    EXPECT_EQ(std::signal(SIGINT, SIG_DFL), &ownHandler);
    EXPECT_FALSE(ConsoleController(stream, false).isInterrupted());
}

TEST_F(Console, AbortsByException) {
    ConsoleController controller(stream, false);
    EXPECT_THROW(controller.abort(0, L"enough"), Assertions::ExProgramAborted);
    EXPECT_EQ(stream.str(), "abort: enough\n");
}

TEST_F(Console, FindsFilesAsTheControllerBeforeIt) {
    TemporaryDirectory folder;
    folder.write("file", "x");
    ConsoleController controller(stream, false);
    QrSetSystemProcessController(&controller);
    EXPECT_EQ(controller.findFile(L"file", folder.text().c_str(), nullptr),
              folder.text() + L"/file");
    EXPECT_EQ(controller.findFile(L"nothing", folder.text().c_str(), nullptr), L"");
    QrSetSystemProcessController(nullptr);
}

} // namespace
