static int ng0 = 41;
static char ng1[1];
static char *zoa_slot;
extern char *zoa_ext;



int tick()
{
    int t0;
    static int nl0 = 0;

LAB0:nl0 = ((nl0) + 1);
    t0 = ((ng0) + (nl0));

LAB1:    return t0;
}

int bytes()
{
    int t0;
    char *t1;

LAB0:    t1 = (char *)ng1;
    *((unsigned char *)t1) = (unsigned char)7;
zoa_slot = t1;
    t0 = ((*((unsigned char *)(zoa_slot))) + (*((char *)(((zoa_ext) + 1)))));

LAB1:    return t0;
}

double area(double t1)
{
    double t0;

LAB0:    t0 = (((t1 * t1)) * 3.1415899999999999);

LAB1:    return t0;
}

float half(float t1)
{
    float t0;

LAB0:    t0 = (t1 * 0.5);

LAB1:    return t0;
}

