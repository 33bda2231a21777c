// The commands that correspond to the message list and to "Send Quote".
#pragma once

#include "app/Outcome.h"

#include <QStringList>

namespace kest::app {

// Before any of these commands, a connection must be open and a script must be in use.
Outcome list(const QStringList& arguments);
Outcome held(const QStringList& arguments);
Outcome load(const QStringList& arguments);
Outcome reprint(const QStringList& arguments);
Outcome view(const QStringList& arguments);
Outcome send(const QStringList& arguments);

}  // namespace kest::app
