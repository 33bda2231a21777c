// Stores the connection settings of JobLink's database.
#pragma once

#include <QString>

namespace kest {

/// How to connect to JobLink's database.
struct JobLinkSettings {
    QString server;
    int port = 3306;
    QString database;
    QString user;
    QString password;  // plain text; storeJobLinkSettings() encrypts it
};

/// Writes the settings row and replaces an existing one. Call InitCipherKey() first. Throws RuntimeError if it fails.
void storeJobLinkSettings(const JobLinkSettings& settings);

}  // namespace kest
