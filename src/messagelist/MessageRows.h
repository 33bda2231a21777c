// Makes the rows of the list from messages and the quotes that they belong to.
#pragma once

#include "platform/xml/xml.h"

#include <QList>
#include <QString>

#include <array>

namespace kest {

struct MessageType;

/// Message type, rego, claim number, customer, quote number, vehicle description.
using MessageRow = std::array<QString, 6>;

/// Returns the row of a network message or, if `typeName` is "SENT", of a wrapped outbound document. Never throws: a
/// value that can't be read stays empty or becomes "-".
MessageRow GetMessageRow(const QString& text, const QString& typeName);
/// Returns the row of a marker, such as a notice that a quote was sent twice. Never throws.
MessageRow GetMarkerRow(const QString& text, const QString& typeName);
/// The same for a text that has already been prepared and parsed.
MessageRow GetMessageRow(const xml::Document& message, const QString& typeName);
MessageRow GetMarkerRow(const xml::Document& marker, const QString& typeName);

/// A row that may lack what comes from its quote, so that many quotes can be asked for at once.
struct StartedRow {
    MessageRow row;
    const MessageType* type = nullptr;  // null if the row lacks nothing
    QString key = {};                   // of the quote
};
/// Does the same as GetMessageRow() in two steps.
StartedRow startMessageRow(const xml::Document& message, const QString& typeName);
void finishMessageRows(const QList<StartedRow*>& rows);

/// Returns why values are missing in the rows since the last call, if the connection was lost; otherwise an empty text.
QString takeRowFailure();

/// While an object exists, the names of customers and vehicles that were asked for are kept, because the rows of a list
/// share many of them.
class KeptNames {
public:
    KeptNames();
    ~KeptNames();
    Q_DISABLE_COPY_MOVE(KeptNames)
};

}  // namespace kest
