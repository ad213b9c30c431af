/* Extensions of the x86-64 build of zor, beside the functions of zor.h. */
#ifndef ZOR_EXT_H
#define ZOR_EXT_H

#if defined(__x86_64__) || defined(_M_X64)

#ifdef __cplusplus
extern "C" {
#endif

/* The register width in bits that the bound entries use: 128 (the five
 * code variants), 256 (AVX2 with FMA) or 512 (AVX-512).  Exports with wide
 * entries use them where the processor and the operating system support
 * the wider registers; the environment variable ZOR_MAX_WIDTH=128|256|512,
 * read when the library is loaded, caps the width.  Every width gives the
 * same results bit for bit. */
int zorGetBoundWidth(void);

#ifdef __cplusplus
}
#endif

#endif
#endif /* ZOR_EXT_H */
