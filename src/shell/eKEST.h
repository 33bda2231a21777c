// The class that the host creates: it fixes connection and folders, and shows the panel on the host's quote.
#pragma once

#include <QString>

namespace kest {

/// One for each host; the connection and the folders stay fixed for its life.
class eKEST {
public:
    /// Opens the connection and reads the folders from the host's settings. Shows nothing: without a connection `gConn`
    /// is null.
    eKEST();
    ~eKEST();
    eKEST(const eKEST&) = delete;
    eKEST& operator=(const eKEST&) = delete;

    /// Shows the panel on a quote, "0" and "0" for none, and returns when it has been closed.
    void ShowKESTWindow(const QString& sQTNNO, const QString& sSubQuote);
};

/// True with a connection; false after a box that says there is none.
bool hasConnection();
/// Opens `grsQuote` on the quote that the host has open. False where hasConnection is.
bool openHostQuote(const QString& sQTNNO, const QString& sSubQuote);

}  // namespace kest
