// One table of what each event of the network changes in a quote. The loaders and the send use it.
#pragma once

#include "quotedata/Quote.h"

#include <QString>

#include <optional>

namespace kest {

/// A note that an event adds. "{}" is replaced by a text from the event, such as a reason or a quote.
struct NoteOfEvent {
    const char* subject = "";  // empty: no note
    const char* status = "";
    const char* detail = "";
    bool alwaysNew = false;  // adds a note each time instead of changing an existing one
};

/// The part of an event that does not depend on the message. A member without a value changes nothing.
struct Transition {
    std::optional<int> stage = {};
    std::optional<bool> locked = {};
    NoteOfEvent notes[3] = {};
    const char* cleared[2] = {};  // columns of the quote
};

/// Sets the stage and the lock in the quote's row, clears its columns, and adds the notes in order to the remarks of
/// its note row. `told` replaces "{}" in the notes. The caller must update both rows.
void applyTransition(const Transition& transition, db::Recordset& quote, db::Recordset& notes,
                     const QString& told = {});
void applyTransition(const Transition& transition, Quote& quote, const QString& told = {});

// Job_stage: 1 open for quoting, 3 with the insurer, 4 authorised, 9 request cancelled, 10 tender failed. The lock is
// ReadOnly. Notes: subject, status, detail, whether always new; the last one added is the first in the chain. After the
// notes: the columns that become Null.

// clang-format off
inline constexpr Transition quoteRequested          { 1,  {},    {{"Quote Request", "Active"}} };
inline constexpr Transition quoteMatched            { 3,  true,  {{"Quote Request", "Matched"}} };
inline constexpr Transition manualQuoteLoaded       { 3,  true,  {{"Quote Request", "Responded"}, {"Manual Quote Loaded"}} };

inline constexpr Transition requestAnswered         { {}, {},    {{"Quote Request", "Responded"}} };  // a main quote of a request is sent
inline constexpr Transition quoteSent               { 3,  true,  {{"KEST Quote", "Sending", "", true}} };
inline constexpr Transition quoteSubmitted          { {}, true,  {{"KEST Quote", "Submitted"}} };

inline constexpr Transition quoteDeleted            { 1,  false, {{"Quote Deleted \"Reason : {}\""}, {"KEST Quote", "Deleted"}, {"Quote Request", "Active"}}, {"KESTQuoteNo"} };
inline constexpr Transition supplementaryDeleted    { {}, {},    {{"Supplementary {} Deleted"}} };  // on the main quote
inline constexpr Transition revisionRequested       { 1,  false, {{"Quote Revision Requested \"Reason : {}\""}, {"Quote Request", "Active"}}, {"KESTQuoteNo"} };
inline constexpr Transition requestCancelled        { 9,  true,  {{"Quote Request", "Cancelled"}, {"QR Cancelled", "", "{}"}} };
inline constexpr Transition requestReinstated       { 1,  false, {{"Quote Request", "Active"}, {"QR Reinstated"}} };
inline constexpr Transition excessWaived            { {}, {},    {{"Excess", "ORLA Waived"}} };

inline constexpr Transition requestWon              { {}, {},    {{"Quote Request", "Won"}} };  // only if the request has a status
inline constexpr Transition quoteAuthorised         { 4,  {},    {{"Authorised Quote"}} };
inline constexpr Transition adjustmentSuggested     { {}, {},    {{"Adjustment Suggested", "", "", true}} };
inline constexpr Transition totalLoss               { 10, true,  {{"Quote Request", "Total Loss"}, {"Tender Failed \"Reason : {}\""}} };
inline constexpr Transition tenderFailed            { 10, true,  {{"Quote Request", "Lose"}, {"Tender Failed \"Reason : {}\""}} };
inline constexpr Transition supplementaryRejected   { 1,  false, {{"Quote Rejected \"Reason : {}\""}} };

inline constexpr Transition authorisationBackedOut  { 3,  true,  {{"Authorised Quote", "Deleted"}, {"Quote Request", "Responded"}}, {"KESTAuthNo", "AuthDate"} };
inline constexpr Transition failedTenderBackedOut   { 3,  true,  {{"Fail Tender Backout"}, {"Quote Request", "Responded"}} };
inline constexpr Transition rejectionBackedOut      { 3,  true,  {{"Rejected Supplementary Backout"}} };
inline constexpr Transition supplementaryBackedOut  { 3,  true,  {{"Authorised Quote", "Deleted"}}, {"AuthDate"} };
// clang-format on

}  // namespace kest
