// Exports authorised quotes to the shop's job-tracking system, JobLink, as jobs in its MySQL database.
#pragma once

#include <QString>

namespace kest {

/// Writes a job with its header, lines and notes. Does nothing if JobLink has no settings row. The `Status` of a
/// complete job is 1, and that of a failed export stays 0. Never throws: a box says that the export failed, or nothing
/// does if the server can't be reached.
void WriteQuote(const QString& quoteNumber, const QString& subquote);

/// Returns true if JobLink has all of that job, and false if it does not or can't be asked.
bool isJobComplete(qint64 jobId);

}  // namespace kest
