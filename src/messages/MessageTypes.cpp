#include "messages/MessageTypes.h"

#include <algorithm>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr auto request = "//rootns:quoteRequestNumber"_L1;
constexpr auto kestRequest = "//rootns:kestQuoteRequestNumber"_L1;
constexpr auto networkNumber = "//rootns:kestQuoteNumber"_L1;
constexpr auto originalNumber = "//rootns:kestOriginalQuoteNumber"_L1;
constexpr auto reference = "//rootns:quoteBody/rootns:quoteReference"_L1;
constexpr auto none = ""_L1;

using enum MessageCode;
using enum RowsNeeded;

// clang-format off
constexpr MessageType types[] = {
    {QREQ, "QREQ"_L1, "Quote Request"_L1,                      "getQuoteRequestResponse"_L1,       RowSource::Message,          none,           ExactlyOne, FileKey::RequestAndVersion, request},
    {QMQR, "QMQR"_L1, "Quote Matched to Quote Request"_L1,     "getQuoteResponse"_L1,              RowSource::Message,          none,           ExactlyOne, FileKey::Reference,         reference},
    {MANQ, "MANQ"_L1, "Manual Quote"_L1,                       "getQuoteResponse"_L1,              RowSource::Message,          none,           AtLeastOne, FileKey::Reference,         reference},
    {QTDL, "QTDL"_L1, "Quote Deletion"_L1,                     "getQuoteDeletionResponse"_L1,      RowSource::NetworkNumber,    networkNumber,  ExactlyOne, FileKey::DeletedQuote,      networkNumber},
    {RRQT, "RRQT"_L1, "Request for Revised Quote"_L1,          "getReqForRevQteResponse"_L1,       RowSource::Request,          request,        AtLeastOne, FileKey::RequestAndVersion, request},
    {QRCN, "QRCN"_L1, "Quote Request Cancellation"_L1,         "getQRCancellationResponse"_L1,     RowSource::Request,          request,        ExactlyOne, FileKey::Request,           request},
    {ADQT, "ADQT"_L1, "Adjusted Quote"_L1,                     "getAdjustedQuoteResponse"_L1,      RowSource::NetworkNumber,    originalNumber, ExactlyOne, FileKey::Reference,         reference},
    {AUQT, "AUQT"_L1, "Authorised Quote"_L1,                   "getAuthorisedQuoteResponse"_L1,    RowSource::NetworkNumber,    originalNumber, ExactlyOne, FileKey::Reference,         reference},
    {ARES, "ARES"_L1, "Assessment Result"_L1,                  "getAssmntResultResponse"_L1,       RowSource::NetworkNumber,    originalNumber, ExactlyOne, FileKey::NetworkNumber,     originalNumber},
    {BACA, "BACA"_L1, "Backout Assessment"_L1,                 "getBackoutAssmntResponse"_L1,      RowSource::BackedOutRequest, kestRequest,    AtLeastOne, FileKey::Request,           kestRequest},
    {BCQR, "BCQR"_L1, "Backout Quote Request Cancellation"_L1, "getBackoutCancelledQRResponse"_L1, RowSource::Request,          kestRequest,    ExactlyOne, FileKey::Request,           kestRequest},
    {EWAP, "EWAP"_L1, "Excess Waived/Already Paid"_L1,         "getQuoteResponse"_L1,              RowSource::None,             none,           ExactlyOne, FileKey::None,              none},
};
// clang-format on

constexpr bool standInTheOrderOfTheirCodes()
{
    for (size_t i = 0; i < std::size(types); ++i)
        if (types[i].code != static_cast<MessageCode>(i))
            return false;
    return true;
}
static_assert(standInTheOrderOfTheirCodes());

}  // namespace

const MessageType& messageType(MessageCode code)
{
    return types[static_cast<size_t>(code)];
}

const MessageType* findMessageType(const QString& code)
{
    const auto found = std::ranges::find(types, code, &MessageType::text);
    return found == std::end(types) ? nullptr : found;
}

QString messageTypeName(const QString& code)
{
    const MessageType* type = findMessageType(code);
    return type ? type->name : unknownMessageType;
}

}  // namespace kest
