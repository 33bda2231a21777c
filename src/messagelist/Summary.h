// Turns the messages of one folder into the rows of the list.
#pragma once

#include "platform/xml/xml.h"

#include <QList>
#include <QString>

#include <array>
#include <functional>

namespace kest {

/// Message type, rego, claim number, customer, quote number, vehicle description.
using MessageRow = std::array<QString, 6>;

struct ListedMessage {
    QString file;
    MessageRow row;
};

enum MessageFolder : int { Unread = 0, Read = 1, Sent = 2 };

/// What a fill leaves to others.
struct FillHooks {
    /// Takes a submission response of the network into its quote; every fill over such a file needs it.
    std::function<void(QString& text, const QString& file)> submissionResponse;
    /// Shows the filter that the fill has asked for.
    std::function<void(const QString& filter)> filterAsked;
    std::function<void(qint64 done, qint64 total)> progress;
};

/// Fills from a folder in the order of its file names. Sets gsCurFolder, gsListFolder, gsListFilter, gbFilterAsked.
/// A file that cannot be parsed is reported by a box and left out; every other failure is thrown, its description
/// naming the file.
QList<ListedMessage> BuildMessageList(int folder, const FillHooks& hooks);

/// False while a picture that the request names has not arrived in the unread folder.
bool AllImagesPresent(const xml::Document& message);
/// True for a message that waits behind an earlier one of its request; a manual quote takes the earlier one's place.
bool IsHeldBehindEarlier(const xml::Document& message, QList<ListedMessage>& listed, const QString& file);
/// The row of a network message or, with the type name "SENT", of a wrapped outbound document. Never fails.
MessageRow GetMessageRow(const QString& text, const QString& typeName);
MessageRow GetMarkerRow(const QString& text, const QString& typeName);
/// The same, of a prepared text that was parsed before.
MessageRow GetMessageRow(const xml::Document& message, const QString& typeName);
MessageRow GetMarkerRow(const xml::Document& marker, const QString& typeName);

}  // namespace kest
