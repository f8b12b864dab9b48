/* The truth type of these headers: one byte that holds 0 or 1. It is the language's own `bool`; C89, which has none,
 * gets a byte of the same size, to which nothing but 0 and 1 may be given. */
#ifndef KTORBA_BOOL_H
#define KTORBA_BOOL_H

#if defined(__cplusplus)
typedef bool ktorba_bool;
#elif defined(__STDC_VERSION__) && __STDC_VERSION__ >= 199901L
#include <stdbool.h>
typedef bool ktorba_bool;
#else
typedef unsigned char ktorba_bool;
#endif

#endif
