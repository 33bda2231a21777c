// The variables that all parts of the component share while the host's object lives.
#pragma once

#include "platform/database/Connection.h"
#include "platform/database/Recordset.h"

#include <QMap>
#include <QString>

#include <memory>

namespace kest {

// Folder variables end in a backslash. Use these variables only on the host's user-interface thread.

extern db::ConnectionPtr gConn;  // null if there is no connection

extern QString gsUnreadPath;  // incoming messages not yet loaded
extern QString gsReadPath;    // messages that were loaded
extern QString gsUnsentPath;  // outgoing documents waiting for the transport
extern QString gsSentPath;    // outgoing documents that the transport has sent
extern QString gsImagesPath;  // the host's quote images

extern std::shared_ptr<db::Recordset> grsQuote;  // the host's quote while the panel is open
extern QString gsQTNNO;                          // "0" if no quote is open
extern QString gsSubQuote;

extern QString gsCurFolder;                       // the folder that the list window shows
extern QString gsListFolder;                      // the folder of the last fill, for the reports
extern QMap<QString, QString> gdicQuoteRequests;  // of the last fill: from request number to file name
extern QString gsListFilter;                      // the list shows files whose name contains this text
extern bool gbFilterAsked;                        // the user has answered the filter prompt for this choice of folder

extern QString gsMatchedQTNNO;  // passed from a manual quote's load to the file move that follows
extern QString gsDeletedQTNNO;  // passed from a deletion's load to the file move that follows
extern QString gsDeletedSubquote;

extern bool gbTabletLocal;  // the workstation runs on its own local database

}  // namespace kest
