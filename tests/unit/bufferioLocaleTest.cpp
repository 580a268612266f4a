// SPDX-License-Identifier: BSL-1.0
// Tests how the buffers convert characters in multibyte and single-byte locales, and the platform's
// converter alone.
#include "components/componentManager/bufferio.h"
#include "components/componentManager/text/plainBytes.h"
#include "components/platform/characters.h"
#include "tests/unit/locales.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Runs `check` in every multibyte locale of the C runtime. Skips the test if it has none.
template <class Check>
void inEveryMultibyteLocale(Check&& check) {
    const std::vector<MultibyteLocale> locales = multibyteLocales();
    if (locales.empty())
        GTEST_SKIP() << "the C runtime has none of the multibyte locales of this test";
    for (const MultibyteLocale& locale : locales) {
        SCOPED_TRACE(std::string(locale.name) + ", character of " +
                     std::to_string(locale.character.size()) + " bytes");
        const LocaleGuard guard(locale.name);
        check(locale);
    }
}

int sizeOf(const std::string& text) {
    return static_cast<int>(text.size());
}

std::string rest(QrBufferedIO& io) {
    std::string text;
    for (int byte = io.read(); byte != -1; byte = io.read())
        text += static_cast<char>(byte);
    return text;
}

TEST(MultibyteLocale, ReadsCharactersOfSeveralBytesAsOne) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string& e = locale.character;
        std::istringstream stream("a" + e + e + "b");
        QrInBuffer in(&stream);
        wchar_t wide[8];
        ASSERT_EQ(in.readChar(wide, 8, 3), 3);
        EXPECT_EQ(std::wstring(wide, 3), (std::wstring{L'a', locale.code, locale.code}));
        EXPECT_EQ(in.seek(0, 0), 0);
        char narrow[20];
        EXPECT_EQ(in.readChar(narrow, 20, 2), 1 + sizeOf(e));
        EXPECT_EQ(std::string(narrow, 1 + e.size()), "a" + e);
        EXPECT_EQ(rest(in), e + "b");
    });
}

TEST(MultibyteLocale, ReadsOneByteAsANarrowCharacterAllTheSame) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        std::istringstream stream(locale.character);
        QrInBuffer in(&stream);
        char c = 'x';
        EXPECT_EQ(in.readChar(c), 1);
        EXPECT_EQ(c, locale.character[0]);
        EXPECT_EQ(rest(in), locale.character.substr(1));
    });
}

TEST(MultibyteLocale, PutsBackTheBytesOfACharacterThatDidNotFit) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string& e = locale.character;
        for (int room = 1; room < sizeOf(e); ++room) {
            std::istringstream stream("a" + e + "b");
            QrInBuffer in(&stream);
            char narrow[20];
            EXPECT_EQ(in.readChar(narrow, 1 + room, 9), 1);
            EXPECT_EQ(rest(in), e + "b");
        }
    });
}

TEST(MultibyteLocale, PutsBackACharacterThatTheEndCutsOff) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string& e = locale.character;
        for (std::size_t length = 1; length < e.size(); ++length) {
            const std::string cut = e.substr(0, length);
            std::istringstream stream("a" + cut);
            QrInBuffer in(&stream);
            char narrow[20];
            EXPECT_EQ(in.readChar(narrow, 20, 9), 1);
            EXPECT_EQ(rest(in), cut);
            EXPECT_EQ(in.seek(0, 0), 0);
            wchar_t wide[8] = {};
            EXPECT_EQ(in.readChar(wide, 8, 8), 1);
            EXPECT_EQ(wide[0], L'a');
            EXPECT_EQ(rest(in), cut) << "all bytes, in their order";
        }
    });
}

TEST(MultibyteLocale, GivesUpAtFourBytesThatFormNoCharacter) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        ASSERT_EQ(locale.noText.size(), 4u);
        for (const std::string& text : {locale.noText, locale.noText + "zzzz"}) {
            std::istringstream stream(text);
            QrInBuffer in(&stream);
            wchar_t wide[8];
            EXPECT_THROW(in.readChar(wide, 8, 8), QrStreamEx::ExReadError);
            EXPECT_FALSE(stream.bad());
            EXPECT_EQ(in.seek(0, 0), 0);
            char narrow[20];
            EXPECT_THROW(in.readChar(narrow, 20, 20), QrStreamEx::ExReadError);
            EXPECT_EQ(in.seek(0, 0), 0);
            wchar_t c;
            EXPECT_THROW(in.readChar(c), QrStreamEx::ExReadError);
        }
    });
}

TEST(MultibyteLocale, PutsBackThreeBytesThatFormNoCharacterAtTheEnd) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string three = locale.noText.substr(0, 3);
        std::istringstream stream(three);
        QrInBuffer in(&stream);
        wchar_t wide[8];
        EXPECT_EQ(in.readChar(wide, 8, 8), 0);
        EXPECT_EQ(in.seek(0, 0), 0);
        char narrow[20];
        EXPECT_EQ(in.readChar(narrow, 3, 20), 0);
        EXPECT_EQ(rest(in), three);
    });
}

TEST(MultibyteLocale, HasTheSameRulesForANul) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string text = locale.character + std::string("\0b", 2);
        std::istringstream stream(text);
        QrInBuffer in(&stream);
        char narrow[20];
        EXPECT_EQ(in.readChar(narrow, 20, 20), sizeOf(locale.character));
        EXPECT_EQ(in.readChar(narrow, 20, -1), 0);
        EXPECT_EQ(in.seek(0, 0), 0);
        wchar_t wide[4] = {L'#', L'#', L'#', L'#'};
        EXPECT_EQ(in.readChar(wide, 4, 4), 4);
        EXPECT_EQ(std::wstring(wide, 4), (std::wstring{locale.code, 0, 0, 0}));
        EXPECT_EQ(rest(in), std::string("\0b", 2));
    });
}

TEST(MultibyteLocale, UngetsAWideCharacterBytesInOrder) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        std::istringstream stream(locale.character + "b");
        QrInBuffer in(&stream);
        wchar_t c;
        EXPECT_EQ(in.readChar(c), 1);
        in.ungetc(c);
        EXPECT_EQ(in.tell(), 0);
        EXPECT_EQ(rest(in), locale.character + "b");
        EXPECT_THROW(in.ungetc(locale.codeWithoutForm), QrStreamEx::ExReadError);
        EXPECT_TRUE(stream.good());
    });
}

TEST(MultibyteLocale, WritesAndCountsCharacters) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string& e = locale.character;
        const std::string text = "a" + e + std::string("\0", 1) + e;
        std::ostringstream stream;
        QrOutBuffer out(&stream);
        EXPECT_EQ(out.writeChar(text.data(), sizeOf(text)), 4);
        EXPECT_EQ(stream.str(), text);
        const wchar_t wide[] = {L'a', locale.code, L'\0', locale.code};
        EXPECT_EQ(out.writeChar(wide, 4), 4);
        EXPECT_EQ(stream.str(), text + text);
        out.writeChar(locale.code);
        out.writeChar('z');
        out.writeChar('\0');
        EXPECT_EQ(stream.str(), text + text + e + "z" + std::string("\0", 1));
    });
}

TEST(MultibyteLocale, WritesNothingOfBytesThatAreNoText) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const std::string cut = "abc" + locale.character.substr(0, locale.character.size() - 1);
        std::ostringstream stream;
        QrOutBuffer out(&stream);
        EXPECT_THROW(out.writeChar(cut.data(), sizeOf(cut)), QrStreamEx::ExWriteError);
        EXPECT_THROW(out.writeChar(locale.noText.data(), 4), QrStreamEx::ExWriteError);
        EXPECT_THROW(out.writeChar(locale.character[0]), QrStreamEx::ExWriteError);
        EXPECT_THROW(out.writeChar(locale.codeWithoutForm), QrStreamEx::ExWriteError);
        EXPECT_EQ(stream.str(), "");
        const wchar_t wide[] = {L'a', locale.codeWithoutForm, L'b'};
        EXPECT_THROW(out.writeChar(wide, 3), QrStreamEx::ExWriteError);
        EXPECT_EQ(stream.str(), "a");
        EXPECT_TRUE(stream.good());
    });
}

TEST(MultibyteLocale, WritesRawBytesAsTheyAre) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        std::ostringstream stream;
        QrOutBuffer out(&stream);
        out.write(locale.noText.data(), 4);
        out.write(locale.character[0]);
        EXPECT_EQ(stream.str(), locale.noText + locale.character[0]);
    });
}

TEST(MultibyteLocale, IsFollowedFromOneCallToTheNext) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        std::istringstream stream(locale.character + locale.character);
        QrInBuffer in(&stream);
        wchar_t c;
        {
            const LocaleGuard plain("C");
            EXPECT_EQ(in.readChar(c), 1);
            EXPECT_EQ(c, static_cast<wchar_t>(static_cast<unsigned char>(locale.character[0])));
            in.seek(sizeOf(locale.character), 0);
        }
        EXPECT_EQ(in.readChar(c), 1);
        EXPECT_EQ(c, locale.code);
    });
}

TEST(MultibyteLocale, ReturnsAfterTheOuterScopeOfPlainBytes) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        const auto written = [](wchar_t character) {
            std::ostringstream stream;
            QrOutBuffer out(&stream);
            out.writeChar(character);
            return stream.str();
        };
        EXPECT_EQ(written(locale.code), locale.character);
        {
            const PlainBytes outer;
            {
                const PlainBytes inner;
                EXPECT_EQ(written(L'\u00E4'), "\xE4");
            }
            EXPECT_EQ(written(L'\u00E4'), "\xE4");
        }
        EXPECT_EQ(written(locale.code), locale.character);
    });
}

TEST(SingleByteLocale, IsLeftToTheCLibrary) {
    const std::vector<SingleByteLocale> locales = singleByteLocales();
    if (locales.empty())
        GTEST_SKIP() << "the C runtime has no single-byte locale except C and POSIX";
    for (const SingleByteLocale& locale : locales) {
        const LocaleGuard guard(locale.name);
        std::istringstream stream(std::string{locale.byte});
        QrInBuffer in(&stream);
        wchar_t c;
        EXPECT_EQ(in.readChar(c), 1);
        EXPECT_EQ(c, locale.code);
        std::ostringstream written;
        QrOutBuffer out(&written);
        out.writeChar(locale.code);
        EXPECT_EQ(written.str(), std::string{locale.byte});
    }
}

// ---- The converter alone --------------------------------------------------------------------

TEST(CharacterConverter, IsPlainInTheCLocale) {
    const platform::CharacterConverter converter;
    EXPECT_TRUE(converter.plainBytes());
    wchar_t c = L'x';
    EXPECT_EQ(converter.decode("", c), -1);
    EXPECT_EQ(converter.decode(std::string_view("\0a", 2), c), 0);
    EXPECT_EQ(converter.decode("\xFF", c), 1);
    EXPECT_EQ(c, static_cast<wchar_t>(0xFF));
    char bytes[platform::maximumCharacterBytes];
    EXPECT_EQ(converter.encode(static_cast<wchar_t>(0xFF), bytes), 1);
    EXPECT_EQ(converter.encode(static_cast<wchar_t>(0x100), bytes), -1);
    EXPECT_EQ(converter.encode(L'\0', bytes), 1);
}

TEST(CharacterConversion, OfWholeTextsIsReversibleInTheCLocale) {
    std::string all;
    for (int byte = 0; byte < 256; ++byte)
        all += static_cast<char>(byte);
    const auto wide = platform::toCharacters(all);
    ASSERT_TRUE(wide);
    EXPECT_EQ(wide->size(), 256u);
    EXPECT_EQ(platform::toBytes(*wide), all);
    EXPECT_FALSE(platform::toBytes(std::wstring{L'a', static_cast<wchar_t>(0x100)}));
}

TEST(CharacterConversion, RefusesWhatHasNoForm) {
    inEveryMultibyteLocale([](const MultibyteLocale& locale) {
        EXPECT_FALSE(platform::CharacterConverter().plainBytes());
        EXPECT_EQ(platform::toCharacters("a" + locale.character),
                  (std::wstring{L'a', locale.code}));
        EXPECT_FALSE(platform::toCharacters(locale.noText));
        EXPECT_FALSE(platform::toCharacters(locale.character.substr(0, 1)));
        EXPECT_FALSE(platform::toBytes(std::wstring{locale.codeWithoutForm}));
    });
}

} // namespace
