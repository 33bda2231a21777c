// The demo shop's files: messages in all folders, the photographs that belong to them, the rules of its insurer.
#pragma once

#include <QColor>
#include <QDate>
#include <QImage>
#include <QString>

namespace kest::app {

/// Writes them into the message folders under `home`, the images folder and the component's folder; dates count back
/// from `today`.
void putDemoFiles(const QString& home, const QString& images, const QDate& today);

/// What a photograph of the demo shop shows: the side of a car with its damage marked, and a caption.
struct Photograph {
    QString caption;
    QColor paint;
    double dent;  // how far along the car, from 0 at the front to 1 at the rear
};
QImage drawn(const Photograph& photograph);
QByteArray jpegOf(const Photograph& photograph);

}  // namespace kest::app
