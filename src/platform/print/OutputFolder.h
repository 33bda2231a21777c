// Writes the previews of an unattended run to a folder.
#pragma once

#include <QJsonObject>
#include <QString>

namespace kest::report {

class Report;

/// Sets and creates the folder, a path of this system. Each preview is written there as `<n>-<number>.pdf` and
/// `<n>-<number>.json`, with n counting from 1. An empty path turns this off. Throws if the folder can't be created.
void setOutputFolder(const QString& folder);

/// Writes a preview to the folder. Does nothing if no folder is set. If a file can't be written, says so on standard
/// error and returns normally.
void writeOutput(int number, const Report& report, const QJsonObject& shown);

}  // namespace kest::report
