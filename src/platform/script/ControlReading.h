// Reads a window's controls.
#pragma once

#include <QJsonObject>
#include <QStringList>

class QDialog;

namespace kest::desktop::controls {

/// Returns text, enabled, visible, checked and rows of each named control, as far as it has them. Without names, reads
/// all controls. Throws a Refusal if there is no control of a name.
QJsonObject read(QDialog& window, const QStringList& names);

}  // namespace kest::desktop::controls
