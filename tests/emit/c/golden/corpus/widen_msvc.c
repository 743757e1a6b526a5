


int widen(unsigned char t1, char t2, int t3)
{
    int t0;

LAB0:    t0 = ((((((int)(t1))) + t3)) - (((((int)(t2))) * t3)));

LAB1:    return t0;
}

int narrow(int t1)
{
    int t0;
    unsigned char t2;

LAB0:    t2 = ((unsigned char)(t1));
    t0 = (t2 + 0);

LAB1:    return t0;
}

int absdiff(int t1, int t2)
{
    int t0;
    int t3;

LAB0:    t3 = (t1 - t2);
    t0 = (((t3>=0?t3: -t3)) + ((-(0))));

LAB1:    return t0;
}

