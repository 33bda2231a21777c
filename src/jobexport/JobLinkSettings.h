// Where JobLink's database is: the one settings row of an outside system.
#pragma once

#include <QString>

namespace kest {

struct JobLinkSettings {
    QString server;
    int port = 3306;
    QString database;
    QString user;
    QString password;  // in clear; stored enciphered only
};

/// Writes the row, in place of one that is there. The cipher's key must be set. Throws RuntimeError.
void storeJobLinkSettings(const JobLinkSettings& settings);

}  // namespace kest
