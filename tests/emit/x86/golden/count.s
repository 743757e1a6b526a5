


.intel_syntax noprefix
.text
.globl count
.type count,@function
count:
    t1 = 8
    t0 = -8
    t2 = -12

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov DWORD PTR t2[ebp], 0
.La2:
    mov eax, DWORD PTR t2[ebp]
    cmp DWORD PTR eax, DWORD PTR t1[ebp]
    jl .La3
.La1:
    mov eax, DWORD PTR t2[ebp]
    mov DWORD PTR t0[ebp], eax
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret
.La3:
    mov eax, DWORD PTR t2[ebp]
    add eax, 1
    mov DWORD PTR t2[ebp], DWORD PTR eax
    jmp .La2


