#pragma once

/** Longest name of the first property protocol, with its NUL; the service takes longer names. */
#define PROP_NAME_MAX 32

/** Longest value, with its NUL. */
#define PROP_VALUE_MAX 92
