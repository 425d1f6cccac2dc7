#pragma once

// The line to an instrument as the commands that talk to one open it: the
// directory row of the ID, the instrument's stored connection settings (or a
// direct line when it has none), a port given on the command line, then the
// direct connect or the modem call and the check of the identity.

#include "ctl/ctl_command.h"
#include "link/ccform1_engine.h"
#include "platform/clock.h"
#include "platform/operator.h"
#include "platform/settings.h"
#include "platform/store.h"

#include <functional>
#include <memory>
#include <optional>

namespace ctl {

// The instrument the workstation selects at start: the directory form's
// first row by name whose data base is there. Empty when there is none.
QString selectedInstrument(const QString& dataDir);

// An instrument's row of the directory: the row of the ID, or the first row
// when the ID is empty. Null when the directory has no such row (or cannot
// be read).
struct DirectoryRow {
    QString id;
    QString modemPhone;
};
std::optional<DirectoryRow> directoryRow(const QString& dataDir, const QString& id);

// Prints the dialogue's messages on stderr, as HeadlessOperator does; a
// port that would not open names the network address when it is one, as the
// port wording of the form would send a user looking for a serial device.
class ConnectionOperator : public HeadlessOperator {
public:
    using HeadlessOperator::HeadlessOperator;
    void setNetworkAddress(const QString& address) { m_address = address; }
    Answer ask(const Message& message) override;

private:
    QString m_address;
};

class Connection {
public:
    explicit Connection(const CtlOptions& options);
    // Closes the line (the modem hangs up).
    ~Connection();

    // Connects and waits for the identity. Ok when it was accepted and no
    // message came with it; Usage or Failure with the reason on stderr.
    int open(const QString& command);
    // The identity was accepted (a message may still have ended the dialogue).
    bool accepted() const { return m_accepted; }

    // Runs the event loop until done() holds or ms have passed; true when
    // done() holds.
    bool waitFor(const std::function<bool()>& done, int ms);

    QString id() const { return m_id; }
    ccForm1_engine& engine() { return *m_engine; }
    OpenViews views;
    LinkGlobals globals;
    SystemClock clock;
    ConnectionOperator op;

private:
    CtlOptions m_options;
    QString m_id;
    QString m_phone;
    std::unique_ptr<Store> m_store;
    std::unique_ptr<Recordset> m_info;
    MemorySettings m_settings; // the workstation's own settings are not touched from here
    std::unique_ptr<ccForm1_engine> m_engine;
    bool m_accepted = false;
};

} // namespace ctl
