// The loopback transport, which carries files between the message folders and an insurer that follows rules.
#pragma once

#include "loopback/InsurerRules.h"
#include "loopback/TransportState.h"

#include <QDate>
#include <QHash>
#include <QList>
#include <QStringList>

#include <functional>
#include <optional>

namespace kest::app {

/// The folders of a transport. Paths of this system or in the host's form, with a separator at the end.
struct TransportFolders {
    QString unread;  // where messages arrive
    QString unsent;  // where the shop puts its documents
    QString sent;    // where documents go after they have been sent
    QString own;     // the rules and the state
};

/// A file that was sent or received.
struct Carried {
    enum class Direction { Out, In };
    Direction direction;
    QString file;
    QString what;  // "Authorised Quote 1004"
};

/// The result of one run of the transport.
struct Carry {
    QList<Carried> carried;
    QStringList faults;  // error messages; the same error is reported once until its file changes
};

/// Carries files between the shop and the insurer.
///
/// It shares only the folders with the component, and knows a quote only from its document. No reader sees part of a
/// file that it writes, and the pictures of a request arrive before the request. After a restart it continues where it
/// stopped, and it retries what has failed.
class Transport {
public:
    static constexpr QLatin1StringView rulesName{"insurer.rules"};
    static constexpr QLatin1StringView stateName{"transport.json"};

    /// Creates a transport. The first carry() reads its state.
    explicit Transport(TransportFolders folders);

    /// Takes the files in the outgoing folder, answers each quote, and sends the next message of every rule that has
    /// begun and whose last message the shop has dealt with. If the rules contain an error, nothing is carried.
    Carry carry(const QDate& today = QDate::currentDate());

private:
    static QString stampOf(const QString& path);
    bool tried(const QString& subject, const QString& stamp, const std::function<void()>& step);
    void readRules();
    void readState();
    void save();

    // from the shop
    void takeDocuments();
    void takeQuote(const QString& name);
    void takeImage(const QString& name);
    void finishMoving();
    void begin(const QuoteDocument& quote, const QString& name);
    void beginStarts();

    // from the insurer
    void rememberAnswers();
    void advance(qsizetype index);
    void perform(const Step& step, Dealing& dealing);
    void putPictures(const Step& step, const Matter& matter);
    QString sendMessage(const Step& step, const Matter& matter);
    void removeAnswers(const Step& step, const Matter& matter);
    void put(const QString& name, const QByteArray& bytes, const QString& what);

    QString requestOf(const QString& quoteNumber) const;
    InsurerMemory::Documents documents() const;
    std::optional<QuoteDocument> newestDocument(const QuoteKey& quote) const;

    TransportFolders folders;
    InsurerRules rules;
    std::optional<TransportState> known;  // read by the first carry
    QByteArray stored;                    // the content of the state file; empty before the first read or write
    QHash<QString, QString> said;         // the errors that were reported, by subject
    Carry result;
    QDate today;
};

}  // namespace kest::app
