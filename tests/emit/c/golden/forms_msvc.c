static char ng0[1];
static const char *ng1 = "say \"hi\"\" tab	";
static int ng2[] = {1, 2, 3};
static int ng3 = 42;
static double ng4 = 2.5000000000000000;
static char *state;
static char ng6[1];
extern char *buf;
static const char *ng9 = "x";
static char *ng10[] = {"x", (void *)ext_fn};
static unsigned char ng11[] = {(unsigned char)200, (unsigned char)7};
static float ng12[] = {0.1, 3};

void bar();
static int foo(int , char *);
static extern int forms(int , char *, unsigned char , double );
void ext_fn();


static extern int forms(int t1, char *t2, unsigned char t3, double t4)
{
    char t5[16];
    char t8[8];
    int t0;
    int t6;
    char *t9;
    uint64 t10;
    float t11;
    char *t12;
    static char *nl0[2];
__asm {
MOV EAX, LAB3;
MOV DWORD PTR nl0+0, EAX;
MOV EAX, LAB4;
MOV DWORD PTR nl0+4, EAX;
}
    static const char *nl1 = "local";
    static int64 nl2 = -7LL;

LAB0:    foo(t1, 5);
(t1 + t6);
    t9 = (char *)ng2;
    t9 = (char *)((ng2) + t1);
    t9 = (char *)nl1;
    *((int *)t5) = (t1 + 1);
    *((unsigned char *)((t8 + 8))) = t3;
    t6 = (t1>=0?t1: -t1);
    t6 = (-(t6));
    t6 = ((int)(((t6 * t6))));
    t6 = ((t6));
    t9 = ((char*)(t6));
    t10 = 18446744073709551615LL;
    t10 = (t10 ^ -3LL);
    t11 = 0.1;
    t6 = ((char)-5 % 7U);
    t9 = "raw";
    t9 = (char *)malloc(16U);
    t9 = Malloc(16U);
    t12 = (void *)ext_fn;
    t6 = ((int  (*)(int , char *))t12)(t1, t2);
    t6 = ((nl2) + (ng3));
    __asm {
        MOV EAX, LAB2
        MOV EDX, [t2]
        MOV [EDX], EAX
    };
    __asm {
        MOV EAX, LAB3
        MOV t9, EAX
    };
    t9 = state;
    if (*((double *)t2) >= 10000000000000000.)
        goto LAB3;

LAB2:    if (t6 == 0)
        goto LAB4;

LAB5:;
LAB3:    t9 = (char *)nl0;
    t9 = *((char **)t9);
    __asm {
        JMP [t9]
    }

LAB4:    t6 = buf;
    __asm {
        JMP t9
    }

LAB6:    t0 = t6;
    return t0;
LAB7:    if (t1 < 0)
        goto LAB2;
    else
        goto LAB3;

LAB1:    goto LAB2;
    return t0;
}

void nothing()
{

LAB0:
LAB1:    return;
}

