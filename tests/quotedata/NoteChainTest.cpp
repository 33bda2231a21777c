// Tests how notes are added, found and removed.
#include "quotedata/NoteChain.h"
#include "support/Test.h"

TEST(NoteChain, ANoteIsAddedOrChangedInPlace)
{
    for (auto [before, subject, status, detail, after] : casesIn<5>("quotedata/notes-added.txt")) {
        QString chain = before;
        EXPECT_EQ(AddNote(subject, status, chain, detail, false), chain) << "the argument holds the new chain too";
        EXPECT_EQ(chain, after.replace(u"today"_s, shortDate(QDate::currentDate())));
    }
    QString chain = u"(19/03/2008 : Submitted KEST Quote)"_s;
    AddNote(u"KEST Quote"_s, u"Sending"_s, chain, {}, true);
    EXPECT_TRUE(chain.endsWith(u" : Sending KEST Quote) (19/03/2008 : Submitted KEST Quote)"_s)) << "a new one";
}

TEST(NoteChain, TheStatusIsThatOfTheFirstNote)
{
    for (const auto& [chain, subject, status] : casesIn<3>("quotedata/note-status.txt"))
        EXPECT_EQ(GetNoteStatus(subject, chain), status) << chain;
}

TEST(NoteChain, AllNotesOfASubjectAreRemoved)
{
    for (const auto& [chain, subject, after] : casesIn<3>("quotedata/notes-removed.txt"))
        EXPECT_EQ(RemoveNote(subject, chain), after) << chain;
}
