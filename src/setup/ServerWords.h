// The words of each kind of server for what the check of a database tries.
#pragma once

#include "setup/HostTables.h"

#include <QList>
#include <QString>

#include <utility>

namespace kest::app {

/// What is different from server to server.
struct ServerWords {
    QString identity;
    QString text;      // of 20 characters
    QString national;  // the same, with any letter
    QString number;    // with 15 digits
    QString flag;
    QString money;   // with 4 decimals
    QString moment;  // finer than a second
    QString longText;
    QString nationalLongText;
    QString olderLongText;
    QString trigger;    // of the table %1, which counts in the table %2; empty if nobody else can make one
    QString slow;       // takes longer than anyone waits
    QString ownNumber;  // of a connection, for KILL; empty if there is no server
    QList<std::pair<QString, QString>> facts;
};

/// Returns the words of a kind of server.
const ServerWords& wordsOf(Server server);

}  // namespace kest::app
