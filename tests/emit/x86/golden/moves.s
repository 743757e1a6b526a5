


.intel_syntax noprefix
.text
.globl moves
.type moves,@function
moves:
    t0 = 8
    t1 = 12
    t2 = 16
    t3 = -8
    t4 = -12
    t5 = -16
    t6 = -20

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 24
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t2[ebp]
    mov DWORD PTR t3[ebp], eax
    mov ebx, DWORD PTR t0[ebp]
    mov DWORD PTR [ebx], eax
    mov ebx, DWORD PTR [ebx]
    mov DWORD PTR t4[ebp], ebx
    mov eax, DWORD PTR t4[ebp]
    add eax, 1
    mov DWORD PTR t4[ebp], DWORD PTR eax
    mov eax, DWORD PTR t4[ebp]
    mov ebx, DWORD PTR t0[ebp]
    mov [ebx + 4], eax
    mov ebx, DWORD PTR t0[ebp]
    mov ebx, [ebx + 4]
    mov DWORD PTR t5[ebp], ebx
    mov ebx, DWORD PTR t5[ebp]
    add ebx, DWORD PTR ebx
    mov DWORD PTR t6[ebp], DWORD PTR ebx
    mov ebx, DWORD PTR t1[ebp]
    mov ecx, DWORD PTR t6[ebp]
    mov DWORD PTR [ebx], ecx
    mov ebx, DWORD PTR t0[ebp]
    mov ecx, DWORD PTR t1[ebp]
    add ecx, 4
    mov ebx, [ebx]
    mov [ecx], ebx
    mov ebx, DWORD PTR t1[ebp]
    add ebx, 8
    mov DWORD PTR [ebx], 5
    mov DWORD PTR t3[ebp], 7
    mov ebx, DWORD PTR t3[ebp]
    mov ecx, DWORD PTR t1[ebp]
    mov [ecx + 12], ebx
.La1:
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


