


.intel_syntax noprefix
.text
.globl cmpv
.type cmpv,@function
cmpv:
    t0 = 8
    t1 = 12
    t2 = 16
    t3 = -8

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 8
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    sete bh
    movzx ebx, bh
    mov DWORD PTR t3[ebp], DWORD PTR ebx
    mov eax, DWORD PTR t0[ebp]
    mov ebx, DWORD PTR t3[ebp]
    mov DWORD PTR [eax], ebx
.La2:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    setne bh
    movzx ebx, bh
    mov DWORD PTR t3[ebp], DWORD PTR ebx
    mov eax, DWORD PTR t3[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 4], eax
.La3:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    setl bh
    movzx ebx, bh
    mov DWORD PTR t3[ebp], DWORD PTR ebx
    mov eax, DWORD PTR t3[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 8], eax
.La4:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    setle bh
    movzx ebx, bh
    mov DWORD PTR t3[ebp], DWORD PTR ebx
    mov eax, DWORD PTR t3[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 12], eax
.La5:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    setg bh
    movzx ebx, bh
    mov DWORD PTR t3[ebp], DWORD PTR ebx
    mov eax, DWORD PTR t3[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 16], eax
.La6:
    mov eax, DWORD PTR t1[ebp]
    cmp eax, DWORD PTR t2[ebp]
    setge bh
    movzx ebx, bh
    mov DWORD PTR t3[ebp], DWORD PTR ebx
    mov eax, DWORD PTR t3[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 20], eax
.La1:
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


