// What this component adds to a quote database: indexes, and tables of its own.
#pragma once

#include "platform/database/Connection.h"

#include <QList>
#include <QString>
#include <QStringList>

namespace kest::app {

/// A part that a database lacks.
struct MissingPart {
    QString what;            // without an article: "index of QUOTE1 by QTNNO"
    QStringList statements;  // which create it
};

/// Returns the missing parts. Reads only. An index of another name that serves the same searches is enough, and a table
/// that the host lacks needs none.
QList<MissingPart> missingParts(const db::ConnectionPtr& connection);

/// Executes the statements of these parts. Throws RuntimeError if one fails; what the others have created remains.
void createParts(const db::ConnectionPtr& connection, const QList<MissingPart>& parts);

}  // namespace kest::app
