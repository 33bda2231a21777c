// Copies files that arrived by mail or on a stick into the unread folder, as the transport would have done.
#pragma once

#include <QStringList>
#include <QUrl>

#include <functional>

namespace kest {

/// What happened to the files.
struct TakenIn {
    int messages = 0;
    int pictures = 0;
    int descriptions = 0;
    QStringList toList;   // the messages except responses, which the list never shows
    QStringList refused;  // "name: why"

    /// For example "Taken in: 2 messages, 1 picture."
    QString summary() const;
    /// The first ten refusals, one on each line, and how many more there are.
    QString refusals() const;
};

/// Copies messages, and the pictures and descriptions of requests, into the unread folder under their own names. The
/// pictures and descriptions are copied first, and no reader sees part of a file. The originals stay in their place.
///
/// Asks before it replaces a file of the same name. A file that is of another kind or can't be copied is listed in
/// TakenIn::refused, and the others are still copied.
TakenIn takeInFiles(const QList<QUrl>& urls, const std::function<void(qint64 done, qint64 total)>& progress = {});

}  // namespace kest
