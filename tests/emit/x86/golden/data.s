.section .data
.align 4
.type tab,@object
.size tab,12
tab:
.int 1
.int 2
.int 3

.section .rodata
.align 4
.type ng1,@object
.size ng1,0
ng1:

.section .rodata
.align 4
.type ng2,@object
.size ng2,2
ng2:
.byte 65
.byte 66

.section .rodata
.align 4
ng3:
.string "say "hi""

.section .rodata
.align 8
.type ng4,@object
.size ng4,8
ng4:
.quad -5




