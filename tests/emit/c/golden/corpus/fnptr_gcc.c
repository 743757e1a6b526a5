
void zoa_negate();
void zoa_triple();


int apply(int t1)
{
    int t0;
    char *t2;

LAB0:    t2 = (void *)zoa_triple;
    t0 = ((int  (*)(int ))t2)(t1);

LAB1:    return t0;
}

int pick(int t1, int t2)
{
    int t0;
    char *t3;
    char *t4;
    static char *nl0[] = {(void *)zoa_triple, (void *)zoa_negate};

LAB0:    t3 = (char *)nl0;
    t4 = *((char **)((t3 + ((t1 * 4)))));
    t0 = ((int  (*)(int ))t4)(t2);

LAB1:    return t0;
}

