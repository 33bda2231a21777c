// A repair shop for a single test: profile, folders, quote database, connection and shared variables, with functions
// that read and change them.
#pragma once

#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messagelist/Summary.h"
#include "platform/database/FaultInjection.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/files/FaultInjection.h"
#include "shell/eKEST.h"
#include "support/Messages.h"
#include "support/Row.h"
#include "support/ScriptedDesktop.h"
#include "support/ShopDatabase.h"
#include "support/Test.h"

namespace kest::test {

// Each of these functions returns its row. If there is none, it adds one with the usual values.

/// A new quote is for the car ABC123 with its customer, and has no network number and no lines.
QuoteRow quote(const Text& number, int subquote = 0);
/// Adds a second row with the same number and subquote.
QuoteRow anotherQuote(const Text& number, int subquote = 0);
bool quoteExists(const Text& number, int subquote = 0);
/// A new car is silver, has a known model and belongs to the customer "Holloway".
Row car(const Text& rego);
Row customer(const Text& name);
Row vendor(const Text& name);

/// Puts the message into the unread folder under that name and loads it with LoadXML().
bool load(const Text& message, const Text& fileName = "message.xml");

/// Loads a message as the list window does, including the move to the read folder. Returns false if an error reaches
/// the window.
bool loadAsTheWindow(const QString& fileName);

/// Returns the files that a fill lists. The fill also applies answers to sent quotes.
QStringList listed(MessageFolder folder = MessageFolder::Unread);

/// A test that has a shop.
class Shop : public ::testing::Test {
protected:
    Shop();
    ~Shop() override;

    const QString& root() const { return root_; }

    /// Puts a file into the unread folder, as the transport does.
    void arrive(const Text& name, const Text& content);
    /// Puts the template of a report where the shop has its templates.
    static void putTemplate(int report);
    /// Creates a file outside of the folders, as on a stick that a person brings.
    QUrl bring(const QString& name, const QString& content);
    /// Returns the names of the files in a folder such as `gsReadPath`.
    static QStringList filesIn(const QString& folder);
    /// Returns the boxes shown since the last call, one on each line, as "[critical] text" or "[critical] title: text".
    std::string shown();

    /// Answers boxes with their defaults. Use `desktop.emplace(script)` for other answers.
    std::optional<ScriptedDesktop> desktop;

private:
    TestProfile profile_;
    QString root_;
    std::optional<eKEST> host_;
    qsizetype boxesSeen_ = 0;
};

}  // namespace kest::test
