#include "host/gate/passthrough.h"

// Written out whole, so that the address behind the instruction has a name and the compiler makes
// no second copy of it. Six arguments, one call, nothing else.

#if defined(__x86_64__)

asm(R"(
    .pushsection .text
    .globl SecpolicyGatePassThrough
    .hidden SecpolicyGatePassThrough
    .type SecpolicyGatePassThrough, @function
SecpolicyGatePassThrough:
    .cfi_startproc
    endbr64
    movq %rdi, %rax
    movq %rsi, %r11
    movq 0(%r11), %rdi
    movq 8(%r11), %rsi
    movq 16(%r11), %rdx
    movq 24(%r11), %r10
    movq 32(%r11), %r8
    movq 40(%r11), %r9
    syscall
    .globl kSecpolicyGatePassThroughReturn
    .hidden kSecpolicyGatePassThroughReturn
kSecpolicyGatePassThroughReturn:
    ret
    .cfi_endproc
    .size SecpolicyGatePassThrough, . - SecpolicyGatePassThrough
    .popsection
)");

#elif defined(__aarch64__)

asm(R"(
    .pushsection .text
    .globl SecpolicyGatePassThrough
    .hidden SecpolicyGatePassThrough
    .type SecpolicyGatePassThrough, %function
    .p2align 2
SecpolicyGatePassThrough:
    .cfi_startproc
    hint #34
    mov x8, x0
    mov x9, x1
    ldp x0, x1, [x9]
    ldp x2, x3, [x9, #16]
    ldp x4, x5, [x9, #32]
    svc #0
    .globl kSecpolicyGatePassThroughReturn
    .hidden kSecpolicyGatePassThroughReturn
kSecpolicyGatePassThroughReturn:
    ret
    .cfi_endproc
    .size SecpolicyGatePassThrough, . - SecpolicyGatePassThrough
    .popsection
)");

#else
#error "the gate does not know this machine's system calls"
#endif
