// A repair shop of its own for one test: profile, folders, quote database, connection and shared variables; with what
// every such test reads them by.
#pragma once

#include "messagelist/Summary.h"
#include "platform/files/files.h"
#include "base/SharedVariables.h"
#include "shell/eKEST.h"
#include "support/Cases.h"
#include "support/Messages.h"
#include "support/Row.h"
#include "support/ScriptedDesktop.h"
#include "support/TestProfile.h"

#include <QStringList>
#include <QUrl>

#include <gtest/gtest.h>

#include <optional>

namespace kest::test {

// Each finds its row, or makes it with what every quote, car, customer or vendor of a shop has.

/// The car ABC123 with its customer, no network number, no line.
QuoteRow quote(const Text& number, int subquote = 0);
/// A second row with the same number and subquote.
QuoteRow anotherQuote(const Text& number, int subquote = 0);
bool quoteExists(const Text& number, int subquote = 0);
/// Silver, of a known model, of the customer "Holloway".
Row car(const Text& rego);
Row customer(const Text& name);
Row vendor(const Text& name);

/// The message arrives in the unread folder under that name, and goes through LoadXML.
bool load(const Text& message, const Text& fileName = "message.xml");

/// Loads a message as the list window does after a click on "Load", the move to the read folder included; false where a
/// failure reaches the window.
bool loadAsTheWindow(const QString& fileName);

/// The files that the list window's fill lists; answers to quotes that were sent are applied.
QStringList listed(int folder = Unread);

class Shop : public ::testing::Test {
protected:
    Shop();
    ~Shop() override;

    const QString& root() const { return root_; }

    /// Puts a file into the unread folder, as the transport does.
    void arrive(const Text& name, const Text& content);
    /// Puts a file onto a stick that a person brings.
    QUrl bring(const QString& name, const QString& content);
    /// Names of the files of a folder such as `gsReadPath`.
    static QStringList filesIn(const QString& folder);
    /// The boxes shown since the last call, each as "[critical] text" or "[critical] title: text", joined by line
    /// feeds.
    std::string shown();

    /// Answers boxes with their default; `desktop.emplace(script)` where a test wants other answers.
    std::optional<ScriptedDesktop> desktop;

private:
    TestProfile profile_;
    QString root_;
    std::optional<eKEST> host_;
    qsizetype boxesSeen_ = 0;
};

}  // namespace kest::test
