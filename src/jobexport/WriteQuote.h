// Hands an authorised quote to the shop's job-tracking system, JobLink, as a job in its MySQL database.
#pragma once

#include <QString>

namespace kest {

/// Writes one job with its header, lines and annotations; without a settings row for JobLink nothing happens. A job is
/// finished when its `Status` is 1; an export that fails leaves it at 0. Never fails towards the caller: what went
/// wrong is told by a box, except a server that cannot be reached, which is silent.
void WriteQuote(const QString& quoteNumber, const QString& subquote);

}  // namespace kest
