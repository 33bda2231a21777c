// Takes files that a person brings, by mail or on a stick, into the unread folder, as the transport would have done.
#pragma once

#include <QStringList>
#include <QUrl>

#include <functional>

namespace kest {

/// What became of the files.
struct TakenIn {
    int messages = 0;
    int pictures = 0;
    int descriptions = 0;
    QStringList toList;   // the messages, but for responses, which no list shows
    QStringList refused;  // "name: why"

    /// "Taken in: 2 messages, 1 picture."
    QString summary() const;
    /// The first of those refused, a line each, and how many more there are.
    QString refusals() const;
};

/// Copies messages, and the pictures and descriptions of requests, under their own names; each appears whole or not at
/// all, and what belongs to a message before it. Nothing is taken away where it lay.
/// Before a file of the same name is replaced a box asks. What is no such file, and what could not be copied, is
/// refused and the others go on.
TakenIn takeInFiles(const QList<QUrl>& urls, const std::function<void(qint64 done, qint64 total)>& progress = {});

}  // namespace kest
