


static int count(int t1)
{
    int t0;
    int t2;

LAB0:    t2 = 0;

LAB2:    if (t2 < t1)
        goto LAB3;

LAB1:    t0 = t2;
    return t0;
LAB3:    t2 = (t2 + 1);
    goto LAB2;

}

