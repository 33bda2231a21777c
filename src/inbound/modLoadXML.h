// Loads messages into the quote tables: the dispatcher and the loaders.
#pragma once

#include <QString>

namespace kest {

/// Loads a message into the quote tables.
///
/// Adds the schema-instance declaration to `text` and may escape bare ampersands in it. Returns true if the message was
/// loaded. Returns false after a refusal, for which a box has been shown, or after a failure, which is in the error
/// log. The file then stays unread, and the load can be repeated.
bool LoadXML(QString& text, const QString& fileName);

/// Marks a quote as received by the network. The file's name, "R_" number "_" subquote, names the quote. Every fill of
/// the list applies the response again. Throws RuntimeError if it fails.
void LoadSubmissionResponse(QString& text, const QString& fileName);

// The loaders, one for each type of message. Only LoadXML() calls them. They return false after a refusal, for which a
// box has been shown, and throw RuntimeError if they fail. No load runs in a transaction: updates before a failure
// stay.

bool LoadQREQ(QString& text, const QString& fileName);
bool LoadMANQ(QString& text, const QString& fileName);
bool LoadAUQT(QString& text, const QString& fileName);  // reports its failures itself and returns false

// LoadStatus.cpp has these.
bool LoadQMQR(QString& text, const QString& fileName);
bool LoadEWAP(QString& text, const QString& fileName);
bool LoadQTDL(QString& text, const QString& fileName);
bool LoadRRQT(QString& text, const QString& fileName);
bool LoadQRCN(QString& text, const QString& fileName);
bool LoadBCQR(QString& text, const QString& fileName);

// LoadAssessment.cpp has these.
bool LoadADQT(QString& text, const QString& fileName);
bool LoadARES(QString& text, const QString& fileName);
bool LoadBACA(QString& text, const QString& fileName);

}  // namespace kest
