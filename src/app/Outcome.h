// What a command of `kest2` answers, and how it speaks.
#pragma once

#include "app/CommandLine.h"

#include <QJsonObject>
#include <QString>

#include <cstdio>

namespace kest::app {

/// What a command adds to the answer that all commands give.
struct Outcome {
    int exitCode = Done;
    QJsonObject fields{};  // of the JSON object
    QString text{};        // on standard output without --json
    bool isWhole = false;  // `fields` is the whole JSON object
};

/// On standard output, or on another stream, at once.
void say(const QString& text, std::FILE* stream = stdout);

/// Says on standard error why a command does nothing.
Outcome refused(const QString& why, int exitCode);

}  // namespace kest::app
