


.intel_syntax noprefix
.text
.globl fact
.type fact,@function
fact:
    t1 = 8
    t0 = -8
    t2 = -12

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, 1
    jle .La2
.La3:
    mov ebx, DWORD PTR t1[ebp]
    sub ebx, 1
    mov DWORD PTR eax, DWORD PTR ebx
    mov DWORD PTR [esp], eax
    call fact
    mov DWORD PTR t2[ebp], DWORD PTR eax
    mov eax, DWORD PTR t1[ebp]
    imul eax, DWORD PTR t2[ebp]
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret
.La2:
    mov DWORD PTR t0[ebp], 1
    jmp .La1


