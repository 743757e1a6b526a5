


int sw(int t1)
{
    int t0;
    char *t2;
    char *t3;
    static char *nl0[3];
__asm {
MOV EAX, LAB4;
MOV DWORD PTR nl0+0, EAX;
MOV EAX, LAB5;
MOV DWORD PTR nl0+4, EAX;
MOV EAX, LAB6;
MOV DWORD PTR nl0+8, EAX;
}

LAB0:    if (t1 >= 3)
        goto LAB3;

LAB2:    t2 = (char *)nl0;
    t2 = (t2 + ((t1 * 4)));
    t2 = *((char **)t2);
    __asm {
        JMP [t2]
    }

LAB3:    __asm {
        MOV EAX, LAB7
        MOV t3, EAX
    };
    __asm {
        JMP t3
    }

LAB4:    t0 = 10;

LAB1:    return t0;
LAB5:    t0 = 20;
    goto LAB1;

LAB6:    t0 = 30;
    goto LAB1;

LAB7:    t0 = 99;
    goto LAB1;

}

