.section .rodata
.align 4
.type ng1,@object
.size ng1,12
ng1:
.int 100
.int 200
.int 300

.section .rodata
.align 4
.type ng2,@object
.size ng2,4
ng2:
.int 1000




.intel_syntax noprefix
.text
.globl table
.type table,@function
table:
    t1 = 8
    t0 = -8
    t2 = -12
    t3 = -16
    t4 = -20

    push DWORD PTR ebp
    mov DWORD PTR ebp, DWORD PTR esp
    sub esp, 24
    mov DWORD PTR -4[ebp], DWORD PTR ebx
.La0:
    mov eax, DWORD PTR t1[ebp]
    imul eax, 4
    mov DWORD PTR t2[ebp], DWORD PTR eax
    mov eax, OFFSET FLAT:tab
    mov ebx, DWORD PTR t2[ebp]
    mov ebx, [eax + ebx]
    mov DWORD PTR t3[ebp], ebx
    mov eax, OFFSET FLAT:ng1
    mov eax, [eax + 8]
    mov DWORD PTR t4[ebp], eax
    mov eax, DWORD PTR t3[ebp]
    add eax, DWORD PTR t4[ebp]
    mov DWORD PTR t3[ebp], DWORD PTR eax
    mov eax, DWORD PTR t3[ebp]
    add eax, DWORD PTR ng2
    mov DWORD PTR t3[ebp], DWORD PTR eax
    mov eax, DWORD PTR t3[ebp]
    mov ebx, OFFSET FLAT:tab
    mov ecx, [ebx + 12]
    cmp DWORD PTR eax, DWORD PTR ecx
    jg .La2
.La3:
    mov eax, DWORD PTR t3[ebp]
    mov DWORD PTR t0[ebp], eax
.La1:
    mov eax, DWORD PTR t0[ebp]
    mov DWORD PTR ebx, DWORD PTR -4[ebp]
    leave
    ret
.La2:
    mov eax, DWORD PTR t3[ebp]
    add eax, 1
    mov DWORD PTR t3[ebp], DWORD PTR eax
    jmp .La3


