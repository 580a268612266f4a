// SPDX-License-Identifier: BSL-1.0
/// Types as text, at compile time, with the same text from GCC and Clang.
///
/// The compilers print types differently (`long int` and `long`, `const char*` and `const char *`).
/// So a type is taken apart by templates, and only the name of a class or an enumeration is the
/// compiler's. Used by `fingerprint.h`; programs do not need it.
///
/// \since 0.2
#pragma once

#include <array>
#include <cstddef>
#include <string>
#include <string_view>

namespace Mz::detail {

/// Where a text is written. Without a target it is only measured, which is cheap for the compiler:
/// its time grows with the number of characters that it copies.
class TextTarget {
  public:
    TextTarget() = default;
    constexpr explicit TextTarget(char* characters) : target(characters) {}

    template <std::size_t size>
    constexpr void put(const char (&literal)[size]) {
        put(literal, size - 1);
    }
    constexpr void put(const char* text, std::size_t length) {
        if (target)
            for (std::size_t index = 0; index < length; ++index)
                target[written + index] = text[index];
        written += length;
    }
    constexpr std::size_t length() const { return written; }

  private:
    char* target = nullptr;
    std::size_t written = 0;
};

/// The function name that the compiler makes for this instance, which contains the name of `T`.
template <class T>
constexpr const char* functionNameWith() {
    return __PRETTY_FUNCTION__;
}

/// The number of characters before the type in `functionNameWith`, the same for all types.
inline constexpr std::size_t lengthBeforeType =
    std::string_view(functionNameWith<int>()).find("T = ") + 4;

/// Returns the compiler's name of `T`.
template <class T>
constexpr std::string_view compilerName() {
    std::string_view name = functionNameWith<T>();
    name.remove_prefix(lengthBeforeType);
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

/// Writes a compiler's name in the form that all compilers share: replaces template arguments by
/// "...", because compilers print values differently, and removes the inline namespace of the
/// standard library.
constexpr void putName(TextTarget& out, std::string_view name) {
    struct Replacement {
        std::string_view from, to;
    };
    constexpr Replacement replacements[] = {{"{anonymous}", "(unnamed)"},
                                            {"(anonymous namespace)", "(unnamed)"},
                                            {"std::__cxx11::", "std::"}};
    std::size_t depth = 0;
    while (!name.empty()) {
        Replacement next{name.substr(0, 1), name.substr(0, 1)};
        for (const Replacement& known : replacements)
            if (name.front() == known.from.front() && name.starts_with(known.from))
                next = known;
        depth -= next.from.front() == '>';
        if (depth == 0)
            out.put(next.to.data(), next.to.size());
        if (next.from.front() == '<' && depth++ == 0)
            out.put("...");
        name.remove_prefix(next.from.size());
    }
}

/// The name of a class or an enumeration, without the arguments of its template if `isTemplate`.
/// Made once for each type.
template <class T, bool isTemplate = false>
struct ClassName {
    static constexpr std::string_view name =
        isTemplate ? withoutArguments(compilerName<T>()) : compilerName<T>();
    static constexpr std::size_t length = [] {
        TextTarget measured;
        putName(measured, name);
        return measured.length();
    }();
    static constexpr auto text = [] {
        std::array<char, length> characters{};
        TextTarget out(characters.data());
        putName(out, name);
        return characters;
    }();

    static constexpr void put(TextTarget& out) { out.put(text.data(), length); }
};

/// The text of a type, for which no specialisation below is made: a class or an enumeration.
template <class T>
struct TypeText : ClassName<T> {};

/// The texts of the types, separated by ", ".
template <class... Types>
struct TypeList {
    static constexpr void put(TextTarget&) {}
};
template <class First, class... Rest>
struct TypeList<First, Rest...> {
    static constexpr void put(TextTarget& out) {
        TypeText<First>::put(out);
        (..., (out.put(", "), TypeText<Rest>::put(out)));
    }
};

constexpr void putNumber(TextTarget& out, std::size_t number) {
    if (number >= 10)
        putNumber(out, number / 10);
    const char digit = static_cast<char>('0' + number % 10);
    out.put(&digit, 1);
}

/// The types whose text is their name here.
#define MZ_DETAIL_TYPE_TEXT(type)                                                                  \
    template <>                                                                                    \
    struct TypeText<type> {                                                                        \
        static constexpr void put(TextTarget& out) { out.put(#type); }                             \
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
    static constexpr void put(TextTarget& out) {
        out.put("const ");
        TypeText<T>::put(out);
    }
};
template <class T>
struct TypeText<volatile T> {
    static constexpr void put(TextTarget& out) {
        out.put("volatile ");
        TypeText<T>::put(out);
    }
};
template <class T>
struct TypeText<const volatile T> {
    static constexpr void put(TextTarget& out) {
        out.put("const volatile ");
        TypeText<T>::put(out);
    }
};
template <class T>
struct TypeText<T*> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("*");
    }
};
template <class T>
struct TypeText<T* const> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("* const");
    }
};
template <class T>
struct TypeText<T* volatile> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("* volatile");
    }
};
template <class T>
struct TypeText<T* const volatile> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("* const volatile");
    }
};
template <class T>
struct TypeText<T&> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("&");
    }
};
template <class T>
struct TypeText<T&&> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("&&");
    }
};
template <class T>
struct TypeText<T[]> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("[]");
    }
};
template <class T, std::size_t count>
struct TypeText<T[count]> {
    static constexpr void put(TextTarget& out) {
        TypeText<T>::put(out);
        out.put("[");
        putNumber(out, count);
        out.put("]");
    }
};
// An array of constants is constant, too: without these it would match two of the above.
template <class T>
struct TypeText<const T[]> {
    static constexpr void put(TextTarget& out) {
        TypeText<const T>::put(out);
        out.put("[]");
    }
};
template <class T, std::size_t count>
struct TypeText<const T[count]> {
    static constexpr void put(TextTarget& out) {
        TypeText<const T>::put(out);
        out.put("[");
        putNumber(out, count);
        out.put("]");
    }
};
template <class Function, class Class>
struct TypeText<Function Class::*> {
    static constexpr void put(TextTarget& out) {
        TypeText<Function>::put(out);
        out.put(" ");
        TypeText<Class>::put(out);
        out.put("::*");
    }
};
template <template <class...> class Template, class... Arguments>
struct TypeText<Template<Arguments...>> {
    static constexpr void put(TextTarget& out) {
        ClassName<Template<Arguments...>, true>::put(out);
        out.put("<");
        TypeList<Arguments...>::put(out);
        out.put(">");
    }
};
template <template <class, std::size_t> class Template, class T, std::size_t number>
struct TypeText<Template<T, number>> {
    static constexpr void put(TextTarget& out) {
        ClassName<Template<T, number>, true>::put(out);
        out.put("<");
        TypeText<T>::put(out);
        out.put(", ");
        putNumber(out, number);
        out.put(">");
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

/// A function with these qualifiers. `Values` lists its result and its parameters.
#define MZ_DETAIL_FUNCTION(qualifiers)                                                             \
    template <class Result, class... Parameters>                                                   \
    struct FunctionParts<Result(Parameters...) qualifiers> {                                       \
        static constexpr void putResult(TextTarget& out) { TypeText<Result>::put(out); }           \
        static constexpr void putParameters(TextTarget& out) {                                     \
            out.put("(");                                                                          \
            TypeList<Parameters...>::put(out);                                                     \
            out.put(")");                                                                          \
            putQualifiers(out, #qualifiers);                                                       \
        }                                                                                          \
        template <template <class...> class List>                                                  \
        using Values = List<Result, Parameters...>;                                                \
    };                                                                                             \
    template <class Result, class... Parameters>                                                   \
    struct TypeText<Result(Parameters...) qualifiers> {                                            \
        static constexpr void put(TextTarget& out) {                                               \
            FunctionParts<Result(Parameters...) qualifiers>::putResult(out);                       \
            FunctionParts<Result(Parameters...) qualifiers>::putParameters(out);                   \
        }                                                                                          \
    };

/// Writes the qualifiers with a space before them, if there are any.
template <std::size_t size>
constexpr void putQualifiers(TextTarget& out, const char (&qualifiers)[size]) {
    if constexpr (size > 1)
        out.put(" ");
    out.put(qualifiers);
}

MZ_DETAIL_QUALIFIERS(MZ_DETAIL_FUNCTION)
#undef MZ_DETAIL_FUNCTION
#undef MZ_DETAIL_QUALIFIERS
#undef MZ_DETAIL_REFERENCES

} // namespace Mz::detail
