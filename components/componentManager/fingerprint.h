// SPDX-License-Identifier: BSL-1.0
/// The fingerprint of an interface: a constant table in the file of each library and program that
/// uses the interface. `mzcomponents` compares the tables of a component and its host, without
/// running anything, and so finds an interface that was changed on one side only.
///
///     class Greeter : public Mz::QrCastable {
///       public:
///         using Self = Greeter;
///         static constexpr Mz::QrUid uid = "6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F41"_uid;
///
///         virtual const char* greeting() const = 0;
///         virtual void greet(const char* name) = 0;
///         virtual void greet(int number) = 0;
///     };
///     MZ_INTERFACE(Greeter, greeting, MZ_OPERATION(greet, void(const char*)),
///                  MZ_OPERATION(greet, void(int)))
///
/// The table contains, for each operation, its slot in the vtable, its declaration without the
/// names of parameters, and the sizes of the classes that it takes or returns by value. Its layout
/// is in `interfaceTable.h`.
///
/// \since 0.2
#pragma once

#include "components/base/export.h"
#include "components/componentManager/castable.h"
#include "components/componentManager/eachItem.h"
#include "components/componentManager/interfaceTable.h"
#include "components/componentManager/typeText.h"

#include <cstddef>
#include <cstdint>
#include <type_traits>
#include <utility>

/// Defines the fingerprint of `interface`: `MZ_INTERFACE(interface, operations...)`.
///
/// Use it beside the interface: in the same header, in the same namespace, after the class. Name
/// the class without its namespace. List the public virtual functions that it declares itself, at
/// most 64, in any order. Write an overloaded function as `MZ_OPERATION(name, signature)`, once for
/// each overload. Functions that are not listed, such as private ones, are counted.
///
/// A base that is an interface has a fingerprint itself. Another base with virtual functions, such
/// as a second one, is listed as `MZ_BASE(class)`.
///
/// The table has a few hundred bytes, once in each library and program that includes the header. No
/// code runs, and no name is exported.
#define MZ_INTERFACE(interface, ...) MZ_INTERFACE_WITH(interface, 0 __VA_OPT__(, ) __VA_ARGS__)

/// The same, for an interface that only the host implements: later versions of the host may add
/// operations at its end. The fingerprints of two versions fit if all operations that both have are
/// the same.
#define MZ_GROWING_INTERFACE(interface, ...)                                                       \
    MZ_INTERFACE_WITH(interface, Mz::interfaceGrows __VA_OPT__(, ) __VA_ARGS__)

/// An overloaded function in the list of `MZ_INTERFACE`, with its signature as in
/// `void(const char*) const noexcept`.
#define MZ_OPERATION(name, ...) (MzOperation, name, __VA_ARGS__)

/// A base in the list of `MZ_INTERFACE`. The number of its virtual functions is compared.
#define MZ_BASE(...) (MzBase, __VA_ARGS__)

/// The body of both. A class is derived from the interface that overrides each listed function,
/// which the compiler accepts only for virtual functions.
#define MZ_INTERFACE_WITH(interface, properties, ...)                                              \
    static_assert(Mz::QrInterface<interface>,                                                      \
                  #interface " is no interface: derive it from Mz::QrCastable, and give it a uid " \
                             "and a Self of its own");                                             \
    MZ_DETAIL_EACH(MZ_DETAIL_DECLARED, interface, __VA_ARGS__)                                     \
    _Pragma("GCC diagnostic push") _Pragma("GCC diagnostic ignored \"-Wsuggest-override\"") struct \
        MzListedOperationsMustBeVirtualIn##interface : interface {                                 \
        MZ_DETAIL_EACH(MZ_DETAIL_OVERRIDE, interface, __VA_ARGS__)                                 \
    };                                                                                             \
    _Pragma("GCC diagnostic pop")                                                                  \
        MZ_DETAIL_CALL(MZ_INTERFACE_TABLE, interface,                                              \
                       __LINE__) inline constinit const auto mzInterface##interface =              \
            Mz::detail::interfaceTable<interface>(                                                 \
                #interface, properties MZ_DETAIL_EACH(MZ_DETAIL_TABLED, interface, __VA_ARGS__));

/// What `MZ_INTERFACE` makes of one item. Its form is `MzName` for a name, else what it begins with
/// in parentheses. Each of the three macros has one for each form.
#define MZ_DETAIL_DECLARED(interface, item) MZ_DETAIL_OF_FORM(MZ_DETAIL_DECLARED_, interface, item)
#define MZ_DETAIL_OVERRIDE(interface, item) MZ_DETAIL_OF_FORM(MZ_DETAIL_OVERRIDE_, interface, item)
#define MZ_DETAIL_TABLED(interface, item) MZ_DETAIL_OF_FORM(MZ_DETAIL_TABLED_, interface, item)
#define MZ_DETAIL_OF_FORM(macro, interface, item)                                                  \
    MZ_DETAIL_CALL(MZ_DETAIL_JOIN(macro, MZ_DETAIL_FORM(item)), interface,                         \
                   MZ_DETAIL_JOIN(MZ_DETAIL_PARTS_, MZ_DETAIL_FORM(item))(item))

// `name`
#define MZ_DETAIL_PARTS_MzName(item) item
#define MZ_DETAIL_DECLARED_MzName(interface, name)                                                 \
    static_assert(                                                                                 \
        std::is_invocable_v<decltype([]<class T>(T*) requires requires { &T::name; } {}),          \
                            interface*>,                                                           \
        #interface " has no public function " #name ", or several: for an overloaded function "    \
                   "list MZ_OPERATION(" #name ", signature), once for each overload");             \
    static_assert(std::is_same_v<decltype(&interface::name),                                       \
                                 Mz::detail::OwnPointer<interface, decltype(&interface::name)>>,   \
                  #name " is declared by a base of " #interface ", not by itself: list the base "  \
                        "as MZ_BASE(class), unless it is an interface with a fingerprint");
#define MZ_DETAIL_OVERRIDE_MzName(interface, name)                                                 \
    MZ_DETAIL_OVERRIDE_AS(name, decltype(&interface::name))
#define MZ_DETAIL_TABLED_MzName(interface, name)                                                   \
    , Mz::detail::operationEntries(#name, &interface::name)

// `MZ_OPERATION(name, signature)`
#define MZ_DETAIL_PARTS_MzOperation(item) MZ_DETAIL_WITHOUT_FORM item
#define MZ_DETAIL_POINTER(interface, name, ...)                                                    \
    static_cast<Mz::detail::MemberPointer<interface, __VA_ARGS__>>(&interface::name)
#define MZ_DETAIL_DECLARED_MzOperation(interface, name, ...)                                       \
    static_assert(                                                                                 \
        std::is_invocable_v<decltype([]<class T>(T*) requires requires {                           \
                                MZ_DETAIL_POINTER(T, name, __VA_ARGS__);                           \
                            } {}),                                                                 \
                            interface*>,                                                           \
        #interface " has no public function " #name " with the signature " #__VA_ARGS__            \
                   ": write it as in the class, without names, with const and noexcept");
#define MZ_DETAIL_OVERRIDE_MzOperation(interface, name, ...)                                       \
    MZ_DETAIL_OVERRIDE_AS(name, decltype(MZ_DETAIL_POINTER(interface, name, __VA_ARGS__)))
#define MZ_DETAIL_TABLED_MzOperation(interface, name, ...)                                         \
    , Mz::detail::operationEntries(#name, MZ_DETAIL_POINTER(interface, name, __VA_ARGS__))

// `MZ_BASE(class)`
#define MZ_DETAIL_PARTS_MzBase(item) MZ_DETAIL_WITHOUT_FORM item
#define MZ_DETAIL_DECLARED_MzBase(interface, ...)                                                  \
    static_assert(std::is_base_of_v<__VA_ARGS__, interface>,                                       \
                  #__VA_ARGS__ " is no base of " #interface);                                      \
    static_assert(std::is_polymorphic_v<__VA_ARGS__>,                                              \
                  #__VA_ARGS__ " has no virtual function, so it is no MZ_BASE of " #interface);
#define MZ_DETAIL_OVERRIDE_MzBase(interface, ...)
#define MZ_DETAIL_TABLED_MzBase(interface, ...) , Mz::detail::baseEntry<__VA_ARGS__>()

/// GCC accepts no `override` after a name whose type is an alias, but "= 0" says the same.
#define MZ_DETAIL_OVERRIDE_AS(name, ...) Mz::detail::FunctionOf<__VA_ARGS__> name = 0;

#define MZ_DETAIL_WITHOUT_FORM(form, ...) __VA_ARGS__
#define MZ_DETAIL_FORM(item) MZ_DETAIL_SECOND(MZ_DETAIL_ITS_FORM item, MzName, ~)
#define MZ_DETAIL_ITS_FORM(form, ...) ~, form
#define MZ_DETAIL_SECOND(...) MZ_DETAIL_SECOND_OF(__VA_ARGS__)
#define MZ_DETAIL_SECOND_OF(first, second, ...) second
#define MZ_DETAIL_JOIN(a, b) MZ_DETAIL_JOIN_(a, b)
#define MZ_DETAIL_JOIN_(a, b) a##b
#define MZ_DETAIL_CALL(macro, ...) macro(__VA_ARGS__)

namespace Mz::detail {

template <class Interface, class Signature>
using MemberPointer = Signature Interface::*;

template <class Pointer>
struct PointedFunction;
template <class Function, class Class>
struct PointedFunction<Function Class::*> {
    using Type = Function;
};

/// The type of the function to which `Pointer`, a pointer to a member, points.
template <class Pointer>
using FunctionOf = typename PointedFunction<std::remove_cv_t<Pointer>>::Type;

/// The type that `Pointer` has if `Interface` declares the function itself.
template <class Interface, class Pointer>
using OwnPointer = MemberPointer<Interface, FunctionOf<Pointer>>;

/// A class whose function `mzEnd` has the first slot behind those of `Class`.
template <class Class>
struct EndOf : Class {
    virtual void mzEnd() = 0;

  protected:
    // No warning that it is not virtual, if that of `Class` is not.
    ~EndOf() = default; // NOLINT(modernize-use-override)
};

/// An `InterfaceEntry` with its text. `Function` is a pointer to a virtual function, which the
/// compiler stores as the two numbers of the entry, or `NoFunction`.
template <class Function, std::size_t textSize>
struct TableEntry {
    InterfaceEntryKind kind;
    std::uint16_t flags;
    std::uint32_t size;
    std::uint32_t valueSize;
    std::uint32_t alignment;
    Function function;
    char text[textSize];

    static constexpr std::uint32_t count = 1;
};

struct NoFunction {
    std::int64_t function = 0, adjustment = 0;
};

/// One of several entries. The index makes the bases differ.
template <std::size_t index, class Entry>
struct IndexedEntry {
    Entry entry;
};

/// Entries, one after the other, without padding. Bases, because they are made without templates
/// within templates, which would cost the compiler the square of their number.
template <class Indices, class... Entries>
struct IndexedEntries;
template <std::size_t... indices, class... Entries>
struct IndexedEntries<std::index_sequence<indices...>, Entries...>
    : IndexedEntry<indices, Entries>... {
    static constexpr std::uint32_t count = (0 + ... + Entries::count);
};
template <class... Entries>
using TableEntries = IndexedEntries<std::index_sequence_for<Entries...>, Entries...>;

template <class... Entries>
constexpr TableEntries<Entries...> entriesOf(const Entries&... entries) {
    return {{entries}...};
}

/// Returns an entry with place for a text of `length` characters and the final NUL.
template <std::size_t length, class Function>
constexpr auto entryFor(InterfaceEntryKind kind, Function function) {
    using Entry = TableEntry<Function, length / 8 * 8 + 8>;
    static_assert(sizeof(Entry) == sizeof(InterfaceEntry) + sizeof(Entry::text));
    return Entry{kind, 0, sizeof(Entry), 0, 0, function, {}};
}

/// The number of characters in the text of `T`.
template <class T>
inline constexpr std::size_t typeTextLength = [] {
    TextTarget measured;
    TypeText<T>::put(measured);
    return measured.length();
}();

/// Returns an entry with the text of `T`.
template <class T, class Function>
constexpr auto typeEntry(InterfaceEntryKind kind, Function function) {
    auto entry = entryFor<typeTextLength<T>>(kind, function);
    TextTarget text(entry.text);
    TypeText<T>::put(text);
    return entry;
}

template <class T>
concept Complete = requires {
    sizeof(T);
};

/// Whether the Itanium C++ ABI passes a class in registers, if it is small.
template <class T>
constexpr bool isTrivialInCalls =
    std::is_trivially_destructible_v<T> &&
    (std::is_trivially_copy_constructible_v<T> ||
     !std::is_copy_constructible_v<T>)&&(std::is_trivially_move_constructible_v<T> ||
                                         !std::is_move_constructible_v<T>);

template <class T>
constexpr auto valueEntry() {
    auto entry = typeEntry<T>(InterfaceEntryKind::value, NoFunction{});
    if constexpr (Complete<T>) {
        entry.valueSize = sizeof(T);
        entry.alignment = alignof(T);
        entry.flags =
            static_cast<std::uint16_t>((isTrivialInCalls<T> ? valueIsTrivial : 0) |
                                       (std::is_polymorphic_v<T> ? valueIsPolymorphic : 0));
    }
    return entry;
}

/// Appends an entry for each class and enumeration among the types.
template <class... Types>
struct ValueEntries {
    template <class... Entries>
    static constexpr auto after(const Entries&... entries) {
        return entriesOf(entries...);
    }
};
template <class First, class... Rest>
struct ValueEntries<First, Rest...> {
    template <class... Entries>
    static constexpr auto after(const Entries&... entries) {
        using Type = std::remove_cv_t<First>;
        if constexpr (std::is_class_v<Type> || std::is_union_v<Type> || std::is_enum_v<Type>)
            return ValueEntries<Rest...>::after(entries..., valueEntry<Type>());
        else
            return ValueEntries<Rest...>::after(entries...);
    }
};

/// The entries of one operation: its own, and those of the values that it takes and returns.
template <class Pointer, std::size_t size>
constexpr auto operationEntries(const char (&name)[size], Pointer pointer) {
    using Parts = FunctionParts<FunctionOf<Pointer>>;
    // The name follows the result and a space, for which `size` counts its NUL.
    auto entry = entryFor<typeTextLength<FunctionOf<Pointer>> + size>(InterfaceEntryKind::operation,
                                                                      pointer);
    TextTarget text(entry.text);
    Parts::putResult(text);
    text.put(" ");
    text.put(name);
    Parts::putParameters(text);
    return Parts::template Values<ValueEntries>::after(entry);
}

/// The entry of a base.
template <class Base>
constexpr auto baseEntry() {
    auto entry = typeEntry<Base>(InterfaceEntryKind::base, &EndOf<Base>::mzEnd);
    entry.valueSize = sizeof(Base);
    entry.alignment = alignof(Base);
    entry.flags = std::has_virtual_destructor_v<Base> ? baseHasVirtualDestructor : std::uint16_t{0};
    return entry;
}

template <class Entries>
struct InterfaceTable {
    InterfaceHead head;
    Entries entries;
};

#ifdef __clang__
inline constexpr std::uint16_t compilerFlag = interfaceFromClang;
#else
inline constexpr std::uint16_t compilerFlag = 0;
#endif

/// The whole table of an interface.
template <class Interface, std::size_t size, class... Items>
constexpr auto interfaceTable(const char (&name)[size], std::uint16_t properties,
                              const Items&... items) {
    auto nameEntry = entryFor<size - 1>(InterfaceEntryKind::name, NoFunction{});
    TextTarget(nameEntry.text).put(name);
    const auto entries = entriesOf(
        nameEntry, entryFor<0>(InterfaceEntryKind::end, &EndOf<Interface>::mzEnd), items...);
    using Table = InterfaceTable<std::remove_cv_t<decltype(entries)>>;
    const auto flags = static_cast<std::uint16_t>(properties | compilerFlag);
    return Table{{"MZiface", 1, flags, sizeof(Table), Interface::uid, sizeof(Interface),
                  alignof(Interface), decltype(entries)::count, 0},
                 entries};
}

} // namespace Mz::detail
