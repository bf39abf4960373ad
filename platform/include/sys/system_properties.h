#pragma once

/** Longest name with its NUL, by the first property protocol. The service takes longer ones. */
#define PROP_NAME_MAX 32

/** Longest value, with its NUL. */
#define PROP_VALUE_MAX 92

// The device's C library does the same: clang rejects `property_get` with a shorter buffer.
#if defined(__clang__)
#define __BIONIC_FORTIFY 1
#define __BIONIC_FORTIFY_UNKNOWN_SIZE (static_cast<size_t>(-1))
#define __clang_error_if(condition, text) __attribute__((diagnose_if(condition, text, "error")))
#endif
