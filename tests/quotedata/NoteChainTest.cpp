#include "platform/values.h"
#include "quotedata/NoteChain.h"

#include <gtest/gtest.h>

namespace kest {

namespace {

QString text(const char* literal)
{
    return QString::fromUtf8(literal).replace(QLatin1String("today"), shortDate(QDate::currentDate()));
}

}  // namespace

TEST(NoteChain, ANoteIsAddedOrChangedInPlace)
{
    const struct {
        const char* chain;
        const char* subject;
        const char* status;
        const char* detail;
        const char* expected;
    } cases[] = {
        {"", "Quote Request", "Active", "", "(today : Active Quote Request)"},
        {"", "QR Cancelled", "", "sold", "(today : QR Cancelled - sold)"},
        {"(19/03/2008 : Manual Quote Loaded)", "Quote Request", "Active", "",
         "(today : Active Quote Request) (19/03/2008 : Manual Quote Loaded)"},

        // the date of the first note stays, and so does its place
        {"(21/03/2008 : Manual Quote Loaded) (19/03/2008 : Active Quote Request)", "Quote Request", "Won", "",
         "(21/03/2008 : Manual Quote Loaded) (19/03/2008 : Won Quote Request)"},
        {"(21/03/2008 : Sending KEST Quote) (19/03/2008 : Deleted KEST Quote)", "KEST Quote", "Submitted", "",
         "(21/03/2008 : Submitted KEST Quote) (19/03/2008 : Submitted KEST Quote)"},

        // a reason is part of its subject
        {"(19/03/2008 : Quote Deleted \"Reason : a\")", "Quote Deleted \"Reason : b\"", "", "",
         "(today : Quote Deleted \"Reason : b\") (19/03/2008 : Quote Deleted \"Reason : a\")"},
        {"(19/03/2008 : Quote Deleted \"Reason : a\")", "Quote Deleted \"Reason : a\"", "", "",
         "(19/03/2008 : Quote Deleted \"Reason : a\")"},

        // the subject found in another case alone changes no note, but the chain is rebuilt
        {"(19/03/2008 : Active quote request)  ", "Quote Request", "Won", "", "(19/03/2008 : Active quote request)"},
        // a subject before the 14th character is no subject
        {"(123456789 : Excess)", "Excess", "X", "", "(123456789 : X Excess)"},
        {"(12345678 :Excess)", "Excess", "X", "", "(12345678 :Excess)"},

        // a reason with a ")" splits its note; the character behind the ")" is lost, and the pieces stay in place
        {"(21/03/2008 : QR Cancelled - a) b) (19/03/2008 : Active Quote Request)", "Quote Request", "Won", "",
         "(21/03/2008 : QR Cancelled - a) b) (19/03/2008 : Won Quote Request)"},
        {"(21/03/2008 : QR Cancelled - a)b) (19/03/2008 : Active Quote Request)", "Quote Request", "Won", "",
         "(21/03/2008 : QR Cancelled - a) ) (19/03/2008 : Won Quote Request)"},
        // what the host wrote behind the last note stays
        {"(19/03/2008 : Active Quote Request) call back", "Quote Request", "Won", "",
         "(19/03/2008 : Won Quote Request) call back"},
    };
    for (const auto& c : cases) {
        QString chain = text(c.chain);
        EXPECT_EQ(AddNote(text(c.subject), text(c.status), chain, text(c.detail), false), text(c.expected));
        EXPECT_EQ(chain, text(c.expected)) << "the argument holds the new chain too";
    }
}

TEST(NoteChain, ANewNoteStandsInFrontWhateverIsThere)
{
    QString chain = text("(19/03/2008 : Submitted KEST Quote)");
    AddNote(text("KEST Quote"), text("Sending"), chain, {}, true);
    EXPECT_EQ(chain, text("(today : Sending KEST Quote) (19/03/2008 : Submitted KEST Quote)"));
}

TEST(NoteChain, TheStatusIsThatOfTheFirstNote)
{
    const struct {
        const char* chain;
        const char* subject;
        const char* expected;
    } cases[] = {
        {"", "Quote Request", ""},
        {"(19/03/2008 : Active Quote Request)", "Quote Request", "Active"},
        {"(21/03/2008 : Sending KEST Quote) (19/03/2008 : Submitted KEST Quote)", "KEST Quote", "Sending"},
        {"(19/03/2008 : Active quote request)", "Quote Request", ""},
        {"(19/03/2008 : Authorised Quote)", "Authorised Quote", ""},
        {"Quote Request", "Quote Request", ""},
        {"(19/03/2008 : Quote Rejected \"Reason : Part Price\")", "Rejected", "Quote"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(GetNoteStatus(text(c.subject), text(c.chain)), text(c.expected)) << c.chain;
}

TEST(NoteChain, AllNotesOfASubjectAreRemoved)
{
    const struct {
        const char* chain;
        const char* subject;
        const char* expected;
    } cases[] = {
        {"", "KEST Quote", ""},
        {" (19/03/2008 : Active Quote Request) ", "KEST Quote", " (19/03/2008 : Active Quote Request) "},
        {"(21/03/2008 : Sending KEST Quote) (20/03/2008 : Active Quote Request) (19/03/2008 : Deleted KEST Quote)",
         "KEST Quote", "(20/03/2008 : Active Quote Request)"},
        {"(19/03/2008 : Quote Deleted \"Reason : a\")", "Quote Deleted", ""},
        // beyond the first ")" the rest of a split reason is no note of the subject
        {"(19/03/2008 : QR Cancelled - a) KEST Quote)", "QR Cancelled", "KEST Quote)"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(RemoveNote(text(c.subject), text(c.chain)), text(c.expected)) << c.chain;
}

}  // namespace kest
