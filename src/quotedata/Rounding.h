// The one rounding of money: every amount that is stored or sent goes through it.
#pragma once

namespace kest {

/// Half away from zero at `places` decimal places, on the binary value: 2.345 gives 2.35, but 1.005 gives 1, since the
/// double behind it lies below the half. The result is also left in `value`.
/// Throws Overflow where the scaled value does not fit 32 bits: above 21,474,836.47 at 2 places.
double RoundAmount(double& value, int places);
inline double RoundAmount(double&& value, int places)
{
    return RoundAmount(value, places);
}

/// The value with its fraction cut off, toward zero. The fraction is what stands behind the point of the general number
/// text, so a value that shows no point at 15 digits comes back as it is. A failure shows a box and gives 0.
double RoundDown(const double& value);

}  // namespace kest
