
char *alloca(unsigned int );
void free(char *);
char *malloc(unsigned int );


int onheap(int t1)
{
    int t0;
    char *t2;

LAB0:    t2 = (char *)malloc(16U);
    *((int *)t2) = t1;
    *((int *)((t2 + 4))) = (t1 * 2);
    t0 = ((*((int *)t2)) + (*((int *)((t2 + 4)))));
    free(t2);

LAB1:    return t0;
}

int onstack(int t1)
{
    int t0;
    char *t2;

LAB0:    t2 = (char *)alloca(16U);
    *((int *)t2) = t1;
    *((int *)((t2 + 4))) = (t1 * 2);
    t0 = ((*((int *)t2)) + (*((int *)((t2 + 4)))));

LAB1:    return t0;
}

