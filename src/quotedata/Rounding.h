// Rounds money. Every amount that is stored or sent is rounded here.
#pragma once

namespace kest {

/// Rounds half away from zero to `places` decimal places, and returns the result, also in `value`. Rounds the binary
/// value: 2.345 becomes 2.35, but 1.005 becomes 1, because the nearest double is below the half.
///
/// Throws Overflow if the scaled value does not fit into 32 bits: above 21,474,836.47 with 2 places.
double RoundAmount(double& value, int places);
inline double RoundAmount(double&& value, int places)
{
    return RoundAmount(value, places);
}

/// Rounds toward zero. The fraction is the part after the point of the number's text with up to 15 digits; a value
/// whose text has no point is returned unchanged. If anything fails, shows a box and returns 0.
double RoundDown(const double& value);

}  // namespace kest
