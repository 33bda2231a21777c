// Shows a window with one line of text and ends. bench_startup compares the panel with it. A window without text would
// not be a floor: it reads no fonts.
#include <QApplication>
#include <QDialog>
#include <QLabel>

int main(int argc, char** argv)
{
    QApplication application(argc, argv);
    QDialog window;
    QLabel text(QStringLiteral("ORLA Partner Network"), &window);
    window.show();
    QApplication::processEvents();
    return 0;
}
