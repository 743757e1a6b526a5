static const char *ng0 = "he said \"hi\"";
static int ng1[] = {3, 1, 4, 1, 5, 9, 2, 6};
static const char *ng2 = "ab";
static const char *ng3 = "cdef";
static char *ng4[] = {"ab", "cdef"};



int slen()
{
    int t0;
    char *t1;

LAB0:    t1 = (char *)ng0;
    t0 = 0;

LAB2:    if (*((char *)t1) != (char)0)
        goto LAB3;

LAB1:    return t0;
LAB3:    t1 = (t1 + 1);
    t0 = (t0 + 1);
    goto LAB2;

}

int sumtab(int t1)
{
    int t0;
    int t2;
    char *t3;

LAB0:    t3 = (char *)ng1;
    t0 = 0;
    t2 = 0;

LAB2:    if (t2 < t1)
        goto LAB3;

LAB1:    return t0;
LAB3:    t0 = (t0 + (*((int *)((t3 + ((t2 * 4)))))));
    t2 = (t2 + 1);
    goto LAB2;

}

int pickc(int t1, int t2)
{
    int t0;
    char *t3;

LAB0:    t3 = (char *)ng4;
    t3 = *((char **)((t3 + ((t1 * 4)))));
    t0 = *((char *)((t3 + t2)));

LAB1:    return t0;
}

