// The names GCC treats as built-in functions (under -std=gnu99), which a C text may not declare otherwise.
#include "emit/c/gcc_builtins.h"

#include <algorithm>
#include <iterator>

namespace ZOA::ctext {

namespace {

// Sorted (ASCII), for the binary search. Each one draws "conflicting types for
// built-in function" when declared with another signature.
const std::string_view BUILTINS[] = {
    "_Exit", "_exit", "abort", "abs", "acos", "acosf", "acosh", "acoshf", "acoshl", "acosl",
    "aligned_alloc", "alloca", "asin", "asinf", "asinh", "asinhf", "asinhl", "asinl", "atan",
    "atan2", "atan2f", "atan2l", "atanf", "atanh", "atanhf", "atanhl", "atanl", "bcmp", "bcopy",
    "bzero", "cabs", "cabsf", "cabsl", "cacos", "cacosf", "cacosh", "cacoshf", "cacoshl", "cacosl",
    "calloc", "carg", "cargf", "cargl", "casin", "casinf", "casinh", "casinhf", "casinhl", "casinl",
    "catan", "catanf", "catanh", "catanhf", "catanhl", "catanl", "cbrt", "cbrtf", "cbrtl", "ccos",
    "ccosf", "ccosh", "ccoshf", "ccoshl", "ccosl", "ceil", "ceilf", "ceill", "cexp", "cexpf",
    "cexpl", "cimag", "cimagf", "cimagl", "clog", "clog10", "clog10f", "clog10l", "clogf", "clogl",
    "conj", "conjf", "conjl", "copysign", "copysignf", "copysignl", "cos", "cosf", "cosh", "coshf",
    "coshl", "cosl", "cosl", "cpow", "cpowf", "cpowl", "cproj", "cprojf", "cprojl", "creal",
    "crealf", "creall", "csin", "csinf", "csinh", "csinhf", "csinhl", "csinl", "csqrt", "csqrtf",
    "csqrtl", "ctan", "ctanf", "ctanh", "ctanhf", "ctanhl", "ctanl", "dcgettext", "dgettext",
    "drem", "dremf", "dreml", "erf", "erfc", "erfcf", "erfcl", "erff", "erfl", "execl", "execle",
    "execlp", "execv", "execve", "execvp", "exit", "exp", "exp10", "exp10f", "exp10l", "exp2",
    "exp2f", "exp2l", "expf", "expl", "expm1", "expm1f", "expm1l", "fabs", "fabsf", "fabsl", "fdim",
    "fdimf", "fdiml", "ffs", "ffsl", "ffsll", "finite", "finitef", "finitel", "floor", "floorf",
    "floorl", "fma", "fmaf", "fmal", "fmax", "fmaxf", "fmaxl", "fmin", "fminf", "fminl", "fmod",
    "fmodf", "fmodl", "fork", "fprintf", "fprintf_unlocked", "fputc", "fputc", "fputc_unlocked",
    "fputs", "fputs_unlocked", "free", "frexp", "frexpf", "frexpl", "frexpl", "fscanf", "fwrite",
    "fwrite_unlocked", "gamma", "gamma_r", "gammaf", "gammaf_r", "gammal", "gammal_r", "gettext",
    "hypot", "hypotf", "hypotl", "ilogb", "ilogbf", "ilogbl", "imaxabs", "index", "isalnum",
    "isalpha", "isascii", "isblank", "iscntrl", "isdigit", "isgraph", "isinf", "isinff", "isinfl",
    "islower", "isnan", "isnanf", "isnanl", "isprint", "ispunct", "isspace", "isupper", "iswalnum",
    "iswalpha", "iswblank", "iswcntrl", "iswdigit", "iswgraph", "iswlower", "iswprint", "iswpunct",
    "iswspace", "iswupper", "iswxdigit", "isxdigit", "j0", "j0f", "j0l", "j1", "j1f", "j1l", "jn",
    "jnf", "jnl", "labs", "ldexp", "ldexpf", "ldexpl", "lgamma", "lgamma_r", "lgammaf", "lgammaf_r",
    "lgammal", "lgammal_r", "llabs", "llrint", "llrintf", "llrintl", "llround", "llroundf",
    "llroundl", "log", "log10", "log10f", "log10l", "log1p", "log1pf", "log1pl", "log2", "log2f",
    "log2l", "logb", "logbf", "logbl", "logf", "logl", "lrint", "lrintf", "lrintl", "lround",
    "lroundf", "lroundl", "malloc", "memchr", "memcmp", "memcpy", "memmove", "mempcpy", "memset",
    "modf", "modff", "modfl", "nan", "nanf", "nanl", "nearbyint", "nearbyintf", "nearbyintl",
    "nextafter", "nextafterf", "nextafterl", "nexttoward", "nexttowardf", "nexttowardl",
    "posix_memalign", "pow", "pow10", "pow10f", "pow10l", "powf", "powl", "printf",
    "printf_unlocked", "putc", "putchar", "putchar_unlocked", "puts", "puts_unlocked", "realloc",
    "remainder", "remainderf", "remainderl", "remquo", "remquof", "remquol", "rindex", "rint",
    "rintf", "rintl", "round", "roundf", "roundl", "scalb", "scalbf", "scalbl", "scalbln",
    "scalblnf", "scalblnl", "scalbn", "scalbnf", "scalbnl", "scanf", "signbit", "signbitf",
    "signbitl", "significand", "significandf", "significandl", "sin", "sincos", "sincosf",
    "sincosl", "sinf", "sinh", "sinhf", "sinhl", "sinl", "sinl", "snprintf", "sprintf", "sqrt",
    "sqrtf", "sqrtl", "sscanf", "stpcpy", "stpncpy", "strcasecmp", "strcat", "strchr", "strcmp",
    "strcpy", "strcspn", "strdup", "strfmon", "strftime", "strlen", "strncasecmp", "strncat",
    "strncmp", "strncpy", "strndup", "strnlen", "strpbrk", "strrchr", "strspn", "strstr", "tan",
    "tanf", "tanh", "tanhf", "tanhl", "tanl", "tgamma", "tgammaf", "tgammal", "toascii", "tolower",
    "toupper", "towlower", "towupper", "trunc", "truncf", "truncl", "vfprintf", "vfscanf",
    "vprintf", "vscanf", "vsnprintf", "vsprintf", "vsscanf", "y0", "y0f", "y0l", "y1", "y1f", "y1l",
    "yn", "ynf", "ynl",
};

}  // namespace

bool isGccBuiltinName(std::string_view name) {
    return std::binary_search(std::begin(BUILTINS), std::end(BUILTINS), name);
}

}  // namespace ZOA::ctext
