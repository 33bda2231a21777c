// The results of the commands of `kest2`.
#pragma once

#include "app/CommandLine.h"

#include <QJsonObject>
#include <QString>

#include <cstdio>

namespace kest::app {

/// What a command adds to the answer that all commands have in common.
struct Outcome {
    int exitCode = Done;
    QJsonObject fields{};  // of the JSON object
    QString text{};        // printed on standard output without --json
    bool isWhole = false;  // `fields` is the whole JSON object
};

/// Prints a text and flushes the stream.
void say(const QString& text, std::FILE* stream = stdout);

/// Prints on standard error why a command does nothing, and returns an outcome with this exit code.
Outcome refused(const QString& why, int exitCode);

}  // namespace kest::app
