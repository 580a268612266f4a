// SPDX-License-Identifier: BSL-1.0
// Tests the default process controller: what it writes to the standard error stream, and how it
// finds files.
#include "components/componentManager/processControl.h"
#include "components/base/assertions.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/unit/standardError.h"

#include <gtest/gtest.h>

#include <limits>
#include <regex>
#include <sstream>
#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

const wchar_t* const text = L"a readable text";

std::string address(const wchar_t* pointer) {
    std::ostringstream stream;
    stream << static_cast<const void*>(pointer);
    return stream.str();
}

class DefaultController : public testing::Test {
  protected:
    QrProcessControl* const controller = QrGetSystemProcessController();
};

TEST_F(DefaultController, AnswersItsOneInterfaceAndIsNotCounted) {
    constexpr QrUid uid{0xEB719621, 0xC02011D1, 0xAA7A00C0, 0x4FB1532A};
    EXPECT_EQ(controller->getInterface(uid), controller);
    EXPECT_EQ(controller->getInterface({0xEB719622, 0xC02011D1, 0xAA7A00C0, 0x4FB1532A}), nullptr);
    EXPECT_EQ(controller->newReference(), 1);
    EXPECT_EQ(controller->release(), 1);
    EXPECT_EQ(controller->release(), 1);
    controller->destroy();
    EXPECT_EQ(controller->getCastable(), controller);
}

TEST_F(DefaultController, AnswersEveryQuestionWithFalse) {
    const StandardErrorCapture capture;
    EXPECT_EQ(controller->getContext(), nullptr);
    EXPECT_FALSE(controller->isInterrupted());
    EXPECT_FALSE(controller->isProgressShown());
    EXPECT_FALSE(controller->isStatusShown());
    EXPECT_FALSE(controller->isErrorShown());
    EXPECT_EQ(capture.text(), "");
}

TEST_F(DefaultController, WritesAddressesAndLineEndsAndFlushes) {
    const std::string line = address(text) + "\n";
    {
        const StandardErrorCapture capture;
        controller->message(1, text);
        EXPECT_EQ(capture.text(), line);
        EXPECT_EQ(capture.flushes(), 1);
    }
    {
        const StandardErrorCapture capture;
        controller->log(2, text);
        EXPECT_EQ(capture.text(), line);
        EXPECT_EQ(capture.flushes(), 1);
    }
    {
        const StandardErrorCapture capture;
        EXPECT_TRUE(controller->warning(3, text));
        EXPECT_EQ(capture.text(), line);
        EXPECT_EQ(capture.flushes(), 1);
    }
    {
        const StandardErrorCapture capture;
        EXPECT_FALSE(controller->error(4, text));
        EXPECT_EQ(capture.text(), line);
        EXPECT_EQ(capture.flushes(), 1);
    }
}

TEST_F(DefaultController, WritesANullTextAsANullAddress) {
    const StandardErrorCapture capture;
    controller->message(0, nullptr);
    EXPECT_EQ(capture.text(), address(nullptr) + "\n");
}

TEST_F(DefaultController, WritesItsStatusWithoutFlushing) {
    const StandardErrorCapture capture;
    controller->status(text);
    EXPECT_EQ(capture.flushes(), 0);
    const std::string written = capture.text();
    EXPECT_EQ(written.substr(0, address(text).size()), address(text));
    const std::string carriageReturn = written.substr(address(text).size());
    EXPECT_TRUE(std::regex_match(carriageReturn, std::regex("0x[0-9a-f]+"))) << carriageReturn;
}

/// Returns the percentage that `progress` writes before the address of "%: ".
std::string percentage(float fraction) {
    const StandardErrorCapture capture;
    EXPECT_TRUE(QrGetSystemProcessController()->progress(fraction, text));
    EXPECT_EQ(capture.flushes(), 0);
    static const std::regex form("(-?[0-9]+)0x[0-9a-f]+" + address(text) + "0x[0-9a-f]+");
    std::smatch parts;
    if (!std::regex_match(capture.text(), parts, form)) {
        ADD_FAILURE() << capture.text();
        return "";
    }
    return parts[1];
}

TEST_F(DefaultController, WritesTheProgressInPercentCutToAWholeNumber) {
    EXPECT_EQ(percentage(0.0f), "0");
    EXPECT_EQ(percentage(0.999f), "99");
    EXPECT_EQ(percentage(1.0f), "100");
    EXPECT_EQ(percentage(0.29f), "28");
    EXPECT_EQ(percentage(0.57f), "56");
    EXPECT_EQ(percentage(0.0099f), "0");
    EXPECT_EQ(percentage(2.5f), "250");
}

TEST_F(DefaultController, CutsNegativeProgressTowardsZero) {
    EXPECT_EQ(percentage(-0.0f), "0");
    EXPECT_EQ(percentage(-0.009f), "0");
    EXPECT_EQ(percentage(-0.999f), "-99");
    EXPECT_EQ(percentage(-2.5f), "-250");
}

TEST_F(DefaultController, WritesZeroForProgressThatIsNoNumberOrNoInt) {
    using Limits = std::numeric_limits<float>;
    for (const float fraction :
         {Limits::quiet_NaN(), Limits::infinity(), -Limits::infinity(), Limits::max(),
          Limits::lowest(), 21474840.0f, -21474840.0f, 1e30f, Limits::denorm_min()})
        EXPECT_EQ(percentage(fraction), "0") << fraction;
    EXPECT_EQ(percentage(21474836.0f), "2147483600");
    EXPECT_EQ(percentage(-21474836.0f), "-2147483600");
}

TEST_F(DefaultController, AbortsByException) {
    const StandardErrorCapture capture;
    try {
        controller->abort(1, text);
    } catch (const Assertions::ExProgramAborted& aborted) {
        EXPECT_STREQ(aborted.getDetailedReason(),
                     "components/componentManager/processControl(274): Program aborted.");
        EXPECT_STREQ(aborted.getReason(), "Program aborted.");
        EXPECT_STREQ(aborted.what(), "Program aborted.");
    }
    EXPECT_EQ(capture.text(), address(text) + "\n");
    EXPECT_EQ(capture.flushes(), 1);
}

// ---- Files ----------------------------------------------------------------------------------

class FindFile : public DefaultController {
  protected:
    FindFile() {
        for (const char* name : {"one", "two", "empty"})
            std::filesystem::create_directory(directory.path() / name);
        std::filesystem::create_directory(directory.path() / "one" / "folder.txt");
        directory.write("one/first.txt", "1");
        directory.write("one/both.txt", "1");
        directory.write("two/both.txt", "2");
        directory.write("two/second.txt", "2");
    }

    std::wstring in(const wchar_t* name) const { return directory.text() + L"/" + name; }

    std::wstring find(const std::wstring& name, const std::wstring& search) const {
        return controller->findFile(name.c_str(), search.c_str(), nullptr);
    }

    TemporaryDirectory directory;
    const std::wstring one = in(L"one");
    const std::wstring two = in(L"two");
    const std::wstring empty = in(L"empty");
};

TEST_F(FindFile, TriesTheDirectoriesInOrder) {
    EXPECT_EQ(find(L"both.txt", one + L";" + two), one + L"/both.txt");
    EXPECT_EQ(find(L"both.txt", two + L";" + one), two + L"/both.txt");
    EXPECT_EQ(find(L"second.txt", one + L";" + two), two + L"/second.txt");
    EXPECT_EQ(find(L"missing.txt", one + L";" + two), L"");
}

TEST_F(FindFile, PassesOverEmptyElements) {
    const std::wstring search = L";;" + one + L";;;" + two + L";;";
    EXPECT_EQ(find(L"first.txt", search), one + L"/first.txt");
    EXPECT_EQ(find(L"second.txt", search), two + L"/second.txt");
    EXPECT_EQ(find(L"both.txt", search), one + L"/both.txt");
    EXPECT_EQ(find(L"missing.txt", search), L"");
    EXPECT_EQ(find(L"missing.txt", L";;;"), L"");
    EXPECT_EQ(find(L"missing.txt", L""), L"");
}

TEST_F(FindFile, JoinsWithExactlyOneSlash) {
    for (const wchar_t* end : {L"", L"/", L"\\", L"//", L"/\\/", L"\\\\//\\"})
        EXPECT_EQ(find(L"first.txt", one + end), one + L"/first.txt") << end;
    EXPECT_EQ(find(L"first.txt", one + L"\\/;" + two), one + L"/first.txt");
    EXPECT_EQ(find(L"one/first.txt", directory.text()), directory.text() + L"/one/first.txt");
}

TEST_F(FindFile, SkipsDirectoriesThatDoNotExist) {
    EXPECT_EQ(find(L"second.txt", in(L"nowhere") + L";" + two), two + L"/second.txt");
}

TEST_F(FindFile, DoesNotTakeADirectoryForAFile) {
    EXPECT_EQ(find(L"folder.txt", one), L"");
    EXPECT_EQ(find(one, L""), L"");
    EXPECT_EQ(find(L"", one), L"");
    EXPECT_EQ(controller->findFile(one.c_str(), nullptr, nullptr), L"");
}

TEST_F(FindFile, TakesTheBareNameAtTheEnd) {
    const std::wstring file = one + L"/first.txt";
    EXPECT_EQ(controller->findFile(file.c_str(), nullptr, nullptr), file);
    EXPECT_EQ(controller->findFile(file.c_str(), empty.c_str(), nullptr), file);
    EXPECT_EQ(controller->findFile(file.c_str(), empty.c_str(), empty.c_str()), file);
    EXPECT_EQ(controller->findFile(file.c_str(), nullptr, L""), file);
}

TEST_F(FindFile, GoesOnWithTheFallbackWhenEveryElementFails) {
    EXPECT_EQ(controller->findFile(L"second.txt", one.c_str(), two.c_str()), two + L"/second.txt");
    EXPECT_EQ(controller->findFile(L"both.txt", one.c_str(), two.c_str()), one + L"/both.txt");
    EXPECT_EQ(controller->findFile(L"second.txt", nullptr, two.c_str()), two + L"/second.txt");
    EXPECT_EQ(controller->findFile(L"second.txt", L";;", two.c_str()), two + L"/second.txt");
    EXPECT_EQ(controller->findFile(L"missing.txt", one.c_str(), two.c_str()), L"");
}

TEST_F(FindFile, LooksForNamesThatSayWhereTheyAreNowhereElse) {
    std::filesystem::create_directory(directory.path() / "one" / "sub");
    directory.write("one/sub/x.txt", "x");
    EXPECT_EQ(find(L"sub/x.txt", one), one + L"/sub/x.txt");
    EXPECT_EQ(find(L"/sub/x.txt", one), L"");
    EXPECT_EQ(find(L"\\sub/x.txt", one), L"");
    EXPECT_EQ(controller->findFile(L"/sub/x.txt", one.c_str(), one.c_str()), L"");
    EXPECT_EQ(find(L"c:first.txt", one), L"");
}

TEST_F(FindFile, TakesNullTextsForEmptyOnes) {
    EXPECT_EQ(controller->findFile(nullptr, nullptr, nullptr), L"");
    EXPECT_EQ(controller->findFile(nullptr, one.c_str(), two.c_str()), L"");
    EXPECT_EQ(controller->findFile(L"", L"", L""), L"");
    EXPECT_EQ(find(L"x", one), L"") << "a name of one character must not be read beyond its end";
}

TEST_F(FindFile, DoesNotFindANameThatTheLocaleCannotExpress) {
    const wchar_t name[] = {static_cast<wchar_t>(0x20AC), L'.', L't', L'x', L't', 0};
    EXPECT_EQ(find(name, one), L"");
}

} // namespace
