


.intel_syntax noprefix
.text
.globl calls
.type calls,@function
calls:
    t1 = 8
    t0 = -8
    t2 = -12
    t3 = -16
    t4 = -20
    t5 = -21

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 40
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov ebx, DWORD PTR t1[ebp]
    add ebx, 1
    mov DWORD PTR eax, DWORD PTR ebx
    mov DWORD PTR [esp+8], eax
    mov DWORD PTR eax, 2
    mov DWORD PTR [esp+4], eax
    mov DWORD PTR eax, DWORD PTR t1[ebp]
    mov DWORD PTR [esp], eax
    call callee3
    mov DWORD PTR t3[ebp], DWORD PTR eax
    mov DWORD PTR t2[ebp], OFFSET FLAT:callee3
    mov DWORD PTR eax, 5
    mov DWORD PTR [esp+8], eax
    mov DWORD PTR eax, DWORD PTR t1[ebp]
    mov DWORD PTR [esp+4], eax
    mov DWORD PTR eax, DWORD PTR t1[ebp]
    mov DWORD PTR [esp], eax
    mov eax, DWORD PTR t2[ebp]
    call eax
    mov DWORD PTR t4[ebp], DWORD PTR eax
    mov eax, DWORD PTR t3[ebp]
    add eax, DWORD PTR t4[ebp]
    mov DWORD PTR t3[ebp], DWORD PTR eax
    mov BYTE PTR t5[ebp], 65
    movzx eax, BYTE PTR t5[ebp]
    mov DWORD PTR [esp], eax
    call bytearg
    mov DWORD PTR t4[ebp], DWORD PTR eax
    mov eax, DWORD PTR t3[ebp]
    add eax, DWORD PTR t4[ebp]
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


