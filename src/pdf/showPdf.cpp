// The function that the component calls in this library.
#include "pdf/frmViewPDF.h"

extern "C" Q_DECL_EXPORT void kest2ShowPdf(const QString& fileName)
{
    kest::frmViewPDF::ShowForm(fileName);
}
