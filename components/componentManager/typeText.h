// SPDX-License-Identifier: BSL-1.0
/// Types as text, at compile time, with the same text from GCC and Clang.
///
/// The compilers print types differently (`long int` and `long`, `const char*` and `const char *`).
/// So a type is taken apart by templates, and only the name of a class or an enumeration is the
/// compiler's. Used by `fingerprint.h`; programs do not need it.
///
/// \since 0.2
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace Mz::detail {

/// A text with its length in its type, so that it can be a member of a constant.
template <std::size_t length>
struct Text {
    char characters[length + 1]{};

    constexpr Text() = default;
    constexpr explicit(false) Text(const char (&literal)[length + 1]) {
        for (std::size_t index = 0; index < length; ++index)
            characters[index] = literal[index];
    }

    template <std::size_t other>
    constexpr auto operator+(const Text<other>& next) const {
        Text<length + other> result;
        for (std::size_t index = 0; index < length; ++index)
            result.characters[index] = characters[index];
        for (std::size_t index = 0; index < other; ++index)
            result.characters[length + index] = next.characters[index];
        return result;
    }
    template <std::size_t size>
    constexpr auto operator+(const char (&literal)[size]) const {
        return *this + Text<size - 1>(literal);
    }
};
template <std::size_t size>
Text(const char (&)[size]) -> Text<size - 1>;

/// The function name that the compiler makes for this instance, which contains the name of `T`.
template <class T>
constexpr const char* functionNameWith() {
    return __PRETTY_FUNCTION__;
}

/// Returns the compiler's name of `T`.
template <class T>
constexpr std::string_view compilerName() {
    std::string_view name = functionNameWith<T>();
    name.remove_prefix(name.find("T = ") + 4);
    name.remove_suffix(1); // ']'
    return name;
}

/// Returns the name without the arguments of its template, if it ends with them.
constexpr std::string_view withoutArguments(std::string_view name) {
    std::size_t depth = 0;
    for (std::size_t index = name.size(); index > 0; --index) {
        const char character = name[index - 1];
        depth += character == '>';
        depth -= character == '<';
        if (depth == 0)
            return name.substr(0, character == '<' ? index - 1 : name.size());
    }
    return name;
}

/// Copies a compiler's name in the form that all compilers share, and returns its length. Replaces
/// template arguments by "...", because compilers print values differently, and removes the inline
/// namespace of the standard library.
/// \param target  may be null
constexpr std::size_t copyName(std::string_view name, char* target) {
    struct Replacement {
        std::string_view from, to;
    };
    constexpr Replacement replacements[] = {{"{anonymous}", "(unnamed)"},
                                            {"(anonymous namespace)", "(unnamed)"},
                                            {"std::__cxx11::", "std::"}};
    std::size_t length = 0, depth = 0;
    const auto put = [&](std::string_view text) {
        for (const char character : text) {
            if (target)
                target[length] = character;
            ++length;
        }
    };
    while (!name.empty()) {
        Replacement next{name.substr(0, 1), name.substr(0, 1)};
        for (const Replacement& known : replacements)
            if (name.starts_with(known.from))
                next = known;
        depth -= next.from == ">";
        if (depth == 0)
            put(next.to);
        if (next.from == "<" && depth++ == 0)
            put("...");
        name.remove_prefix(next.from.size());
    }
    return length;
}

/// Returns the name of a class or an enumeration, without the arguments of its template if
/// `isTemplate`.
template <class T, bool isTemplate = false>
constexpr auto nameText() {
    constexpr std::string_view name =
        isTemplate ? withoutArguments(compilerName<T>()) : compilerName<T>();
    Text<copyName(name, nullptr)> result;
    copyName(name, result.characters);
    return result;
}

/// Returns the texts of the types, separated by ", ".
template <class... Types>
constexpr auto typeTexts();

/// The text of a type, for which no specialisation below is made: a class or an enumeration.
template <class T>
struct TypeText {
    static constexpr auto make() { return nameText<T>(); }
};

template <class T>
constexpr auto typeText() {
    return TypeText<T>::make();
}

template <class First, class... Rest>
constexpr auto joinedTexts() {
    if constexpr (sizeof...(Rest) == 0)
        return typeText<First>();
    else
        return typeText<First>() + ", " + joinedTexts<Rest...>();
}

template <class... Types>
constexpr auto typeTexts() {
    if constexpr (sizeof...(Types) == 0)
        return Text<0>();
    else
        return joinedTexts<Types...>();
}

template <std::size_t number>
constexpr auto numberText() {
    constexpr auto digit = [] {
        Text<1> text;
        text.characters[0] = static_cast<char>('0' + number % 10);
        return text;
    }();
    if constexpr (number < 10)
        return digit;
    else
        return numberText<number / 10>() + digit;
}

/// The types whose text is their name here.
#define MZ_DETAIL_TYPE_TEXT(type)                                                                  \
    template <>                                                                                    \
    struct TypeText<type> {                                                                        \
        static constexpr auto make() { return Text(#type); }                                       \
    };
MZ_DETAIL_TYPE_TEXT(void)
MZ_DETAIL_TYPE_TEXT(bool)
MZ_DETAIL_TYPE_TEXT(char)
MZ_DETAIL_TYPE_TEXT(signed char)
MZ_DETAIL_TYPE_TEXT(unsigned char)
MZ_DETAIL_TYPE_TEXT(wchar_t)
MZ_DETAIL_TYPE_TEXT(char8_t)
MZ_DETAIL_TYPE_TEXT(char16_t)
MZ_DETAIL_TYPE_TEXT(char32_t)
MZ_DETAIL_TYPE_TEXT(short)
MZ_DETAIL_TYPE_TEXT(unsigned short)
MZ_DETAIL_TYPE_TEXT(int)
MZ_DETAIL_TYPE_TEXT(unsigned int)
MZ_DETAIL_TYPE_TEXT(long)
MZ_DETAIL_TYPE_TEXT(unsigned long)
MZ_DETAIL_TYPE_TEXT(long long)
MZ_DETAIL_TYPE_TEXT(unsigned long long)
MZ_DETAIL_TYPE_TEXT(float)
MZ_DETAIL_TYPE_TEXT(double)
MZ_DETAIL_TYPE_TEXT(long double)
MZ_DETAIL_TYPE_TEXT(std::nullptr_t)
MZ_DETAIL_TYPE_TEXT(std::string)
MZ_DETAIL_TYPE_TEXT(std::wstring)
MZ_DETAIL_TYPE_TEXT(std::string_view)
MZ_DETAIL_TYPE_TEXT(std::wstring_view)
#undef MZ_DETAIL_TYPE_TEXT

template <class T>
struct TypeText<const T> {
    static constexpr auto make() { return Text("const ") + typeText<T>(); }
};
template <class T>
struct TypeText<volatile T> {
    static constexpr auto make() { return Text("volatile ") + typeText<T>(); }
};
template <class T>
struct TypeText<const volatile T> {
    static constexpr auto make() { return Text("const volatile ") + typeText<T>(); }
};
template <class T>
struct TypeText<T*> {
    static constexpr auto make() { return typeText<T>() + "*"; }
};
template <class T>
struct TypeText<T* const> {
    static constexpr auto make() { return typeText<T>() + "* const"; }
};
template <class T>
struct TypeText<T* volatile> {
    static constexpr auto make() { return typeText<T>() + "* volatile"; }
};
template <class T>
struct TypeText<T* const volatile> {
    static constexpr auto make() { return typeText<T>() + "* const volatile"; }
};
template <class T>
struct TypeText<T&> {
    static constexpr auto make() { return typeText<T>() + "&"; }
};
template <class T>
struct TypeText<T&&> {
    static constexpr auto make() { return typeText<T>() + "&&"; }
};
template <class T>
struct TypeText<T[]> {
    static constexpr auto make() { return typeText<T>() + "[]"; }
};
template <class T, std::size_t count>
struct TypeText<T[count]> {
    static constexpr auto make() { return typeText<T>() + "[" + numberText<count>() + "]"; }
};
// An array of constants is constant, too: without these it would match two of the above.
template <class T>
struct TypeText<const T[]> {
    static constexpr auto make() { return typeText<const T>() + "[]"; }
};
template <class T, std::size_t count>
struct TypeText<const T[count]> {
    static constexpr auto make() { return typeText<const T>() + "[" + numberText<count>() + "]"; }
};
template <class Function, class Class>
struct TypeText<Function Class::*> {
    static constexpr auto make() { return typeText<Function>() + " " + typeText<Class>() + "::*"; }
};
template <template <class...> class Template, class... Arguments>
struct TypeText<Template<Arguments...>> {
    static constexpr auto make() {
        return nameText<Template<Arguments...>, true>() + "<" + typeTexts<Arguments...>() + ">";
    }
};
template <template <class, std::size_t> class Template, class T, std::size_t number>
struct TypeText<Template<T, number>> {
    static constexpr auto make() {
        return nameText<Template<T, number>, true>() + "<" + typeText<T>() + ", " +
               numberText<number>() + ">";
    }
};

/// The parts of a function's type.
template <class Function>
struct FunctionParts;

/// Uses `macro` with the qualifiers of every kind of member function.
#define MZ_DETAIL_REFERENCES(macro, cv)                                                            \
    macro(cv) macro(cv&) macro(cv&&) macro(cv noexcept) macro(cv& noexcept) macro(cv&& noexcept)
#define MZ_DETAIL_QUALIFIERS(macro)                                                                \
    MZ_DETAIL_REFERENCES(macro, )                                                                  \
    MZ_DETAIL_REFERENCES(macro, const)                                                             \
    MZ_DETAIL_REFERENCES(macro, volatile)                                                          \
    MZ_DETAIL_REFERENCES(macro, const volatile)

/// A function with these qualifiers. `with` calls `Visitor::visit` with its result and its
/// parameters as template arguments.
#define MZ_DETAIL_FUNCTION(qualifiers)                                                             \
    template <class Result, class... Parameters>                                                   \
    struct FunctionParts<Result(Parameters...) qualifiers> {                                       \
        template <class Name>                                                                      \
        static constexpr auto declaration(Name name) {                                             \
            return typeText<Result>() + name + "(" + typeTexts<Parameters...>() + ")" +            \
                   qualifierText(Text(#qualifiers));                                               \
        }                                                                                          \
        template <template <class...> class List>                                                  \
        using Values = List<Result, Parameters...>;                                                \
    };                                                                                             \
    template <class Result, class... Parameters>                                                   \
    struct TypeText<Result(Parameters...) qualifiers> {                                            \
        static constexpr auto make() {                                                             \
            return FunctionParts<Result(Parameters...) qualifiers>::declaration(Text<0>());        \
        }                                                                                          \
    };

/// Returns the qualifiers with a space before them, if there are any.
template <std::size_t length>
constexpr auto qualifierText(const Text<length>& qualifiers) {
    if constexpr (length == 0)
        return qualifiers;
    else
        return Text(" ") + qualifiers;
}

MZ_DETAIL_QUALIFIERS(MZ_DETAIL_FUNCTION)
#undef MZ_DETAIL_FUNCTION
#undef MZ_DETAIL_QUALIFIERS
#undef MZ_DETAIL_REFERENCES

} // namespace Mz::detail
