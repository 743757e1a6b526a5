


.intel_syntax noprefix
.text
.globl arith
.type arith,@function
arith:
    t0 = 8
    t1 = 12
    t2 = 16
    t3 = 20
    t4 = 24
    t5 = -8
    t6 = -12

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t1[ebp]
    add eax, DWORD PTR t2[ebp]
    mov DWORD PTR t5[ebp], DWORD PTR eax
    mov eax, DWORD PTR t0[ebp]
    mov ebx, DWORD PTR t5[ebp]
    mov DWORD PTR [eax], ebx
    mov eax, DWORD PTR t1[ebp]
    sub eax, DWORD PTR t2[ebp]
    mov DWORD PTR t5[ebp], DWORD PTR eax
    mov eax, DWORD PTR t5[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 4], eax
    mov eax, DWORD PTR t1[ebp]
    imul eax, DWORD PTR t2[ebp]
    mov DWORD PTR t5[ebp], DWORD PTR eax
    mov eax, DWORD PTR t5[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 8], eax
    mov eax, DWORD PTR t3[ebp]
    mul DWORD PTR t4[ebp]
    mov DWORD PTR t6[ebp], DWORD PTR eax
    mov eax, DWORD PTR t6[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 12], eax
    mov eax, DWORD PTR t3[ebp]
    mov ebx, 3
    mul ebx
    mov DWORD PTR t6[ebp], DWORD PTR eax
    mov eax, DWORD PTR t6[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 16], eax
    mov ebx, 7
    sub ebx, DWORD PTR t1[ebp]
    mov DWORD PTR t5[ebp], DWORD PTR ebx
    mov ebx, DWORD PTR t5[ebp]
    mov ecx, DWORD PTR t0[ebp]
    mov [ecx + 20], ebx
.La1:
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


