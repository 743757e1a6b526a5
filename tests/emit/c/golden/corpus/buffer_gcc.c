


int bufsum(int t1, int t2, int t3)
{
    char t4[16];
    int t0;

LAB0:    *((int *)t4) = t1;
    *((int *)((t4 + 4))) = t2;
    *((int *)((t4 + 8))) = t3;
    *((unsigned char *)((t4 + 12))) = (unsigned char)1;
    t0 = ((((*((int *)t4)) + (((*((int *)((t4 + 4)))) * (*((int *)((t4 + 8)))))))) + (((int)((*((unsigned char *)((t4 + 12))))))));

LAB1:    return t0;
}

