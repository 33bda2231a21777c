// What all windows have in common: name, caption, one way out, no key that presses a button by itself.
#pragma once

#include <QDialog>
#include <QString>

class QPushButton;

namespace kest::desktop {

/// A modal window with the close box alone. Escape is the close box: every way out that is no button passes through
/// `closeEvent`. Enter presses a button only where one was made the default.
class Form : public QDialog {
    Q_OBJECT
public:
    Form(const QString& name, const QString& caption);

protected:
    void keyPressEvent(QKeyEvent* event) override;
    void showEvent(QShowEvent* event) override;
};

/// A button with a picture of the way out in place of a caption, and Alt+X for it; `tip` is shown, and read out.
QPushButton* exitButton(QWidget* parent, const QString& name, const QString& tip = QStringLiteral("Close"));

/// The picture of a list that drops down, in the colour of the text.
QIcon dropArrow(const QPalette& palette);

}  // namespace kest::desktop
