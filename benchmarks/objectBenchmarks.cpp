// SPDX-License-Identifier: BSL-1.0
// Graphs of objects in files, compared with the same graph saved and loaded by hand: a virtual call
// for each object, a number for each object that is referred to, and each value through the
// stream's buffer.
#include "comparisons.h"
#include "manager.h"

#include "objects/graph.h"
#include "objects/node.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/textStream.h"
#include "components/objectIO/objectIO.h"

#include <charconv>
#include <cstdint>
#include <cstring>
#include <fstream>
#include <memory>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <unordered_map>
#include <vector>

namespace Mz::Benchmarks {

namespace {

// ---- With the library -----------------------------------------------------------------------

using Nodes = std::vector<QrPtr<Node>>;

const Nodes& nodes() {
    static const Nodes made = [] {
        const auto builder = initializedManager()->getBuilder(storedNodeUid);
        if (!builder)
            throw std::runtime_error("the component of the nodes is not known");
        Nodes result;
        for (const NodeContent& content : graph()) {
            const QrRef<QrCastable> object = builder->createObject();
            Node* const link =
                content.link < 0 ? nullptr : result[static_cast<std::size_t>(content.link)].get();
            result.push_back(queryCast<Node>(object.get()));
            result.back()->set(content.number, content.value, link);
        }
        return result;
    }();
    return made;
}

template <class Stream>
void save(const std::string& path) {
    std::ofstream file(path, std::ios::binary);
    QrOutBuffer bytes(&file);
    QrObjectOutBuffer objects(&bytes);
    Stream stream(&objects);
    stream << static_cast<int>(nodes().size());
    for (const QrPtr<Node>& node : nodes())
        stream << node.get();
    file.flush();
}

template <class Stream>
Nodes load(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    QrInBuffer bytes(&file);
    QrObjectInBuffer objects(&bytes);
    Stream stream(&objects);
    int count = 0;
    stream >> count;
    Nodes result;
    for (int index = 0; index < count; ++index) {
        const QrRef<QrCastable> object = stream.readObject(&Node::uid, nullptr, nullptr);
        result.push_back(queryCast<Node>(object.get()));
    }
    return result;
}

/// Returns whether `loaded` is the graph: content and links, to the very objects.
template <class Loaded>
bool isWhole(const Loaded& loaded) {
    return loaded.size() == nodeCount && isGraph([&](std::size_t index) {
               NodeContent content{loaded[index]->number(), loaded[index]->value(), -1};
               const std::ptrdiff_t expected = graph()[index].link;
               const auto* const link = loaded[index]->link();
               if (link)
                   content.link =
                       expected >= 0 && link == loaded[static_cast<std::size_t>(expected)].get()
                           ? expected
                           : -2;
               return content;
           });
}

template <class Stream>
bool isSaved(const std::string& path) {
    return isWhole(load<Stream>(path));
}

template <class Stream>
void saveObjects(benchmark::State& state) {
    nodes();
    measureSaving(state, save<Stream>, isSaved<Stream>);
}

template <class Stream>
void loadObjects(benchmark::State& state) {
    nodes();
    measureLoading(state, save<Stream>, load<Stream>, isSaved<Stream>);
}

// ---- By hand --------------------------------------------------------------------------------

/// Writes values in binary form, most significant byte first.
class BinaryOutput {
  public:
    explicit BinaryOutput(std::streambuf* target) : buffer(target) {}

    void put(std::uint32_t value) {
        value = __builtin_bswap32(value);
        buffer->sputn(reinterpret_cast<const char*>(&value), sizeof value);
    }
    void put(double value) {
        std::uint64_t bits;
        std::memcpy(&bits, &value, sizeof bits);
        bits = __builtin_bswap64(bits);
        buffer->sputn(reinterpret_cast<const char*>(&bits), sizeof bits);
    }

  private:
    std::streambuf* buffer;
};

class BinaryInput {
  public:
    explicit BinaryInput(std::streambuf* source) : buffer(source) {}

    void get(std::uint32_t& value) {
        buffer->sgetn(reinterpret_cast<char*>(&value), sizeof value);
        value = __builtin_bswap32(value);
    }
    void get(double& value) {
        std::uint64_t bits = 0;
        buffer->sgetn(reinterpret_cast<char*>(&bits), sizeof bits);
        bits = __builtin_bswap64(bits);
        std::memcpy(&value, &bits, sizeof value);
    }

  private:
    std::streambuf* buffer;
};

/// Writes values as text with a blank between them.
class TextOutput {
  public:
    explicit TextOutput(std::streambuf* target) : buffer(target) {}

    void put(std::uint32_t value) {
        char text[32];
        write(text, std::to_chars(text, text + sizeof text - 1, value).ptr);
    }
    void put(double value) {
        char text[32];
        write(
            text,
            std::to_chars(text, text + sizeof text - 1, value, std::chars_format::general, 16).ptr);
    }

  private:
    void write(char* text, char* end) {
        *end++ = ' ';
        buffer->sputn(text, end - text);
    }

    std::streambuf* buffer;
};

/// Reads the whole file at once.
class TextInput {
  public:
    explicit TextInput(std::streambuf* source) {
        const std::streamoff size = source->pubseekoff(0, std::ios::end);
        content.resize(static_cast<std::size_t>(size));
        source->pubseekpos(0);
        source->sgetn(content.data(), size);
        at = content.data();
    }

    template <class T>
    void get(T& value) {
        const char* const end = content.data() + content.size();
        while (at != end && *at == ' ')
            ++at;
        at = std::from_chars(at, end, value).ptr;
    }

  private:
    std::string content;
    const char* at = nullptr;
};

/// A node whose classes are known to the program, so that their identity is one number.
template <class Output, class Input>
class PlainNode {
  public:
    using Known = std::vector<std::shared_ptr<PlainNode>>;
    using Numbers = std::unordered_map<const PlainNode*, std::uint32_t>;

    virtual ~PlainNode() = default;
    virtual void save(Output& out, const Numbers& numbers) const = 0;
    virtual void load(Input& in, const Known& known) = 0;
    virtual void set(int number, double value, std::shared_ptr<PlainNode> link) = 0;
    virtual int number() const = 0;
    virtual double value() const = 0;
    virtual const PlainNode* link() const = 0;
};

template <class Output, class Input>
class SomePlainNode final : public PlainNode<Output, Input> {
  public:
    using Base = PlainNode<Output, Input>;
    using typename Base::Known;
    using typename Base::Numbers;

    void save(Output& out, const Numbers& numbers) const override {
        out.put(static_cast<std::uint32_t>(ownNumber));
        out.put(ownValue);
        out.put(ownLink ? numbers.find(ownLink.get())->second + 1 : 0);
    }
    void load(Input& in, const Known& known) override {
        std::uint32_t bits = 0, linked = 0;
        in.get(bits);
        ownNumber = static_cast<int>(bits);
        in.get(ownValue);
        in.get(linked);
        if (linked > 0 && linked <= known.size())
            ownLink = known[linked - 1];
    }
    void set(int number, double value, std::shared_ptr<Base> link) override {
        ownNumber = number;
        ownValue = value;
        ownLink = std::move(link);
    }
    int number() const override { return ownNumber; }
    double value() const override { return ownValue; }
    const Base* link() const override { return ownLink.get(); }

  private:
    int ownNumber = 0;
    double ownValue = 0;
    std::shared_ptr<Base> ownLink;
};

/// The graph of plain nodes and its file.
template <class Output, class Input>
struct ByHand {
    using Base = PlainNode<Output, Input>;
    using Known = typename Base::Known;

    static std::shared_ptr<Base> made() { return std::make_shared<SomePlainNode<Output, Input>>(); }

    static const Known& nodes() {
        static const Known all = [] {
            Known result;
            for (const NodeContent& content : graph()) {
                result.push_back(made());
                result.back()->set(
                    content.number, content.value,
                    content.link < 0 ? nullptr : result[static_cast<std::size_t>(content.link)]);
            }
            return result;
        }();
        return all;
    }

    static void save(const std::string& path) {
        std::ofstream file(path, std::ios::binary);
        Output out(file.rdbuf());
        typename Base::Numbers numbers;
        out.put(static_cast<std::uint32_t>(nodes().size()));
        for (const std::shared_ptr<Base>& node : nodes()) {
            numbers.emplace(node.get(), static_cast<std::uint32_t>(numbers.size()));
            node->save(out, numbers);
        }
        file.flush();
    }

    static Known load(const std::string& path) {
        std::ifstream file(path, std::ios::binary);
        Input in(file.rdbuf());
        std::uint32_t count = 0;
        in.get(count);
        Known known;
        for (std::uint32_t index = 0; index < count; ++index) {
            known.push_back(made());
            known.back()->load(in, known);
        }
        return known;
    }

    static bool isSaved(const std::string& path) { return isWhole(load(path)); }

    static void measureSave(benchmark::State& state) {
        nodes();
        measureSaving(state, save, isSaved);
    }
    static void measureLoad(benchmark::State& state) {
        nodes();
        measureLoading(state, save, load, isSaved);
    }
};

using BinaryByHand = ByHand<BinaryOutput, BinaryInput>;
using TextByHand = ByHand<TextOutput, TextInput>;

} // namespace

void addObjectComparisons(RatioTable& table) {
    const std::string count = "100,000 objects ";
    const std::string hand = "the same graph by hand, ";
    table.add({.name = "objects/save",
               .work = count + "to a binary file",
               .limit = hand + "one sputn for each value",
               .peerReach = 1.2},
              saveObjects<QrBinaryStream>, BinaryByHand::measureSave);
    table.add({.name = "objects/load",
               .work = count + "from a binary file",
               .limit = hand + "one sgetn for each value",
               .peerReach = 1.2},
              loadObjects<QrBinaryStream>, BinaryByHand::measureLoad);
    table.add({.name = "objects/textSave",
               .work = count + "to a text file",
               .limit = hand + "to_chars for each value",
               .peerReach = 0.4},
              saveObjects<QrTextStream>, TextByHand::measureSave);
    table.add({.name = "objects/textLoad",
               .work = count + "from a text file",
               .limit = hand + "from_chars for each value",
               .peerReach = 0.4},
              loadObjects<QrTextStream>, TextByHand::measureLoad);
}

} // namespace Mz::Benchmarks
