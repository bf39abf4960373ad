#pragma once

/** Longest name of the first property protocol, with its NUL; the service takes longer names. */
#define PROP_NAME_MAX 32

/** Longest value, with its NUL. */
#define PROP_VALUE_MAX 92

// As the device's C library does: to clang, `property_get` with a shorter buffer is an error.
#if defined(__clang__)
#define __BIONIC_FORTIFY 1
#define __BIONIC_FORTIFY_UNKNOWN_SIZE (static_cast<size_t>(-1))
#define __clang_error_if(condition, text) __attribute__((diagnose_if(condition, text, "error")))
#endif
