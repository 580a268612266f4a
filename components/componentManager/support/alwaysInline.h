// SPDX-License-Identifier: BSL-1.0
/// `MZ_ALWAYS_INLINE` makes a function part of each caller where the compiler optimises. Elsewhere
/// it is an ordinary function: a debugger can step over it, and its branches are counted once.
#pragma once

#ifdef __OPTIMIZE__
#define MZ_ALWAYS_INLINE [[gnu::always_inline]]
#else
#define MZ_ALWAYS_INLINE
#endif
