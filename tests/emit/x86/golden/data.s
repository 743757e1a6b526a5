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
.size ng1,2
ng1:
.byte 65
.byte 66

.section .rodata
.align 4
ng2:
.string "say "hi""

.section .rodata
.align 8
.type ng3,@object
.size ng3,8
ng3:
.quad -5




