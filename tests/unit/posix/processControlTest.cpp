// SPDX-License-Identifier: BSL-1.0
// Tests how the default controller finds files from the root of the file system.
#include "components/componentManager/processControl.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

TEST(FindFileInRoot, HasOneSlashBeforeTheName) {
    const TemporaryDirectory directory;
    directory.write("file.txt", "x");
    const std::wstring file = directory.text() + L"/file.txt";
    QrProcessControl* const controller = QrGetSystemProcessController();
    for (const wchar_t* root : {L"/", L"//", L"\\/"})
        EXPECT_EQ(controller->findFile(file.substr(1).c_str(), root, nullptr), file);
}

} // namespace
