


int sw(int t1)
{
    int t0;
    char *t2;
    char *t3;
    static char *nl0[] = {&&LAB4, &&LAB5, &&LAB6};

LAB0:    if (t1 >= 3)
        goto LAB3;

LAB2:    t2 = (char *)nl0;
    t2 = (t2 + ((t1 * 4)));
    goto **((char **)t2);

LAB3:    t3 = &&LAB7;
    goto *t3;

LAB4:    t0 = 10;

LAB1:    return t0;
LAB5:    t0 = 20;
    goto LAB1;

LAB6:    t0 = 30;
    goto LAB1;

LAB7:    t0 = 99;
    goto LAB1;

}

