// The floor of a start: a Qt program that shows one empty window and ends.
#include <QApplication>
#include <QDialog>

int main(int argc, char** argv)
{
    QApplication application(argc, argv);
    QDialog window;
    window.show();
    QApplication::processEvents();
    return 0;
}
