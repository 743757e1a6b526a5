


.intel_syntax noprefix
.text
.globl sx
.type sx,@function
sx:
    t1 = 8
    t2 = 12
    t0 = -8

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 8
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    movzx eax, BYTE PTR t1[ebp]
    add eax, DWORD PTR t2[ebp]
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


.intel_syntax noprefix
.text
.globl ult
.type ult,@function
ult:
    t1 = 8
    t2 = 12
    t0 = -8

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 8
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    setl bh
    movzx ebx, bh
    mov DWORD PTR t0[ebp], DWORD PTR ebx
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


.intel_syntax noprefix
.text
.globl mulreuse
.type mulreuse,@function
mulreuse:
    t1 = 8
    t2 = 12
    t0 = -8
    t3 = -12

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t1[ebp]
    imul eax, DWORD PTR t2[ebp]
    mov DWORD PTR t3[ebp], DWORD PTR eax
    add eax, DWORD PTR eax
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


.intel_syntax noprefix
.text
.globl apply
.type apply,@function
apply:
    t1 = 8
    t2 = 12
    t0 = -8

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov DWORD PTR eax, DWORD PTR t2[ebp]
    mov DWORD PTR [esp], eax
    mov eax, DWORD PTR 
    call eax
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


.intel_syntax noprefix
.text
.globl nest
.type nest,@function
nest:
    t1 = 8
    t0 = -8

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov DWORD PTR eax, DWORD PTR t1[ebp]
    mov DWORD PTR [esp+4], eax
    mov DWORD PTR eax, 4
    mov DWORD PTR [esp+4], eax
    mov DWORD PTR eax, 3
    mov DWORD PTR [esp], eax
    call g1
    mov DWORD PTR eax, DWORD PTR eax
    mov DWORD PTR [esp], eax
    call g2
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


