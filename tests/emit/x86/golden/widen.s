


.intel_syntax noprefix
.text
.globl widen
.type widen,@function
widen:
    t1 = 8
    t2 = 12
    t3 = 16
    t0 = -8
    t4 = -9
    t5 = -16

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 16
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov ah, BYTE PTR t1[ebp]
    add ah, BYTE PTR t2[ebp]
    mov BYTE PTR t4[ebp], BYTE PTR ah
    movzx eax, BYTE PTR t4[ebp]
    add eax, DWORD PTR t3[ebp]
    mov DWORD PTR t5[ebp], DWORD PTR eax
    mov eax, DWORD PTR t5[ebp]
    add eax, 1
    mov BYTE PTR t4[ebp], BYTE PTR al
    movzx eax, BYTE PTR t4[ebp]
    add eax, DWORD PTR t5[ebp]
    mov DWORD PTR t0[ebp], DWORD PTR eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret


