// Creates the files of the demo shop: messages in all folders, their photographs, and the rules of its insurer.
#pragma once

#include <QColor>
#include <QDate>
#include <QImage>
#include <QString>

namespace kest::app {

/// Writes the files to the message folders under `home`, to the images folder and to the component's folder. Their
/// dates are before `today`.
void putDemoFiles(const QString& home, const QString& images, const QDate& today);

/// A photograph of the demo shop: the side of a car with a marked dent, and a caption.
struct Photograph {
    QString caption;
    QColor paint;
    double dent;  // its position, from 0 at the front to 1 at the rear
};
/// Draws a photograph.
QImage drawn(const Photograph& photograph);
/// Returns a photograph as a JPEG file.
QByteArray jpegOf(const Photograph& photograph);

}  // namespace kest::app
