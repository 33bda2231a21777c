#include "app/CommandLine.h"

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QString* optionValue(CommandLine& line, const QString& word)
{
    if (word == u"--profile"_s)
        return &line.profile;
    if (word == u"--script"_s)
        return &line.script;
    if (word == u"--reports"_s)
        return &line.reports;
    return nullptr;
}

}  // namespace

CommandLine parsed(const QStringList& words)
{
    CommandLine line;
    for (qsizetype i = 0; i < words.size(); ++i) {
        const QString& word = words[i];
        const bool takesOptions = line.command != u"setting"_s;
        if (takesOptions && word == u"--json"_s) {
            line.json = true;
        } else if (QString* value = takesOptions ? optionValue(line, word) : nullptr) {
            if (++i == words.size()) {
                line.error = word + u" needs a value"_s;
                return line;
            }
            *value = words[i];
        } else if (line.command.isEmpty()) {
            if (word.startsWith(u'-') && word != u"--help"_s && word != u"--version"_s) {
                line.error = u"unknown option "_s + word;
                return line;
            }
            line.command = word;
        } else {
            line.arguments.append(word);
        }
    }
    if (line.command.isEmpty())
        line.error = u"a command is missing"_s;
    return line;
}

QString usage()
{
    return uR"(usage: kest2 [--profile DIR] [--json] [--script FILE] [--reports DIR] COMMAND

  init [--demo]                 make the profile; --demo adds a shop with quotes and messages
  where                         where everything lies
  open [QTNNO [SUBQUOTE]]       the panel, on that quote
  list unread|read|sent [--filter TEXT]
  held                          the unread messages that are not listed yet, and what each waits for
  load FILE                     load a message of the unread folder
  send QTNNO [SUBQUOTE]         send a quote
  reprint FILE                  print a message of the read folder again
  joblink set --server S --port N --database D --user U     the password is read from standard input
  view unread|read|sent FILE    the indented text of a message
  history QTNNO [SUBQUOTE]      what changed a quote: when, by which message, and from what to what
  undo OPERATION                take a load back that history shows, and its message to the unread folder; asks first
  check-database [--prepare]    try on the quote database everything that is relied on, in scratch tables;
                                --prepare first creates missing indexes and the journal
  setting list | get APP SECTION KEY | set APP SECTION KEY VALUE     a password is read from standard input
  transport [--once|--window]   carry files between the message folders and an insurer that follows insurer.rules

exit codes: 0 done, 1 refused or not loaded, 2 usage, 3 no connection or no profile, 4 needs an answer
)"_s;
}

}  // namespace kest::app
