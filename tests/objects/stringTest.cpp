// SPDX-License-Identifier: BSL-1.0
// Tests strings inside objects: they are read back exactly, or writing them throws.
#include "tests/objects/support.h"

#include "tests/streams/support.h"
#include "tests/unit/locales.h"

#include <bit>
#include <climits>
#include <limits>
#include <random>

namespace {

using namespace Mz;
using namespace Mz::Test;
using testing::HasSubstr;

class Strings : public Objects {
  protected:
    static QrPtr<Node> string(std::wstring text) {
        QrPtr<Node> result = make(stringUid);
        result->number = 6;
        result->name = std::move(text);
        return result;
    }

    template <class Stream>
    static std::wstring through(const std::wstring& text) {
        Loading<Stream> in(saved<Stream>(string(text).get()));
        const QrPtr<Node> read = in.node();
        EXPECT_EQ(read->number, 6);
        return read->name;
    }

    template <class Stream>
    static std::string refusal(const std::wstring& text) {
        Saving<Stream> out;
        const QrPtr<Node> object = string(text);
        try {
            out.stream << object.get();
        } catch (const QrStreamEx::ExWriteError& failure) {
            EXPECT_THROW(out.stream << object.get(), QrStreamEx::ExWriteObject);
            return failure.getReason();
        }
        ADD_FAILURE() << "the string was written";
        return {};
    }
};

TEST_F(Strings, AreExactInBinary) {
    std::wstring every;
    for (wchar_t c = 1; c < 256; ++c)
        every += c;
    for (const std::wstring& text : {std::wstring(), std::wstring(L" a\r\n b "), every})
        EXPECT_EQ(through<QrBinaryStream>(text), text);
    EXPECT_EQ(through<QrBinaryStream>(std::wstring(200000, L'x')), std::wstring(200000, L'x'));
}

TEST_F(Strings, WithANulAreRefusedInEveryForm) {
    EXPECT_THAT(refusal<QrBinaryStream>(std::wstring(L"a\0b", 3)), HasSubstr("a NUL in it"));
    EXPECT_THAT(refusal<QrTextStream>(std::wstring(L"1\0"
                                                   L"2",
                                                   3)),
                HasSubstr("exactly"));
}

TEST_F(Strings, AreRefusedInText) {
    EXPECT_THAT(refusal<QrTextStream>(L"word"), HasSubstr("exactly"));
    EXPECT_THAT(refusal<QrTextStream>(L"1 2"), HasSubstr("exactly"));
    EXPECT_EQ(through<QrTextStream>(L""), L"");
}

TEST_F(Strings, NumbersThatTextCannotCarryAreRefusedLikewise) {
    constexpr double infinity = std::numeric_limits<double>::infinity();
    for (const double value : {infinity, -infinity, std::numeric_limits<double>::quiet_NaN()}) {
        const QrPtr<Node> object = node(1);
        object->weight = value;
        Saving<QrTextStream> out;
        EXPECT_THROW(out.stream << object.get(), QrStreamEx::ExWriteError);
        Loading<QrBinaryStream> in(saved<QrBinaryStream>(object.get()));
        EXPECT_EQ(std::bit_cast<std::uint64_t>(in.node()->weight),
                  std::bit_cast<std::uint64_t>(value));
    }
    for (const double value : {1e300, -1e-300, 5e-324, -0.0}) {
        const QrPtr<Node> object = node(1);
        object->weight = value;
        Loading<QrTextStream> in(saved<QrTextStream>(object.get()));
        EXPECT_EQ(std::bit_cast<std::uint64_t>(in.node()->weight),
                  std::bit_cast<std::uint64_t>(value));
    }
}

TEST_F(Strings, ThatLookLikeNumbersAreRefusedInTextAsWell) {
    EXPECT_THAT(refusal<QrTextStream>(L"123"), HasSubstr("exactly"));
    // No writer writes this, but a file can contain it.
    Scripted byHand(stringUid, 1, [](QrStream& s) { s << 6 << 3 << 123 << 6; });
    Loading<QrTextStream> in(saved<QrTextStream>(&byHand));
    EXPECT_THAT(readFailure([&] { in.object(); }),
                HasSubstr("a text stream cannot carry strings exactly"));
}

TEST_F(Strings, OfFormattedTextHaveNoWordForAnInfiniteNumber) {
    const auto object = [](const wchar_t* text) {
        return Scripted(nodeUid, 1, [text](QrStream& s) { s.formattedWrite(L"%s", text); });
    };
    for (const wchar_t* text :
         {L"inf",  L"nan",  L"INF",  L"NaN",  L"-inf", L"inf ",  L"a inf b", L"(nan)",
          L"@inf", L"[inf", L"`inf", L"{inf", L"/inf", L":inf",  L"^inf",    L"inf@",
          L"nan[", L"inf`", L"nan{", L"inf/", L"nan:", L"x,inf", L"info nan"}) {
        const Scripted refused = object(text);
        EXPECT_THROW(saved<QrTextStream>(&refused), QrStreamEx::ExWriteError)
            << testing::PrintToString(text);
        EXPECT_NO_THROW(saved<QrBinaryStream>(&refused)) << testing::PrintToString(text);
    }
    for (const wchar_t* text :
         {L"info", L"ainf", L"zinf", L"Ainf", L"Zinf", L"0inf", L"9inf", L"_inf", L"inf_", L"nan0",
          L"nan9", L"nanz", L"in", L"na", L"nann"}) {
        const Scripted accepted = object(text);
        EXPECT_NO_THROW(saved<QrTextStream>(&accepted)) << testing::PrintToString(text);
    }
}

TEST_F(Strings, OutsideTheLocaleAreRefused) {
    // In the "C" locale a character is one byte.
    EXPECT_THAT(refusal<QrBinaryStream>(L"a\x100"), HasSubstr("Error writing stream."));
    EXPECT_THAT(refusal<QrBinaryStream>(L"\x20AC"), HasSubstr("Error writing stream."));
}

TEST_F(Strings, OfOtherLocalesAreExactInThem) {
    for (const MultibyteLocale& locale : multibyteLocales()) {
        SCOPED_TRACE(locale.name);
        const LocaleGuard guard(locale.name);
        ASSERT_TRUE(guard);
        const std::wstring text = std::wstring(L"<") + locale.code + L">";
        EXPECT_EQ(through<QrBinaryStream>(text), text);
        EXPECT_THAT(refusal<QrBinaryStream>(std::wstring(1, locale.codeWithoutForm)),
                    HasSubstr("Error writing stream."));
    }
}

/// Some locales replace a character by a similar one. Such a character must be refused.
TEST_F(Strings, WithCharactersThatTheLocaleChangesAreRefused) {
    std::vector<std::string> names{"C"};
    for (const MultibyteLocale& locale : multibyteLocales())
        names.emplace_back(locale.name);
    for (const SingleByteLocale& locale : singleByteLocales())
        names.emplace_back(locale.name);
    // Yen sign and overline have the places of the backslash and the tilde.
    if (LocaleGuard("ja_JP.SHIFT_JIS"))
        names.emplace_back("ja_JP.SHIFT_JIS");
    std::wstring characters = L"\x100\x221E\x2212\xE9\xFF01\x2018\xA0\xA5\x203E\xFF3C";
    for (wchar_t ascii = 1; ascii < 0x80; ++ascii)
        characters += ascii;
    for (const std::string& name : names) {
        const LocaleGuard guard(name.c_str());
        ASSERT_TRUE(guard);
        for (const wchar_t character : characters)
            try {
                const std::wstring text(1, character);
                EXPECT_EQ(through<QrBinaryStream>(text), text)
                    << name << ' ' << static_cast<unsigned int>(character);
            } catch (const QrStreamEx::ExWriteError&) {
                continue; // Refused.
            }
    }
}

TEST_F(Strings, ArraysOfCharactersAreExactInBinaryAndRefusedInText) {
    for (const wchar_t character : {L'\7', L'\t', L'a', L'z'}) {
        const QrPtr<Node> object = make(wideUid);
        object->name = {character, L'b'};
        Loading<QrBinaryStream> binary(saved<QrBinaryStream>(object.get()));
        EXPECT_EQ(binary.node()->name, object->name);
        Saving<QrTextStream> out;
        EXPECT_THROW(out.stream << object.get(), QrStreamEx::ExWriteError);
        // No writer writes this, but a file can contain it.
        Scripted byHand(wideUid, 1, [&](QrStream& s) { s << static_cast<int>(character) << 8; });
        Loading<QrTextStream> text(saved<QrTextStream>(&byHand));
        EXPECT_THAT(readFailure([&] { text.object(); }),
                    HasSubstr("a text stream cannot carry arrays of characters"));
    }
}

TEST_F(Strings, ClaimedByAHostileFileAreNotFilledWithNuls) {
    Saving<QrBinaryStream> out;
    out.stream << 1U << stringUid << 1U << 6 << 1000 << 0;
    Loading<QrBinaryStream> in(out.bytes());
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("a string has a NUL in it"));
}

TEST_F(Strings, OutsideOfObjectsWithANulAreRefusedToo) {
    Saving<QrBinaryStream> out;
    EXPECT_THROW(out.stream << std::wstring(1, L'\0'), QrStreamEx::ExWriteError);
    Loading<QrBinaryStream> in(fromHex("00 00 00 01 00"));
    std::wstring text;
    EXPECT_THROW(in.stream >> text, QrStreamEx::ExReadError);
}

TEST_F(Strings, OfTextOutsideOfObjectsAreWhatTheStreamMakesOfThem) {
    Saving<QrTextStream> out;
    out.stream << std::wstring(L"a b");
    EXPECT_EQ(out.bytes(), "3 a b");
    Loading<QrTextStream> in(out.bytes());
    std::wstring text;
    in.stream >> text;
    EXPECT_EQ(text, L" a ");
}

TEST_F(Strings, BoolsInTextAreZeroOrOne) {
    Scripted outer(nodeUid, 3, [](QrStream& s) {
        s << 1;
        QrWriteExactText(s, L"");
        s << 7;
    });
    Loading<QrTextStream> in(saved<QrTextStream>(&outer));
    EXPECT_THAT(readFailure([&] { in.object(); }), HasSubstr("a bool is neither 0 nor 1"));
}

template <class Stream>
class ExactText : public ObjectsOn<Stream> {
  protected:
    static std::wstring through(const std::wstring& text) {
        const QrPtr<Node> object = Objects::node(1);
        object->name = text;
        Loading<Stream> in(saved<Stream>(object.get()));
        const QrPtr<Node> read = in.node();
        return read ? read->name : L"";
    }
};
TYPED_TEST_SUITE(ExactText, StreamKinds);

TYPED_TEST(ExactText, ComesBackWhateverItHolds) {
    const std::wstring texts[] = {L"",
                                  L" ",
                                  L"\r\n",
                                  std::wstring(3, L'\0'),
                                  std::wstring(L"a\0 b", 4),
                                  L"12 34",
                                  L"\x20AC \xFFFF \xFEFF",
                                  L"\U0001F600 \U0010FFFF",
                                  std::wstring(1, wchar_t(0xD83D)),
                                  std::wstring(1, wchar_t(0xDE00)),
                                  std::wstring({wchar_t(0xDE00), wchar_t(0xD83D)}),
                                  std::wstring(1, static_cast<wchar_t>(WCHAR_MAX)),
                                  std::wstring(5000, L'\x4E00')};
    for (const std::wstring& text : texts)
        EXPECT_EQ(this->through(text), text);
}

TYPED_TEST(ExactText, OfRandomCharactersComesBack) {
    std::mt19937 random(4711);
    for (int round = 0; round < 300; ++round) {
        std::wstring text(random() % 40, L'\0');
        for (wchar_t& c : text)
            c = static_cast<wchar_t>(random() >> random() % 32);
        // Leave out surrogates: where wchar_t has 16 bits, two of them are one character.
        for (wchar_t& c : text)
            if ((static_cast<std::uint32_t>(c) & 0xF800U) == 0xD800)
                c = L'x';
        EXPECT_EQ(this->through(text), text);
    }
}

TEST_F(Strings, ExactTextHasTheseBytesOnEveryPlatform) {
    const std::wstring text = L"a\u20AC\U0001F600";
    EXPECT_EQ(toHex(written<QrBinaryStream>([&](QrStream& s) { QrWriteExactText(s, text); })),
              "00 00 00 03 00 00 00 61 00 00 20 AC 00 01 F6 00");
    EXPECT_EQ(written<QrTextStream>([&](QrStream& s) { QrWriteExactText(s, text); }),
              "3 97 8364 128512");
    Reading<QrTextStream> in("3 97 8364 128512");
    EXPECT_EQ(QrReadExactText(in.stream), text);
}

TEST_F(Strings, ExactTextThatIsCutIsAnError) {
    const std::string bytes =
        written<QrBinaryStream>([](QrStream& s) { QrWriteExactText(s, L"abc"); });
    for (std::size_t length = 0; length < bytes.size(); ++length) {
        Reading<QrBinaryStream> in(bytes.substr(0, length));
        EXPECT_THROW(QrReadExactText(in.stream), QrStreamEx::ExReadError);
    }
    Reading<QrBinaryStream> claim("\xFF\xFF\xFF\xFF\0\0");
    EXPECT_THROW(QrReadExactText(claim.stream), QrStreamEx::ExReadError);
}

TEST_F(Strings, ExactTextWithACharacterThatIsTooWideIsAnErrorWhereItIs) {
    Reading<QrTextStream> in("1 1114112");
    if constexpr (sizeof(wchar_t) == 2)
        EXPECT_THROW(QrReadExactText(in.stream), QrStreamEx::ExReadError);
    else
        EXPECT_EQ(QrReadExactText(in.stream), std::wstring(1, static_cast<wchar_t>(0x110000)));
}

} // namespace
