// A folder that each preview of an unattended run is written to.
#pragma once

#include <QJsonObject>
#include <QString>

namespace kest::report {

class Report;

/// Each preview from now on writes `<n>-<number>.pdf` and `<n>-<number>.json` there, n counting from 1. Makes the
/// folder, a path of this system; empty turns it off. Throws where it cannot be made.
void setOutputFolder(const QString& folder);

/// Writes one preview there; nothing without a folder. What cannot be written is told on standard error: the preview
/// goes on.
void writeOutput(int number, const Report& report, const QJsonObject& shown);

}  // namespace kest::report
