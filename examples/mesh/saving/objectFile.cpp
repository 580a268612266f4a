// SPDX-License-Identifier: BSL-1.0
/// Puts a stream on an object IO on a buffer, as docs/savedObjects.md explains. A text file ends
/// with a line end, for people and their tools. Loading checks that nothing follows the object,
/// because a longer file is not one that was saved here.
#include "objectFile.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"

#include <fstream>
#include <ostream>
#include <string>

using namespace Mz;

namespace Meshes {

namespace {

constexpr const char* source = "examples/mesh/saving/objectFile";

/// Calls `work` with a stream of the given form on `io`.
template <class Work>
void withStream(QrCastable* io, Form form, Work&& work) {
    if (form == Form::Binary) {
        QrBinaryStream stream(io);
        work(stream);
    } else {
        QrTextStream stream(io);
        work(stream);
    }
}

} // namespace

void saveObject(const std::filesystem::path& file, QrCastable& object, Form form) {
    replaceFile(file, [&](std::ostream& out) {
        QrOutBuffer bytes(&out);
        QrObjectOutBuffer objects(&bytes);
        withStream(&objects, form, [&](QrStream& stream) { stream << &object; });
        if (form == Form::Text)
            bytes.writeEol();
    });
}

QrRef<QrCastable> loadObject(const std::filesystem::path& file, const QrUid* wanted, Form form) {
    std::ifstream in(file, std::ios::binary);
    if (!in || std::filesystem::is_directory(file))
        throw QrStreamEx::ExReadOpen(source, __LINE__, utf8Name(file).c_str());
    QrInBuffer bytes(&in);
    QrObjectInBuffer objects(&bytes);
    QrRef<QrCastable> object;
    withStream(&objects, form, [&](QrStream& stream) {
        object = stream.readObject(wanted, nullptr, nullptr);
        QrPostLoadList list;
        stream.transfer(list);
        list.loadFinished();
    });
    if (form == Form::Text)
        bytes.skipWhiteSpace(1);
    const int64 end = bytes.tell();
    if (bytes.read() >= 0)
        throw QrStreamEx::ExReadObject(
            source, __LINE__, ("byte " + std::to_string(end) + ": more than one object").c_str());
    return object;
}

} // namespace Meshes
