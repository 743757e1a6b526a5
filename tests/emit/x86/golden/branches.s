


.intel_syntax noprefix
.text
.globl br
.type br,@function
br:
    t1 = 8
    t2 = 12
    t0 = -8
    t3 = -12

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov DWORD PTR t3[ebp], 0
.La2:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, DWORD PTR t2[ebp]
    je .La3
.La4:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, DWORD PTR t2[ebp]
    jne .La5
.La6:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, DWORD PTR t2[ebp]
    jl .La7
.La8:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, DWORD PTR t2[ebp]
    jle .La9
.La10:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, DWORD PTR t2[ebp]
    jg .La11
.La12:
    mov eax, DWORD PTR t1[ebp]
    cmp DWORD PTR eax, DWORD PTR t2[ebp]
    jge .La13
.La14:
    mov eax, DWORD PTR t3[ebp]
    mov DWORD PTR t0[ebp], eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret
.La3:
    mov eax, DWORD PTR t3[ebp]
    add eax, 1
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La4
.La5:
    mov eax, DWORD PTR t3[ebp]
    add eax, 2
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La6
.La7:
    mov eax, DWORD PTR t3[ebp]
    add eax, 4
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La8
.La9:
    mov eax, DWORD PTR t3[ebp]
    add eax, 8
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La10
.La11:
    mov eax, DWORD PTR t3[ebp]
    add eax, 16
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La12
.La13:
    mov eax, DWORD PTR t3[ebp]
    add eax, 32
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La14


