// SPDX-License-Identifier: BSL-1.0
// A persistent class that uses every form that a value has on a stream.
#include "components/componentKit/componentKit.h"
#include "components/objectIO/objectIO.h"
#include "tests/objects/components/classes.h"

#include <algorithm>
#include <iterator>

namespace {

using namespace Mz;
using namespace Mz::Test;

// Data that begins and ends with white space, which separates values in text.
constexpr int ints[] = {0x0A313233, -1, 0x20202020, 0x31320A0A};
constexpr char chars[] = {'\n', '1', ' ', '\n'};
constexpr bool bools[] = {true, false, true};
constexpr wchar_t wides[] = {L'\n', L'1', L'a'};
const std::wstring strings[] = {L" x\ny ", L"", L"12\n"};

template <class T, std::size_t Count>
void writeArray(QrStream& stream, const T (&values)[Count]) {
    stream.write(values[0], static_cast<int>(Count));
}

void demand(bool condition, const char* what) {
    if (!condition)
        throw QrStreamEx::ExReadError("tests/objects/objectForms", __LINE__, what);
}

template <class T, std::size_t Count>
void readArray(QrStream& stream, const T (&wanted)[Count]) {
    T values[Count]{};
    const int got = stream.read(values[0], static_cast<int>(Count));
    demand(got == static_cast<int>(Count), "an array is short");
    demand(std::equal(std::begin(values), std::end(values), std::begin(wanted)), "other values");
}

template <class T>
void readValue(QrStream& stream, const T& wanted) {
    T value{};
    stream >> value;
    demand(value == wanted, "another value");
}

void readFormatted(QrStream& stream, const wchar_t* format) {
    int first = 0;
    int second = 0;
    demand(stream.formattedRead(format, &first, &second) == 2 && first == 3 && second == -4,
           "other formatted values");
}

class Spelled final : public QrCastRef<QrCastHeap<QrCastMulti<Spelled, Node, QrPersistant>>> {
  public:
    const QrUid* getClassUid() const override { return &spelledUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override {
        QrWriteExactText(stream, name);
        for (const wchar_t letter : name)
            writeStep(stream, letter);
    }
    void read(QrStream& stream) override {
        name = QrReadExactText(stream);
        for (const wchar_t letter : name)
            readStep(stream, letter);
    }

  private:
    static void writeStep(QrStream& stream, wchar_t letter) {
        switch (letter) {
        case L'i': stream << 42; break;
        case L'd': stream << 0.5; break;
        case L'b': stream << true; break;
        case L'e': stream << std::wstring(); break;
        case L'o': stream << static_cast<const QrCastable*>(nullptr); break;
        case L'f': stream.formattedWrite(L"%d,%d", 3, -4); break;
        case L'g': stream.formattedWrite(L"<%d,%d> ", 3, -4); break;
        case L'l': stream.formattedWrite(L"\n%d%d", 3, -4); break;
        case L'I': writeArray(stream, ints); break;
        case L'C': writeArray(stream, chars); break;
        case L'B': writeArray(stream, bools); break;
        case L'W': writeArray(stream, wides); break;
        case L'S': writeArray(stream, strings); break;
        case L's': stream << std::wstring(L"123"); break;
        case L'w': stream << L'7'; break;
        case L'n': stream.formattedWrite(L"%g %G", -1.0 / 0.0, 1.0); break;
        default: break;
        }
    }
    static void readStep(QrStream& stream, wchar_t letter) {
        switch (letter) {
        case L'i': readValue(stream, 42); break;
        case L'd': readValue(stream, 0.5); break;
        case L'b': readValue(stream, true); break;
        case L'e': readValue(stream, std::wstring()); break;
        case L'o': demand(!stream.readObject(nullptr, nullptr, nullptr), "an object"); break;
        case L'f': readFormatted(stream, L"%d,%d"); break;
        case L'g': readFormatted(stream, L" <%d,%d> "); break;
        case L'l': readFormatted(stream, L"\n%d%d"); break;
        case L'I': readArray(stream, ints); break;
        case L'C': readArray(stream, chars); break;
        case L'B': readArray(stream, bools); break;
        case L'W': readArray(stream, wides); break;
        case L'S': readArray(stream, strings); break;
        case L's': readValue(stream, std::wstring(L"123")); break;
        default: demand(false, "a value that cannot be read"); break;
        }
    }
};

} // namespace

MZ_COMPONENT(L"Forms", L"", Kit::builderOf<Spelled>({.uid = spelledUid}))
