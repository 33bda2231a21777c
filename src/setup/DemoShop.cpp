#include "setup/DemoShop.h"

#include "platform/files/CodePage.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "setup/QuoteDatabase.h"

#include <QBuffer>
#include <QDir>
#include <QPainter>
#include <QPainterPath>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

struct NamedPhotograph {
    QString name;
    Photograph photograph;
};

void putPhotographs(const QString& folder, std::initializer_list<NamedPhotograph> photographs)
{
    for (const auto& [name, photograph] : photographs)
        files::writeBytes(folder + name, jpegOf(photograph));
}

void putMessages(const QString& resource, const QString& folder, const QDate& today)
{
    const QDir messages(u":/sql/demo/"_s + resource);
    for (const QString& name : messages.entryList(QDir::Files)) {
        QFile file(messages.filePath(name));
        file.open(QIODevice::ReadOnly);
        files::write(folder + name, withDates(files::fromCodePage(file.readAll()), today));
    }
}

QPainterPath carSide()
{
    QPainterPath body(QPointF(70, 300));
    body.cubicTo(70, 250, 100, 240, 190, 232);
    body.cubicTo(240, 170, 270, 160, 330, 158);
    body.cubicTo(410, 156, 450, 180, 490, 228);
    body.cubicTo(560, 234, 575, 250, 572, 300);
    body.closeSubpath();
    return body;
}

QPainterPath windows()
{
    QPainterPath glass;
    glass.addPolygon(QPolygonF({{215, 230}, {262, 180}, {325, 172}, {325, 230}, {215, 230}}));
    glass.addPolygon(QPolygonF({{338, 230}, {338, 172}, {405, 178}, {455, 230}, {338, 230}}));
    return glass;
}

}  // namespace

QImage drawn(const Photograph& photograph)
{
    QImage image(640, 420, QImage::Format_RGB32);
    image.fill(QColor(214, 222, 230));
    QPainter painter(&image);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.fillRect(0, 310, 640, 110, QColor(150, 150, 146));

    painter.setPen(QPen(QColor(40, 40, 40), 3));
    painter.setBrush(photograph.paint);
    painter.drawPath(carSide());
    painter.setBrush(QColor(90, 110, 125));
    painter.drawPath(windows());
    painter.drawLine(332, 232, 332, 296);
    for (const int wheel : {165, 475}) {
        painter.setBrush(QColor(30, 30, 30));
        painter.drawEllipse(QPoint(wheel, 302), 42, 42);
        painter.setBrush(QColor(170, 170, 175));
        painter.drawEllipse(QPoint(wheel, 302), 22, 22);
    }

    const QPointF dent(90 + photograph.dent * 460, 262);
    painter.setBrush(photograph.paint.darker(170));
    painter.setPen(Qt::NoPen);
    painter.drawEllipse(dent, 20, 13);
    painter.setBrush(Qt::NoBrush);
    painter.setPen(QPen(QColor(200, 20, 20), 4));
    painter.drawEllipse(dent, 38, 30);

    QFont font(u"Liberation Sans"_s);
    font.setPixelSize(22);
    painter.setFont(font);
    painter.setPen(Qt::black);
    painter.drawText(QRect(20, 372, 600, 36), Qt::AlignLeft | Qt::AlignVCenter, photograph.caption);
    return image;
}

QByteArray jpegOf(const Photograph& photograph)
{
    QByteArray bytes;
    QBuffer buffer(&bytes);
    buffer.open(QIODevice::WriteOnly);
    drawn(photograph).save(&buffer, "JPEG", 85);
    return bytes;
}

void putDemoFiles(const QString& home, const QString& images, const QDate& today)
{
    registerResources();
    for (const auto& [resource, folder] :
         {std::pair(u"unread"_s, u"AUnread\\"_s), {u"read"_s, u"ARead\\"_s}, {u"sent"_s, u"ASent\\"_s}})
        putMessages(resource, home + folder, today);

    QFile rules(u":/sql/demo/insurer.rules"_s);
    rules.open(QIODevice::ReadOnly);
    files::writeBytes(profile::componentFolder() + u"/insurer.rules"_s, rules.readAll());

    const QString unread = home + u"AUnread\\"_s;
    const QColor blue(52, 86, 160), silver(190, 194, 200), champagne(214, 196, 150);
    putPhotographs(unread, {{u"20551_001.jpg"_s, {u"MWR275  left front guard"_s, blue, 0.10}},
                            {u"20551_002.jpg"_s, {u"MWR275  left front door"_s, blue, 0.42}},
                            {u"20551_003.jpg"_s, {u"MWR275  left rear quarter, old damage"_s, blue, 0.88}}});
    files::write(unread + u"20551_001.txt"_s, u"Guard pushed back onto the wheel"_s);
    putPhotographs(images, {{u"1003_0001.jpg"_s, {u"WRG 114  left front corner"_s, silver, 0.05}},
                            {u"1003_0002.jpg"_s, {u"WRG 114  left front guard"_s, silver, 0.14}},
                            {u"1007_0001.jpg"_s, {u"DRF551  left front corner"_s, champagne, 0.06}},
                            {u"1007_0002.jpg"_s, {u"DRF551  bonnet edge"_s, champagne, 0.20}}});
}

}  // namespace kest::app
