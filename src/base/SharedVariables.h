// What every part of the component shares while the host's object lives.
#pragma once

#include "platform/database/Connection.h"
#include "platform/database/Recordset.h"

#include <QMap>
#include <QString>

#include <memory>

namespace kest {

// Folder variables end in a backslash. All of this belongs to the host's user-interface thread.

extern db::ConnectionPtr gConn;  // null when there is no connection

extern QString gsUnreadPath;  // incoming messages not yet loaded
extern QString gsReadPath;    // messages that were loaded
extern QString gsUnsentPath;  // outgoing documents waiting for the transport
extern QString gsSentPath;    // outgoing documents that the transport has sent
extern QString gsImagesPath;  // the host's quote images

extern std::shared_ptr<db::Recordset> grsQuote;  // the host's quote while the panel is open
extern QString gsQTNNO;                          // "0" when no quote is open
extern QString gsSubQuote;

extern QString gsCurFolder;                       // the folder that the list window shows
extern QString gsListFolder;                      // its copy of the last fill, for the reports
extern QMap<QString, QString> gdicQuoteRequests;  // of the last fill: request number to file name
extern QString gsListFilter;                      // a listed file's name contains it
extern bool gbFilterAsked;                        // the filter prompt was answered for this choice of folder

extern QString gsMatchedQTNNO;  // from a manual quote's load to the file move behind it
extern QString gsDeletedQTNNO;  // from a deletion's load to the file move behind it
extern QString gsDeletedSubquote;

extern bool gbTabletLocal;  // the workstation runs on its own local database

}  // namespace kest
