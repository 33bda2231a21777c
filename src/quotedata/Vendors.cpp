#include "quotedata/Vendors.h"

#include "base/modDBAccess.h"
#include "platform/database/Sql.h"

#include <map>
#include <optional>
#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr int vendorAccount = 293;  // of the ledger

std::optional<std::map<QString, QVariant>> keptNumbers;  // by the name

QVariant foundOrAdded(const QString& name, const QString& street, const QString& phone)
{
    db::Recordset vendor = opened(sql("SELECT * FROM VENDOR WHERE NAME LIKE '%{}%'", likeText(name)));
    if (vendor.eof()) {
        vendor.addNew();
        // cut, because a long address must not make an authorisation fail
        const std::pair<QString, QString> texts[] = {{u"Name"_s, name}, {u"street"_s, street}, {u"phone"_s, phone}};
        for (const auto& [column, text] : texts)
            vendor.set(column, cutFor(vendor, column, text));
        for (const QLatin1StringView empty :
             {"contact"_L1, "suburb"_L1, "Fax"_L1, "accno"_L1, "email"_L1, "vendor_abn"_L1})
            vendor.set(empty, u""_s);
        vendor.set(u"Account"_s, vendorAccount);
        vendor.update();
    }
    return vendor.value(u"VENDOR_ID"_s);
}

}  // namespace

QVariant findOrAddVendor(const QString& name, const QString& street, const QString& phone)
{
    if (name.trimmed().isEmpty())
        return 0;
    if (keptNumbers && keptNumbers->contains(name))
        return keptNumbers->at(name);
    const QVariant number = foundOrAdded(name, street, phone);
    if (keptNumbers)
        keptNumbers->emplace(name, number);
    return number;
}

KeptVendors::KeptVendors()
{
    keptNumbers.emplace();
}

KeptVendors::~KeptVendors()
{
    keptNumbers.reset();
}

}  // namespace kest
