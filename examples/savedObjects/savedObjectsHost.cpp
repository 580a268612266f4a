// SPDX-License-Identifier: BSL-1.0
/// The host: makes a few objects that share others, saves them in binary and as text, loads them
/// again, and shows that what was shared is shared again. Then it loads a damaged file.
#include "person.h"

#include "components/componentKit/hostKit.h"
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"

#include <fstream>
#include <iostream>
#include <vector>

using namespace Mz;

namespace {

/// Replaces the content of `file` by `object` and all objects that it refers to, or leaves it.
template <class Stream>
void save(const std::filesystem::path& file, QrCastable& object) {
    replaceFile(file, [&](std::ostream& out) {
        QrOutBuffer bytes(&out);
        QrObjectOutBuffer objects(&bytes);
        Stream stream(&objects);
        stream << &object;
    });
}

/// Returns the person in `file`.
///
/// \throws QrStreamEx  if there is no such file, or nothing but a person in it
template <class Stream>
QrPtr<Person> load(const std::filesystem::path& file) {
    std::vector<char> memory(64 * 1024); // Few system calls; the default on Windows has 512 bytes.
    std::ifstream in;
    in.rdbuf()->pubsetbuf(memory.data(), static_cast<std::streamsize>(memory.size()));
    in.open(file, std::ios::binary);
    if (!in)
        throw QrStreamEx::ExReadOpen("savedObjectsHost", __LINE__, utf8Name(file).c_str());
    QrInBuffer bytes(&in);
    QrObjectInBuffer objects(&bytes);
    Stream stream(&objects);
    const QrRef<QrCastable> object = stream.readObject(&Person::uid, nullptr, nullptr);
    QrPostLoadList list; // Notifies the objects that asked for it.
    stream.transfer(list);
    list.loadFinished();
    return queryCast<Person>(object.get());
}

QrPtr<Person> person(const wchar_t* name, unsigned int born) {
    const QrPtr<Person> made = Kit::create<Person>(personUid);
    if (!made)
        throw std::runtime_error("no component makes persons");
    made->name = name;
    made->born = born;
    return made;
}

void print(const char* kind, const Person& family) {
    std::cout << kind << ":\n";
    for (const QrPtr<Person>& parent : family.children) {
        std::cout << "  " << toNarrow(parent->name, '?') << ", born " << parent->born << '\n';
        for (const QrPtr<Person>& child : parent->children)
            std::cout << "    child: " << toNarrow(child->name, '?') << '\n';
    }
    const bool shared = family.children[0]->children[0] == family.children[1]->children[0];
    std::cout << (shared ? "  both have the same child\n" : "  the children differ\n");
}

void run() {
    const QrPtr<Person> ada = person(L"Ada", 1990);
    const QrPtr<Person> ben = person(L"Ben", 1988);
    const QrPtr<Person> family = person(L"the family", 0);
    ada->children = ben->children = {person(L"Cleo", 2020)};
    family->children = {ada, ben};

    save<QrBinaryStream>("family.bin", *family->getCastable());
    save<QrTextStream>("family.txt", *family->getCastable());
    print("binary", *load<QrBinaryStream>("family.bin"));
    print("text", *load<QrTextStream>("family.txt"));

    std::filesystem::resize_file("family.bin", 100);
    try {
        load<QrBinaryStream>("family.bin");
    } catch (const QrStreamEx& damage) {
        std::cout << "damaged:\n  " << damage.getReason() << '\n';
    }
}

} // namespace

int main() {
    Kit::initialize(Kit::programFolder() / "components");
    try {
        run();
    } catch (const std::exception& failure) {
        std::cerr << toNarrow(displayText(failure.what()), '?') << '\n';
        return 1;
    }
}
