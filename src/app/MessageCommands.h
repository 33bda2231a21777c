// The commands that do from a terminal what the message list and "Send Quote" do.
#pragma once

#include "app/Outcome.h"

#include <QStringList>

namespace kest::app {

// A connection must be open, and a script must answer the desktop.
Outcome list(const QStringList& arguments);
Outcome load(const QStringList& arguments);
Outcome reprint(const QStringList& arguments);
Outcome view(const QStringList& arguments);
Outcome send(const QStringList& arguments);

}  // namespace kest::app
