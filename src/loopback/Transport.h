// The loopback transport: carries files between the message folders and an insurer that follows a file of rules.
#pragma once

#include "loopback/InsurerMessages.h"
#include "loopback/InsurerRules.h"
#include "loopback/TransportState.h"

#include <QDate>
#include <QHash>
#include <QList>
#include <QStringList>

#include <functional>
#include <optional>

namespace kest::app {

/// Folders of this system or in the host's form, with a separator at the end.
struct TransportFolders {
    QString unread;  // where messages arrive
    QString unsent;  // where the shop leaves its documents
    QString sent;
    QString own;  // the rules and the state
};

/// One file that went its way.
struct Carried {
    enum Direction { Out, In } direction;
    QString file;
    QString what;  // "Authorised Quote 1004"
};

struct Carry {
    QList<Carried> carried;
    QStringList faults;  // each in words; the same fault is told once, until its file changes
};

/// Shares nothing with the component but the folders, and knows a quote from its document alone. Whatever it writes
/// appears whole, and a request's pictures before the request. It goes on where it stood after a restart, and does
/// again what a fault has stopped.
class Transport {
public:
    static constexpr QLatin1StringView rulesName{"insurer.rules"};
    static constexpr QLatin1StringView stateName{"transport.json"};

    explicit Transport(TransportFolders folders);

    /// Takes what lies in the outgoing folder, answers each quote, and sends the next message of every rule that has
    /// begun and whose last message the shop has dealt with. With rules that hold a fault nothing is carried.
    Carry carry(const QDate& today = QDate::currentDate());

private:
    static QString stampOf(const QString& path);
    bool tried(const QString& subject, const QString& stamp, const std::function<void()>& step);
    void readRules();
    void readState();
    void save();
    QString draw();

    // what the shop sends
    void takeDocuments();
    void takeQuote(const QString& name);
    void takeImage(const QString& name);
    void finishMoving();
    void begin(const QuoteDocument& quote, const QString& name);
    void beginStarts();

    // what the insurer sends
    void rememberAnswers();
    void advance(qsizetype index);
    void perform(const Step& step, Dealing& dealing);
    Matter matterOf(const Step& step) const;
    void complete(const Step& step, Matter& matter);
    void remember(const Step& step, const Matter& matter, Dealing& dealing);
    void putPictures(const Step& step, const Matter& matter);
    QString sendMessage(const Step& step, const Matter& matter);
    void removeAnswers(const Step& step, const Matter& matter);
    void put(const QString& name, const QByteArray& bytes, const QString& what);
    Dice dice() const;

    QStringList answersOf(const QString& quote, const QString& subquote) const;
    QString requestOf(const QString& quote) const;
    std::optional<QuoteDocument> newestDocument(const QString& quote, const QString& subquote) const;

    TransportFolders folders;
    InsurerRules rules;
    std::optional<TransportState> known;  // read by the first carry
    QByteArray stored;                    // the state as its file holds it; empty before it was written or read
    QHash<QString, QString> said;         // the faults that were told, by subject
    Carry result;
    QDate today;
};

}  // namespace kest::app
