#include "quotedata/Rounding.h"

#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/values.h"

#include <cmath>

using namespace Qt::StringLiterals;

namespace kest {

double RoundAmount(double& value, int places)
{
    for (int place = 0; place < places; ++place)
        value *= 10;
    if (!std::isfinite(value))
        throw RuntimeError(Overflow, u"Overflow"_s);

    const auto whole = static_cast<double>(toLong(RoundDown(value)));
    if (value - whole >= 0.5)
        value += 1;
    if (value - whole <= -0.5)
        value -= 1;
    value = RoundDown(value);

    for (int place = 0; place < places; ++place)
        value /= 10;
    return value;
}

double RoundDown(const double& value)
{
    // the text has 15 digits, so for an amount that is not too close to a whole number it says nothing else
    constexpr double mostExact = 1e9;
    constexpr double tooClose = 1e-5;
    const double whole = std::trunc(value);
    if (std::abs(value) < mostExact && (value == whole || std::abs(value - std::round(value)) > tooClose))
        return whole;
    try {
        const QString text = numberText(value);
        if (text.contains(u'E'))  // so large that it has no fraction, or so small that it has only a fraction
            return std::abs(value) < 1 ? 0 : value;
        const qsizetype point = text.indexOf(u'.');
        return point < 0 ? value : toDouble(text.left(point + 1));
    } catch (const RuntimeError& error) {
        desktop::msgBox(error.description(), desktop::Icon::Information, u"Round Down"_s);
        return 0;
    }
}

}  // namespace kest
