// Reads the messages of a folder into the rows of the list.
#pragma once

#include "messagelist/MessageRows.h"
#include "messages/Folders.h"
#include "platform/xml/xml.h"

#include <QDateTime>
#include <QList>
#include <QSet>
#include <QString>

#include <functional>

namespace kest {

/// A message of the list: its file's name and its row.
struct ListedMessage {
    QString file;
    MessageRow row;
};

/// A message of the unread folder that is not listed yet.
struct HeldMessage {
    QString file;
    QString type;
    QString waitsFor;
    QDateTime since;  // when the file was written

    /// Returns `since` as the windows show it.
    QString sinceText() const { return since.toString(QStringLiteral("dd/MM/yyyy HH:mm")); }
};

/// Callbacks of a fill.
struct FillHooks {
    /// Applies a submission response to its quote. Required if the folder contains such a file.
    std::function<void(QString& text, const QString& file)> submissionResponse;
    /// Called with the filter that the user has just typed into the prompt.
    std::function<void(const QString& filter)> filterAsked;
    /// Called after each file. The fill ends if it returns false.
    std::function<bool(qint64 done, qint64 total)> progress;
    /// Called with each unread message that is held back.
    std::function<void(const HeldMessage& message)> held = {};
};

/// Returns the messages of a folder in the order of their file names. Sets gsCurFolder, gsListFolder, gsListFilter and
/// gbFilterAsked.
///
/// If a file can't be parsed, a box says so and the file is left out. Throws RuntimeError for every other failure; the
/// description begins with the name of the file.
QList<ListedMessage> BuildMessageList(MessageFolder folder, const FillHooks& hooks);

/// Returns false if a picture that the request names is not among the files of the unread folder, whose names are given
/// with their case folded.
bool AllImagesPresent(const xml::Document& message, const QSet<QString>& unread);
/// Returns true if this fill has already listed an earlier message of the same request, or if the message can't be
/// read. A manual quote replaces the earlier message in `listed` instead.
bool IsHeldBehindEarlier(const xml::Document& message, QList<ListedMessage>& listed, const QString& file);

}  // namespace kest
