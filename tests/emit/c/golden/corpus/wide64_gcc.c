


int64 mul64(int64 t1, int64 t2)
{
    int64 t0;

LAB0:    t0 = (((t1 * t2)) + 1099511627776LL);

LAB1:    return t0;
}

uint64 top64()
{
    uint64 t0;
    uint64 t1;

LAB0:    t1 = 18446744073709551615LL;
    t0 = (t1 >> 60);

LAB1:    return t0;
}

int64 square64(int t1)
{
    int64 t0;

LAB0:    t0 = ((((int64)(t1))) * (((int64)(t1))));

LAB1:    return t0;
}

