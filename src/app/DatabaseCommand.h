// The command `check-database`.
#pragma once

#include "app/Outcome.h"

#include <QStringList>

namespace kest::app {

/// Tries everything that the component relies on; a connection must be open. `--prepare` first creates what is ours and
/// missing. The command is refused if anything does not hold.
Outcome checkDatabase(const QStringList& arguments);

}  // namespace kest::app
