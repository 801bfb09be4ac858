# The vtable side of the dual interfaces: slot i of a class's vtable (after the seven of
# IDispatch) points at thunk i, which passes i to one common entry. The common entry keeps
# the register arguments next to the stack ones (the caller's shadow space) and the floating
# point ones apart, then calls droqbxml_dual_call(interface, slot, arguments, doubles),
# which reads them by the member's description in the type library. Microsoft x64 calls.
    .text
    .globl droqbxml_dual_thunks
    .p2align 4
droqbxml_dual_thunks:
    .set slot, 0
    .rept 1024
    movl $slot, %eax
    jmp droqbxml_dual_common
    .p2align 4
    .set slot, slot + 1
    .endr

droqbxml_dual_common:
    movq %rcx, 8(%rsp)
    movq %rdx, 16(%rsp)
    movq %r8, 24(%rsp)
    movq %r9, 32(%rsp)
    subq $72, %rsp
    movsd %xmm1, 32(%rsp)
    movsd %xmm2, 40(%rsp)
    movsd %xmm3, 48(%rsp)
    movl %eax, %edx
    leaq 80(%rsp), %r8
    leaq 32(%rsp), %r9
    call droqbxml_dual_call
    addq $72, %rsp
    ret
