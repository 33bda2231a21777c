#include "outbound/LineNumbers.h"

#include "platform/RuntimeError.h"
#include "platform/values.h"

#include <cmath>
#include <limits>
#include <numeric>

using namespace Qt::StringLiterals;

namespace kest {

namespace {
constexpr int highestNumber = std::numeric_limits<qint16>::max();
}

LineNumbers::LineNumbers() : freeFrom(highestNumber + 2)
{
    std::iota(freeFrom.begin(), freeFrom.end(), 0);
}

int LineNumbers::NextDocumentLine(const QString& seq)
{
    const double wanted = std::trunc(leadingNumber(seq));
    if (wanted > highestNumber)
        throw RuntimeError(Overflow, u"The line number %1 is too large for a quote document."_s.arg(seq));

    auto number = static_cast<size_t>(wanted > 0 ? wanted : 1);
    while (freeFrom[number] != static_cast<int>(number)) {
        const int next = freeFrom[static_cast<size_t>(freeFrom[number])];
        freeFrom[number] = next;  // shortens later searches, so that a quote without numbers takes linear time
        number = static_cast<size_t>(next);
    }
    if (number > highestNumber)
        throw RuntimeError(Overflow, u"A quote document can't have more than %1 lines."_s.arg(highestNumber));
    freeFrom[number] = static_cast<int>(number) + 1;
    return static_cast<int>(number);
}

}  // namespace kest
