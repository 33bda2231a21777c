// The command that lists what happened to a quote.
#pragma once

#include "app/Outcome.h"

#include <QStringList>

namespace kest::app {

/// `history QTNNO [SUBQUOTE]`
Outcome history(const QStringList& arguments);

}  // namespace kest::app
