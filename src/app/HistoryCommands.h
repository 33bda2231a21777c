// The commands that list what happened to a quote, and undo a load.
#pragma once

#include "app/Outcome.h"
#include "recovery/Recovery.h"

#include <QJsonArray>
#include <QStringList>

namespace kest::app {

/// `history QTNNO [SUBQUOTE]`
Outcome history(const QStringList& arguments);
/// `undo OPERATION`
Outcome undo(const QStringList& arguments);

/// Returns interrupted operations for the JSON object of a command.
QJsonArray jsonOf(const QList<recovery::Settled>& operations);

}  // namespace kest::app
