


.intel_syntax noprefix
.text
.globl useAlloca
.type useAlloca,@function
useAlloca:
    t1 = 8
    t0 = -8
    t2 = -12
    t3 = -16

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 24
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, 16
    add eax, 15 # alloca
    shr eax, 4
    sal eax, 4
    sub esp, eax
    lea eax, [esp+4]
    mov DWORD PTR t2[ebp], DWORD PTR eax
    mov eax, DWORD PTR t2[ebp]
    mov ebx, DWORD PTR t1[ebp]
    mov DWORD PTR [eax], ebx
    mov eax, DWORD PTR t2[ebp]
    add eax, 4
    mov DWORD PTR [eax], 7
    mov DWORD PTR eax, DWORD PTR t2[ebp]
    mov DWORD PTR [esp], eax
    call sum2
    mov DWORD PTR t3[ebp], DWORD PTR eax
    mov eax, DWORD PTR t3[ebp]
    mov DWORD PTR t0[ebp], eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


