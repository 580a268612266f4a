// SPDX-License-Identifier: BSL-1.0
// Tests the forms of values inside objects: each is read back exactly, or writing it throws.
#include "tests/objects/support.h"

namespace {

using namespace Mz;
using namespace Mz::Test;
using testing::HasSubstr;

template <class Stream>
class Form : public ObjectsOn<Stream> {
  protected:
    static constexpr bool isText = std::is_same_v<Stream, QrTextStream>;
    static constexpr bool isBinary = std::is_same_v<Stream, QrBinaryStream>;

    static QrPtr<Node> spelled(const std::wstring& name) {
        QrPtr<Node> result = Objects::make(spelledUid);
        result->name = name;
        return result;
    }

    /// Returns the reason why the object cannot be written, or "".
    static std::string refusal(const std::wstring& name) {
        try {
            saved<Stream>(spelled(name).get());
        } catch (const QrStreamEx::ExWriteError& failure) {
            return failure.getReason();
        }
        return {};
    }

    static void expectComesBack(const std::wstring& name) {
        SCOPED_TRACE(std::string(name.begin(), name.end()));
        const QrPtr<Node> object = spelled(name);
        const QrPtr<Node> around = Objects::make(holderUid);
        around->links = {object, Objects::node(5), object};
        try {
            Loading<Stream> in(saved<Stream>(around.get()));
            const QrPtr<Node> read = in.node();
            in.finish();
            ASSERT_EQ(read->links.size(), 3U);
            EXPECT_EQ(read->links[0]->name, name);
            EXPECT_EQ(read->links[1]->number, 5);
        } catch (const ExBase& failure) {
            ADD_FAILURE() << failure.getReason();
        }
    }

    /// Returns whether each piece of formatted text can be told from its neighbours.
    static bool isSeparated(const std::wstring& name) {
        for (std::size_t at = 1; at < name.size(); ++at) {
            const bool open = name[at - 1] == L'f' || name[at - 1] == L'l';
            if (!isBinary && open && (name[at] == L'f' || name[at] == L'g'))
                return false;
            const bool isData = std::wstring(L"ICBWS").find(name[at]) != std::wstring::npos;
            if (!isBinary && !isText && name[at - 1] == L'g' && isData)
                return false;
        }
        return true;
    }
};
TYPED_TEST_SUITE(Form, StreamKinds);

TYPED_TEST(Form, OfEveryValueNextToEveryOtherComesBackOrIsRefused) {
    // Binary data does not mark the end of formatted text.
    const std::wstring letters = this->isBinary ? L"idbeoICBWS"
                                 : this->isText ? L"idbeofglICB"
                                                : L"idbeofglICBWS";
    for (const wchar_t first : letters)
        for (const wchar_t second : letters)
            for (const wchar_t third : letters) {
                const std::wstring name{first, second, third};
                if (this->isSeparated(name))
                    this->expectComesBack(name);
                else
                    EXPECT_THAT(this->refusal(name), HasSubstr("formatted text"));
                if (testing::Test::HasFailure())
                    return;
            }
}

TYPED_TEST(Form, OfFormattedTextAtTheEndOfAnObjectComesBack) {
    this->expectComesBack(L"f");
    this->expectComesBack(L"l");
    this->expectComesBack(L"if");
}

TYPED_TEST(Form, IsTheSameWithFormattedTextThatIsEmpty) {
    const auto bytes = [](bool withEmptyText) {
        Scripted object(nodeUid, 2, [&](QrStream& s) {
            const auto writeNothing = [&] {
                if (withEmptyText) {
                    EXPECT_EQ(s.formattedWrite(L""), 0);
                }
            };
            writeNothing();
            s.formattedWrite(L"%d,", 3);
            writeNothing();
            s << 5;
            writeNothing();
            s << true;
        });
        return saved<TypeParam>(&object);
    };
    EXPECT_EQ(bytes(true), bytes(false));
}

TYPED_TEST(Form, HasNoBlankBeforeFormattedTextThatBeginsWithOne) {
    Scripted parts(nodeUid, 2, [](QrStream& s) {
        s.formattedWrite(L"%d", 3);
        s.formattedWrite(L" %d", 4);
    });
    Scripted whole(nodeUid, 2, [](QrStream& s) { s.formattedWrite(L"3 4"); });
    EXPECT_EQ(saved<TypeParam>(&parts), saved<TypeParam>(&whole));
}

TYPED_TEST(Form, ThatHasNoWayBackIsRefusedWhenItIsWritten) {
    EXPECT_THAT(this->refusal(L"w"), HasSubstr("never read back"));
    if (!this->isBinary) {
        EXPECT_THAT(this->refusal(L"s"), HasSubstr("use QrWriteExactText"));
        EXPECT_THAT(this->refusal(L"n"), HasSubstr("formatted text has the word \"inf\""));
    }
    if (this->isText) {
        EXPECT_THAT(this->refusal(L"S"), HasSubstr("use QrWriteExactText"));
        EXPECT_THAT(this->refusal(L"W"), HasSubstr("never read back"));
    }
}

TEST_F(Objects, HaveTheseBytesOnAMixedStreamOnEveryPlatform) {
    Scripted object(nodeUid, 2, [](QrStream& s) {
        const short values[] = {1, 2};
        s << 7;
        s.write(values[0], 2);
        s << true;
        s.write(values[1], 1);
        s.formattedWrite(L"%d,%d", 3, 4);
    });
    Saving<BaseStream> out;
    out.stream << &object;
    EXPECT_EQ(out.bytes(), std::string("1 979180561 2116767513 2982545965 1437209089 2 7\n"
                                       "\0\1\0\2"
                                       "1\n"
                                       "\0\2"
                                       "3,4 1162822219",
                                       71));
}

TEST_F(Objects, OnAMixedStreamDemandTheLineEndBeforeBinaryData) {
    const QrRef<QrCastable> made = QrGetComponentManager()->createObject(spelledUid);
    const QrPtr<Node> object = queryCast<Node>(made.get());
    object->name = L"iI";
    std::string bytes = saved<BaseStream>(object.get());
    const std::size_t lineEnd = bytes.find("42\n");
    ASSERT_NE(lineEnd, std::string::npos);
    bytes[lineEnd + 2] = ' ';
    Loading<BaseStream> in(bytes);
    EXPECT_THAT(readFailure([&] { in.object(); }),
                HasSubstr("binary data after text begins on a new line"));
}

TEST_F(Objects, LeaveTheValuesBetweenThemAsTheStreamWritesThem) {
    Saving<BaseStream> out;
    const int number = 0x31323334;
    out.stream << static_cast<const QrCastable*>(nullptr);
    out.stream.formattedWrite(L"%s", L"a");
    out.stream.formattedWrite(L"%s", L"inf");
    out.stream.write(number, 1);
    out.stream << std::wstring(L"x") << L'7';
    EXPECT_EQ(out.bytes(), "0 1162822218 ainf1234"
                           "1 x55");
}

/// Writes and reads each single `unsigned int` with all bits inverted.
class Inverting final : public QrBinaryStream {
  public:
    using QrBinaryStream::QrBinaryStream;
    using QrBinaryStream::operator<<;
    using QrBinaryStream::operator>>;

    QrStream& operator<<(unsigned int value) override { return QrBinaryStream::operator<<(~value); }
    QrStream& operator>>(unsigned int& value) override {
        QrBinaryStream::operator>>(value);
        value = ~value;
        return *this;
    }
};

TEST_F(Objects, OnADerivedStreamAreReadAsThatStreamWroteThem) {
    const QrPtr<Node> object = node(7, {node(8)});
    const std::string bytes = saved<Inverting>(object.get());
    EXPECT_EQ(bytes.substr(0, 4), "\xFF\xFF\xFF\xFE"); // The number of the first object.
    Loading<Inverting> in(bytes);
    const QrPtr<Node> read = in.node();
    in.finish();
    expectEqual(*read, *object);
}

} // namespace
