/* Linkage of the exported C interface: C names, default visibility. */
#ifndef TAVIRPELO_API_H
#define TAVIRPELO_API_H

#ifdef __cplusplus
#define TAVIRPELO_LINKAGE extern "C"
#else
#define TAVIRPELO_LINKAGE extern
#endif

#if defined(__GNUC__)
#define TAVIRPELO_API TAVIRPELO_LINKAGE __attribute__((visibility("default")))
#else
#define TAVIRPELO_API TAVIRPELO_LINKAGE
#endif

#endif
