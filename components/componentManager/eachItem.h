// SPDX-License-Identifier: BSL-1.0
/// A macro that repeats another one for each of its arguments. Used by `fingerprint.h`.
///
/// One macro for each number of items, and not the shorter recursion by repeated scanning: for a
/// mistake in one item, compilers list every expansion on the way to it.
///
/// \since 0.2
#pragma once

/// `MZ_DETAIL_EACH(macro, context, items...)` is `macro(context, item)` for each item, without
/// separators. There may be no item, and at most 64.
#define MZ_DETAIL_EACH(macro, context, ...)                                                        \
    __VA_OPT__(MZ_DETAIL_EACH_COUNTED(macro, context, __VA_ARGS__))
#define MZ_DETAIL_EACH_COUNTED(macro, context, ...)                                                \
    MZ_DETAIL_EACH_CHOSEN(                                                                         \
        __VA_ARGS__, MZ_DETAIL_EACH_64, MZ_DETAIL_EACH_63, MZ_DETAIL_EACH_62, MZ_DETAIL_EACH_61,   \
        MZ_DETAIL_EACH_60, MZ_DETAIL_EACH_59, MZ_DETAIL_EACH_58, MZ_DETAIL_EACH_57,                \
        MZ_DETAIL_EACH_56, MZ_DETAIL_EACH_55, MZ_DETAIL_EACH_54, MZ_DETAIL_EACH_53,                \
        MZ_DETAIL_EACH_52, MZ_DETAIL_EACH_51, MZ_DETAIL_EACH_50, MZ_DETAIL_EACH_49,                \
        MZ_DETAIL_EACH_48, MZ_DETAIL_EACH_47, MZ_DETAIL_EACH_46, MZ_DETAIL_EACH_45,                \
        MZ_DETAIL_EACH_44, MZ_DETAIL_EACH_43, MZ_DETAIL_EACH_42, MZ_DETAIL_EACH_41,                \
        MZ_DETAIL_EACH_40, MZ_DETAIL_EACH_39, MZ_DETAIL_EACH_38, MZ_DETAIL_EACH_37,                \
        MZ_DETAIL_EACH_36, MZ_DETAIL_EACH_35, MZ_DETAIL_EACH_34, MZ_DETAIL_EACH_33,                \
        MZ_DETAIL_EACH_32, MZ_DETAIL_EACH_31, MZ_DETAIL_EACH_30, MZ_DETAIL_EACH_29,                \
        MZ_DETAIL_EACH_28, MZ_DETAIL_EACH_27, MZ_DETAIL_EACH_26, MZ_DETAIL_EACH_25,                \
        MZ_DETAIL_EACH_24, MZ_DETAIL_EACH_23, MZ_DETAIL_EACH_22, MZ_DETAIL_EACH_21,                \
        MZ_DETAIL_EACH_20, MZ_DETAIL_EACH_19, MZ_DETAIL_EACH_18, MZ_DETAIL_EACH_17,                \
        MZ_DETAIL_EACH_16, MZ_DETAIL_EACH_15, MZ_DETAIL_EACH_14, MZ_DETAIL_EACH_13,                \
        MZ_DETAIL_EACH_12, MZ_DETAIL_EACH_11, MZ_DETAIL_EACH_10, MZ_DETAIL_EACH_9,                 \
        MZ_DETAIL_EACH_8, MZ_DETAIL_EACH_7, MZ_DETAIL_EACH_6, MZ_DETAIL_EACH_5, MZ_DETAIL_EACH_4,  \
        MZ_DETAIL_EACH_3, MZ_DETAIL_EACH_2, MZ_DETAIL_EACH_1)                                      \
    (macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_CHOSEN(i1, i2, i3, i4, i5, i6, i7, i8, i9, i10, i11, i12, i13, i14, i15,    \
                              i16, i17, i18, i19, i20, i21, i22, i23, i24, i25, i26, i27, i28,     \
                              i29, i30, i31, i32, i33, i34, i35, i36, i37, i38, i39, i40, i41,     \
                              i42, i43, i44, i45, i46, i47, i48, i49, i50, i51, i52, i53, i54,     \
                              i55, i56, i57, i58, i59, i60, i61, i62, i63, i64, chosen, ...)       \
    chosen

#define MZ_DETAIL_EACH_1(macro, context, item) macro(context, item)
#define MZ_DETAIL_EACH_2(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_1(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_3(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_2(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_4(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_3(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_5(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_4(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_6(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_5(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_7(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_6(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_8(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_7(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_9(macro, context, item, ...)                                                \
    macro(context, item) MZ_DETAIL_EACH_8(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_10(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_9(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_11(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_10(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_12(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_11(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_13(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_12(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_14(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_13(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_15(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_14(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_16(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_15(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_17(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_16(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_18(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_17(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_19(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_18(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_20(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_19(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_21(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_20(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_22(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_21(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_23(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_22(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_24(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_23(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_25(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_24(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_26(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_25(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_27(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_26(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_28(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_27(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_29(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_28(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_30(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_29(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_31(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_30(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_32(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_31(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_33(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_32(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_34(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_33(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_35(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_34(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_36(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_35(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_37(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_36(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_38(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_37(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_39(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_38(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_40(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_39(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_41(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_40(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_42(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_41(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_43(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_42(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_44(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_43(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_45(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_44(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_46(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_45(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_47(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_46(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_48(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_47(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_49(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_48(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_50(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_49(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_51(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_50(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_52(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_51(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_53(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_52(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_54(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_53(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_55(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_54(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_56(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_55(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_57(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_56(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_58(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_57(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_59(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_58(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_60(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_59(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_61(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_60(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_62(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_61(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_63(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_62(macro, context, __VA_ARGS__)
#define MZ_DETAIL_EACH_64(macro, context, item, ...)                                               \
    macro(context, item) MZ_DETAIL_EACH_63(macro, context, __VA_ARGS__)
