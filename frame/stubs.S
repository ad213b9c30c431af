/*
 * The export stubs: one indirect jump through the export's slot and nothing
 * else.  The caller's arguments and return address stay where they are, so
 * the bound entry (which has the export's exact signature and calling
 * convention) runs as if it had been called directly, whatever the parameter
 * list.  Written in assembly because a compiler may add code even to a naked
 * function (copies of 8-byte aligned by-value records, for instance).
 *
 * The slots are defined in frame/exports.cpp.  stubs.inc, generated from the
 * manifest's export listing (cmake/GenExports.cmake), holds one line
 *     stub <name>, <argument bytes>
 * per export.
 */
#if defined(_WIN32) && defined(__i386__)

/* Standard-call decoration _name@bytes; the .def file exports it undecorated. */
    .macro stub name, bytes
    .globl _\name\()@\bytes
    .def _\name\()@\bytes; .scl 2; .type 32; .endef
    .p2align 4
_\name\()@\bytes:
    jmp *_zor_slot_\name
    .endm

#elif defined(__x86_64__) && defined(__ELF__)

/* Plain names; the version script keeps exactly these global. */
    .macro stub name, bytes
    .globl \name
    .type \name, @function
    .p2align 4
\name:
    jmp *zor_slot_\name(%rip)
    .size \name, . - \name
    .endm

    .section .note.GNU-stack, "", @progbits

#else
#  error "zor's export stubs are written for 32-bit Windows and x86-64 ELF"
#endif

    .text
#include "stubs.inc"
