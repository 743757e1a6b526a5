


int fact(int t1)
{
    int t0;
    int t2;

LAB0:    if (t1 <= 1)
        goto LAB2;

LAB3:    t2 = fact((t1 - 1));
    t0 = (t1 * t2);

LAB1:    return t0;
LAB2:    t0 = 1;
    goto LAB1;

}

