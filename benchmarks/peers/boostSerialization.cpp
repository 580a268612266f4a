// SPDX-License-Identifier: BSL-1.0
// Boost.Serialization: its binary and its text archive on standard streams, and objects by shared
// pointers to a polymorphic base, which it tracks.
#include "measure.h"
#include "objects/graph.h"
#include "peers/registration.h"
#include "peers/values.h"

#include <boost/archive/binary_iarchive.hpp>
#include <boost/archive/binary_oarchive.hpp>
#include <boost/archive/text_iarchive.hpp>
#include <boost/archive/text_oarchive.hpp>
#include <boost/serialization/base_object.hpp>
#include <boost/serialization/export.hpp>
#include <boost/serialization/shared_ptr.hpp>
#include <boost/serialization/vector.hpp>
#include <fstream>
#include <memory>

namespace Mz::Benchmarks::Boost {

struct Node {
    virtual ~Node() = default;

    template <class Archive>
    void serialize(Archive&, unsigned int) {}
};

struct StoredNode final : Node {
    int number = 0;
    double value = 0;
    std::shared_ptr<Node> link;

    template <class Archive>
    void serialize(Archive& archive, unsigned int) {
        archive& boost::serialization::base_object<Node>(*this);
        archive& number& value& link;
    }
};

} // namespace Mz::Benchmarks::Boost

BOOST_CLASS_EXPORT_GUID(Mz::Benchmarks::Boost::StoredNode, "node")

namespace Mz::Benchmarks {

namespace {

using boost::archive::binary_iarchive;
using boost::archive::binary_oarchive;
using boost::archive::text_iarchive;
using boost::archive::text_oarchive;

using Nodes = std::vector<std::shared_ptr<Boost::Node>>;

const Nodes& nodes() {
    static const Nodes made = [] {
        Nodes result;
        for (const NodeContent& content : graph()) {
            const auto node = std::make_shared<Boost::StoredNode>();
            node->number = content.number;
            node->value = content.value;
            if (content.link >= 0)
                node->link = result[static_cast<std::size_t>(content.link)];
            result.push_back(node);
        }
        return result;
    }();
    return made;
}

template <class Output>
void save(const std::string& path) {
    std::ofstream file(path, std::ios::binary);
    Output archive(file);
    archive << nodes();
}

template <class Input>
Nodes load(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    Input archive(file);
    Nodes loaded;
    archive >> loaded;
    return loaded;
}

template <class Input>
bool isSaved(const std::string& path) {
    const Nodes loaded = load<Input>(path);
    return loaded.size() == nodeCount && isGraph([&](std::size_t index) {
               const auto& node = static_cast<const Boost::StoredNode&>(*loaded[index]);
               const std::ptrdiff_t expected = graph()[index].link;
               const bool right =
                   expected >= 0 && node.link == loaded[static_cast<std::size_t>(expected)];
               return NodeContent{node.number, node.value, !node.link ? -1 : right ? expected : -2};
           });
}

template <class Output, class Input>
void saveObjects(benchmark::State& state) {
    nodes();
    measureSaving(state, save<Output>, isSaved<Input>);
}

template <class Output, class Input>
void loadObjects(benchmark::State& state) {
    nodes();
    measureLoading(state, save<Output>, load<Input>, isSaved<Input>);
}

/// Values alone need neither the header nor the separate locale of an archive.
constexpr unsigned int plain = boost::archive::no_header | boost::archive::no_codecvt;

template <class T>
void writeAll(std::ostream& out, const std::vector<T>& values) {
    binary_oarchive archive(out, plain);
    for (const T& value : values)
        *opaque(&archive) << value;
}

template <class T>
void write(benchmark::State& state) {
    writeBinaryOfPeer<T>(state, writeAll<T>);
}

template <class T>
void read(benchmark::State& state) {
    std::ostringstream out;
    writeAll(out, randomValues<T>(valueCount));
    readBinaryOfPeer<T>(state, out.str(), [](std::istream& in, std::vector<T>& values) {
        binary_iarchive archive(in, plain);
        for (T& value : values)
            *opaque(&archive) >> value;
    });
}

template <class T>
void writeVector(std::ostream& out, const std::vector<T>& values) {
    binary_oarchive archive(out, plain);
    archive << values;
}

template <class T>
void writeArray(benchmark::State& state) {
    writeBinaryOfPeer<T>(state, writeVector<T>, arrayCount);
}

template <class T>
void readArray(benchmark::State& state) {
    std::ostringstream out;
    writeVector(out, randomValues<T>(arrayCount));
    const auto work = [](std::istream& in, std::vector<T>& values) {
        binary_iarchive archive(in, plain);
        archive >> values;
    };
    readBinaryOfPeer<T>(state, out.str(), work, arrayCount);
}

template <class T>
void addBinary(RatioTable& table, const std::string& type) {
    const std::string name = "Boost.Serialization";
    table.addPeer("binary/" + type + "Write", name, write<T>);
    table.addPeer("binary/" + type + "Read", name, read<T>);
    table.addPeer("binary/" + type + "ArrayWrite", name, writeArray<T>);
    table.addPeer("binary/" + type + "ArrayRead", name, readArray<T>);
}

void addPeer(RatioTable& table) {
    addBinary<int>(table, "int");
    addBinary<double>(table, "double");
    const std::string name = "Boost.Serialization";
    table.addPeer("objects/save", name, saveObjects<binary_oarchive, binary_iarchive>);
    table.addPeer("objects/load", name, loadObjects<binary_oarchive, binary_iarchive>);
    table.addPeer("objects/textSave", name, saveObjects<text_oarchive, text_iarchive>);
    table.addPeer("objects/textLoad", name, loadObjects<text_oarchive, text_iarchive>);
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
