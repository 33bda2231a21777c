// What is left of a load after its last update, for a load that was interrupted there.
#pragma once

#include <QString>

namespace kest {

/// Moves the pictures of a quote request that were not moved yet, and the shop's counter.
void finishRequest(QString& text, const QString& quoteNumber);

}  // namespace kest
