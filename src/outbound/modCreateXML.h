// Writes the documents of a quote into the outgoing folder, from where the transport program takes them.
#pragma once

#include "platform/database/Recordset.h"

#include <QString>

namespace kest {

/// Builds the quote document, writes it, and marks the quote as sent. Asks for the extra vehicle values where the
/// insurer wanted them. `quote` stays on its row. The quote total; 0 after a refusal, whose message has been shown.
double CreateQuoteXML(db::Recordset& quote);

/// Puts a document and a copy of each photograph of the quote into the outgoing folder.
void CreateImageXML(const QString& imagesPath, db::Recordset& quote);

}  // namespace kest
