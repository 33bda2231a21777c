#include "utilities/StatusRepair.h"

using namespace Qt::StringLiterals;

namespace kest {

const QList<StatusRepair>& statusRepairs()
{
    const QString request = u"Quote Request"_s;
    const QString sent = u"KEST Quote"_s;
    const QString authorised = u"Authorised Quote"_s;
    const QString deleted = u"Quote Deleted"_s;
    const QString failed = u"Tender Failed"_s;
    constexpr bool mainQuoteOnly = true;
    static const QList<StatusRepair> repairs = {
        {.button = u"Command3"_s,
         .caption = u"U&nsent"_s,
         .locks = false,
         .forgetsQuoteNumber = true,
         .removed = {sent, authorised, deleted},
         .added = {{request, u"Active"_s, mainQuoteOnly}}},
        {.button = u"Command4"_s,
         .caption = u"Sen&t"_s,
         .removed = {authorised, deleted, failed},
         .added = {{request, u"Responded"_s, mainQuoteOnly}, {sent, u"Sending"_s}}},
        {.button = u"cmdSubmitted"_s,
         .caption = u"Su&bmitted"_s,
         .startsGroup = true,
         .removed = {authorised, deleted, failed},
         .added = {{request, u"Responded"_s, mainQuoteOnly}, {sent, u"Submitted"_s}}},
        {.button = u"cmdWon"_s,
         .caption = u"&Won"_s,
         .removed = {deleted, failed},
         .added = {{request, u"Won"_s}, {sent, u"Submitted"_s}, {authorised, {}}}},
        {.button = u"cmdDeleted"_s,
         .caption = u"De&leted"_s,
         .removed = {authorised, failed},
         .added = {{deleted, {}}, {request, u"Responded"_s, mainQuoteOnly}, {sent, u"Deleted"_s}}},
        {.button = u"cmdLoss"_s,
         .caption = u"L&oss"_s,
         .removed = {authorised},
         .added = {{request, u"Loss"_s}, {sent, u"Deleted"_s}, {deleted, {}}, {failed, {}}}},
    };
    return repairs;
}

}  // namespace kest
