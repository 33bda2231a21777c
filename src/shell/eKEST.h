// The class that the host creates to show the panel for its open quote.
#pragma once

#include <QString>

namespace kest {

/// The component as a host uses it. The connection and the folders stay the same while the object lives.
class eKEST {
public:
    /// Opens the connection and reads the folders from the host's settings. If the connection can't be opened, `gConn`
    /// is null and no box appears.
    eKEST();
    ~eKEST();
    eKEST(const eKEST&) = delete;
    eKEST& operator=(const eKEST&) = delete;

    /// Shows the panel for a quote and returns when the user has closed it. Pass "0" and "0" if no quote is open.
    void ShowKESTWindow(const QString& sQTNNO, const QString& sSubQuote);
};

/// Returns the text of the box "About KEST2": version, profile, database, error log and last error.
QString aboutText();
/// Returns true if there is a connection. Otherwise shows a box and returns false.
bool hasConnection();
/// Opens `grsQuote` for the host's open quote. Returns false if hasConnection() does.
bool openHostQuote(const QString& sQTNNO, const QString& sSubQuote);

}  // namespace kest
