// The PDF that authorises a sublet.
#pragma once

#include <QByteArray>
#include <QStringList>

namespace kest::app {

/// One page with these lines, the same bytes for the same lines.
QByteArray authorityDocument(const QStringList& lines);

}  // namespace kest::app
