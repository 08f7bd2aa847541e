#pragma once

namespace kestaccel {
namespace utility {
namespace cpp {

// Modified Bessel function of the first kind, order zero, as one fixed
// rational function of y = x * x (numerator of degree 14, denominator of
// degree 3), evaluated in double with Horner's rule. No series and no
// stopping rule, so the value depends on nothing but x.
//
// Accurate to about 4e-15 up to |x| = 15; the error grows beyond that, and
// the denominator has a zero near |x| = 33.5, past which the value means
// nothing. The range is deliberately not tested.
inline double BesselI0(double x)
{
    if (x == 0.0) return 1.0;
    const double y = x * x;
    double p = 2.10580722890567e-23;
    p = p * y + 3.80715242345326e-20;
    p = p * y + 4.794402575483e-17;
    p = p * y + 4.35125971262668e-14;
    p = p * y + 3.0093112711296e-11;
    p = p * y + 1.60224679395361e-08;
    p = p * y + 6.54858370096785e-06;
    p = p * y + 0.00202591084143397;
    p = p * y + 0.463076284721;
    p = p * y + 75.4337328948189;
    p = p * y + 8307.92541809429;
    p = p * y + 571661.130563785;
    p = p * y + 21641557.2361227;
    p = p * y + 356644482.244025;
    p = p * y + 1440482982.27235;
    const double q = ((y - 3076.46912682801) * y + 3476263.32405882) * y - 1440482982.27235;
    return (-p) / q;
}

}  // namespace cpp
}  // namespace utility
}  // namespace kestaccel
