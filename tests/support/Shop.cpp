#include "support/Shop.h"

#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"
#include "support/ShopDatabase.h"

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

void forgetSharedVariables()
{
    for (QString* text :
         {&gsCurFolder, &gsListFolder, &gsListFilter, &gsMatchedQTNNO, &gsDeletedQTNNO, &gsDeletedSubquote})
        text->clear();
    gsQTNNO = gsSubQuote = u"0"_s;
    gdicQuoteRequests.clear();
    gbFilterAsked = gbTabletLocal = false;
}

void add(const QString& table, std::initializer_list<std::pair<QString, Value>> values)
{
    db::Recordset rows(gConn);
    rows.open(u"SELECT * FROM %1 WHERE 1=0"_s.arg(table));
    rows.addNew();
    for (const auto& [column, value] : values)
        rows.set(column, value);
    rows.update();
}

QString conditionOf(const QString& number, int subquote)
{
    return sql("QTNNO='{}' AND Subquote={}", number, subquote);
}

void addQuote(const QString& number, int subquote)
{
    car("ABC123");
    add(u"QUOTE1"_s, {{u"QTNNO"_s, number},
                      {u"Subquote"_s, subquote},
                      {u"REGO"_s, "ABC123"},
                      {u"INSURER_ID"_s, 1},
                      {u"Claim"_s, "7700001"},
                      {u"QUOTER"_s, "Pat Ferrier"},
                      {u"excess"_s, 0},
                      {u"contri"_s, 0},
                      {u"Job_stage"_s, 1}});
}

}  // namespace

QuoteRow quote(const Text& number, int subquote)
{
    if (!quoteExists(number, subquote)) {
        addQuote(number, subquote);
        add(u"QUOTE3"_s, {{u"QTNNO"_s, QString(number)}, {u"Subquote"_s, subquote}});
    }
    return QuoteRow(number, subquote, conditionOf(number, subquote) + u" ORDER BY rec_id"_s);
}

QuoteRow anotherQuote(const Text& number, int subquote)
{
    addQuote(number, subquote);
    return QuoteRow(number, subquote, conditionOf(number, subquote) + u" ORDER BY rec_id DESC"_s);
}

bool quoteExists(const Text& number, int subquote)
{
    return rowCount("QUOTE1", conditionOf(number, subquote)) > 0;
}

CarRow car(const Text& rego)
{
    const QString condition = sql("REGO='{}'", QString(rego));
    if (rowCount("CAR", condition) == 0)
        add(u"CAR"_s, {{u"REGO"_s, QString(rego)},
                       {u"KEST"_s, 0},
                       {u"CUST_ID"_s, customer("Holloway").id()},
                       {u"MODEL_ID"_s, "C120"},
                       {u"BODY_ID"_s, "4"},
                       {u"BODY_ID2"_s, "4S"},
                       {u"COLOUR"_s, "Silver"},
                       {u"Year"_s, "03/2005"},
                       {u"PAINT_GP"_s, "M1"}});
    return CarRow("CAR", condition);
}

CustomerRow customer(const Text& name)
{
    const QString condition = sql("NAME='{}'", QString(name));
    if (rowCount("CUSTOMER", condition) == 0)
        add(u"CUSTOMER"_s, {{u"NAME"_s, QString(name)},
                            {u"FIRSTNAME"_s, "Kim"},
                            {u"SALUTATION"_s, "Ms"},
                            {u"street"_s, "14 Banksia Street"},
                            {u"suburb"_s, "Wattlebridge 3999"}});
    return CustomerRow("CUSTOMER", condition);
}

VendorRow vendor(const Text& name)
{
    const QString condition = sql("NAME='{}'", QString(name));
    if (rowCount("VENDOR", condition) == 0)
        add(u"VENDOR"_s, {{u"NAME"_s, QString(name)}, {u"Account"_s, 293}});
    return VendorRow("VENDOR", condition);
}

Shop::Shop() : desktop(std::in_place), root_(profile_.root())
{
    forgetSharedVariables();
    for (const char* folder : {"AUnread", "ARead", "AUnsent", "ASent", "PDF"})
        files::makeFolder(u"c:\\wirdoc\\"_s + QString::fromLatin1(folder));
    files::makeFolder(u"c:\\wirimg"_s);
    files::makeFolder(root_ + u"/component"_s);
    makeShopDatabase();
    host_.emplace();
}

Shop::~Shop()
{
    desktop.reset();
    host_.reset();
    forgetSharedVariables();
}

void Shop::arrive(const Text& name, const Text& content)
{
    files::write(gsUnreadPath + name, content);
}

std::string Shop::shown()
{
    const QJsonArray& boxes = desktop->record().boxes;
    boxesSeen_ = std::min(boxesSeen_, boxes.size());  // another script has begun a new record
    QStringList texts;
    for (; boxesSeen_ < boxes.size(); ++boxesSeen_) {
        const QJsonValue box = boxes[boxesSeen_];
        const QString title = box[u"title"_s].toString();
        texts << u"[%1] "_s.arg(box[u"icon"_s].toString()) + (title.isEmpty() ? title : title + u": "_s) +
                     box[u"text"_s].toString();
    }
    return texts.join(u'\n').toStdString();
}

QStringList Shop::filesIn(const QString& folder)
{
    return files::list(folder);
}

}  // namespace kest::test
