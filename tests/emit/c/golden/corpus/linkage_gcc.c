
static int helper(int );
extern int twice(int );


int user(int t1)
{
    int t0;

LAB0:    t0 = ((helper(t1)) + (twice(t1)));

LAB1:    return t0;
}

static int helper(int t1)
{
    int t0;

LAB0:    t0 = (t1 + 1);

LAB1:    return t0;
}

extern int twice(int t1)
{
    int t0;

LAB0:    t0 = (t1 * 2);

LAB1:    return t0;
}

