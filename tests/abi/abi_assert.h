/*
 * Compile-time assertions shared by the C and the C++ layout checks, so both
 * languages are held to one list of sizes, offsets and values.
 */
#ifndef ABI_ASSERT_H
#define ABI_ASSERT_H

#if defined(__cplusplus)
#  include <cstddef>
#  define ABI_STATIC_ASSERT(cond, what) static_assert(cond, what)
#  define ABI_ALIGNOF(type) alignof(type)
#else
#  include <stddef.h>
#  define ABI_STATIC_ASSERT(cond, what) _Static_assert(cond, what)
#  define ABI_ALIGNOF(type) _Alignof(type)
#endif

#define ABI_SIZE(type, bytes) ABI_STATIC_ASSERT(sizeof(type) == (bytes), "size of " #type)
#define ABI_ALIGN(type, bytes) \
    ABI_STATIC_ASSERT(ABI_ALIGNOF(type) == (bytes), "alignment of " #type)
#define ABI_OFFSET(type, member, bytes) \
    ABI_STATIC_ASSERT(offsetof(type, member) == (bytes), "offset of " #type "." #member)
#define ABI_CONST(name, value) ABI_STATIC_ASSERT((name) == (value), "value of " #name)

#endif /* ABI_ASSERT_H */
