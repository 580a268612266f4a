// SPDX-License-Identifier: BSL-1.0
/// Describes itself in characters of many scripts, also beyond the basic plane, and at length.
#include "tests/checks/sound/thing.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

class Word final : public Kit::Object<Word, Thing> {
  public:
    int value() const override { return 15; }
};

} // namespace

MZ_COMPONENT(L"\u00DCbersetzer \u2013 \u7FFB\u8BD1 \u043F\u0435\u0440\u0435\u0432\u043E\u0434",
             L"\U0001F600 \U0001D11E \u0627\u0644\u0639\u0631\u0628\u064A\u0629 e\u0301 \u200B",
             Kit::builderOf<Word>({.uid = soundUid(15),
                                   .name = L"w\u00F6rter \u8A9E",
                                   .label = L"\U0001F4D6 \"W\u00F6rter\" <&> 100 %s \\ \t",
                                   .text = L"one line\nanother line\r\nand a very long one: "
                                           L"01234567890123456789012345678901234567890123456789"
                                           L"01234567890123456789012345678901234567890123456789"
                                           L"01234567890123456789012345678901234567890123456789",
                                   .number = 0xFFFFFFFF,
                                   .flag = true}))
