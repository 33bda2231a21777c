#include "quotedata/StateTable.h"

#include "quotedata/NoteChain.h"

namespace kest {

using namespace Qt::StringLiterals;

void applyTransition(const Transition& transition, db::Recordset& quote, db::Recordset& notes, const QString& told)
{
    if (transition.stage)
        quote.set(u"Job_stage"_s, *transition.stage);
    if (transition.locked)
        quote.set(u"ReadOnly"_s, *transition.locked);
    for (const char* column : transition.cleared) {
        if (column)
            quote.set(QString::fromLatin1(column), QVariant());
    }

    const auto filled = [&](const char* text) { return QString::fromLatin1(text).replace(u"{}"_s, told); };
    QString remarks = notes.text(u"remarks"_s);
    for (const NoteOfEvent& note : transition.notes) {
        if (*note.subject)
            AddNote(filled(note.subject), QString::fromLatin1(note.status), remarks, filled(note.detail),
                    note.alwaysNew);
    }
    notes.set(u"remarks"_s, remarks);
}

void applyTransition(const Transition& transition, Quote& quote, const QString& told)
{
    applyTransition(transition, quote.header(), quote.notes(), told);
}

}  // namespace kest
