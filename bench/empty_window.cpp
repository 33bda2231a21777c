// Shows one empty window and ends. bench_startup compares the panel with it.
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
