// narrowToFloat: the float a FLOAT constant's double stands for.
#ifndef ZOA_EMIT_C_NARROW_FLOAT_H
#define ZOA_EMIT_C_NARROW_FLOAT_H

#include <cfloat>
#include <cmath>

namespace ZOA {

// Values beyond the float range round to FLT_MAX or to infinity as the
// hardware does, without undefined behaviour.
inline float narrowToFloat(double v) {
    double a = std::fabs(v);
    if (!(a > FLT_MAX)) return static_cast<float>(v);
    const double halfwayToInfinity = 0x1.ffffffp127;
    float r = a < halfwayToInfinity ? FLT_MAX : HUGE_VALF;
    return std::signbit(v) ? -r : r;
}

}  // namespace ZOA

#endif
