#pragma once

// The transfers of the `channels` view without its pixels: the upload of one
// channel or of all 216 into the store, the download of the store into the
// instrument, and the checked write of single values (WritePath). The channel
// editor sits on this engine; q19ctl drives it headless.

#include "link/open_views.h"
#include "platform/clock.h"
#include "platform/control_state.h"
#include "platform/operator.h"
#include "setpoints/write_path.h"

#include <QObject>
#include <array>
#include <memory>

class Link;
class InstrumentStore;
class AuditTrail;
class ChannelSources;
class UploadProgressView;

class channels_transfer_engine : public QObject, public ChannelsView {
    Q_OBJECT
public:
    channels_transfer_engine(Link& link, Clock& clock, Operator& op, OpenViews& views,
                             InstrumentStore& store, UploadProgressView& upload,
                             QObject* parent = nullptr);
    ~channels_transfer_engine() override;

    void setAuditTrail(AuditTrail* audit);

    // The channel on the screen (1..216): the current row of `setpoints`.
    void setChannel(int channel);
    int channel();

    // --- the procedures of the form ---
    void uploadall_Click();
    void uploadchan_Click();
    void downloadall_Click();
    void downloadchan_Click();
    void sin_chan_up_load() override;
    void sin_chan_down_load();
    void down_check() override;
    void done_down() override;
    void ret_handel() override { writer.ret_handel(); }
    void stopTimer5() override { Timer5.stop(); }

    // --- state of the form ---
    WritePath writer;
    QByteArray command_prefix;
    bool uploading = false;
    bool upload_all = false;
    int saved_position = 0;
    int upload_retries = 0;
    QString return_string;
    QString sent_to_glacinor;
    bool down_all = false;
    bool down_running = false;
    int down_channel = 0;
    QString down_record;
    int down_mismatches = 0;
    int down_timeouts = 0;

    Timer Timer5; // give up (and in a download of all, try again)
    Timer Timer6; // ask again for the next record of an upload of all

    ControlState uploadall, uploadchan, downloadall, downloadchan;
    // The forms ccForm1 and channels: disabled for the whole of a transfer.
    bool forms_enabled = true;
    // Command1(n): struck through when channel n+1 is not connected.
    std::array<bool, 216> Command1_struck{};

    // A transfer started and not ended yet.
    bool transferRunning() const { return m_running; }
    // Channels of the transfer now running (or the last one) that went
    // through: stored by an upload, taken by the instrument in a download;
    // and how many it was to move (216 or 1).
    int channelsTransferred() const { return m_transferred; }
    int channelsInTransfer() const { return m_transferTotal; }

    // The channels (1-based) that a download of `channel` (0: all) from this
    // store would send although their rows never came from the instrument,
    // by upload or by a confirmed edit: they hold the template's values.
    // Asked before the download's question (q19ctl, "Download all"); empty
    // when the download may go. Needs no line.
    static QList<int> channelsNeverFilled(InstrumentStore& store, int channel);
    // The program's words for such channels, for the refusal or the question.
    static QStringList neverFilledText(const QList<int>& channels);
    // The line went while a transfer ran: it ends now with the give-up,
    // rather than asking a closed port again until Timer5 runs out.
    void lineLost();

signals:
    void changed();
    // A channel's record is stored (upload) or taken (download); 1-based.
    void channelDone(int channel);
    // The transfer ended: ok when it went to its end without a failure message.
    void transferEnded(bool ok);
    // The screen is to be filled again from the store.
    void refillScreen();

private:
    void Timer5_Timer();
    void Timer6_Timer();
    void setButtons(bool enabled);
    void setForms(bool enabled);
    void endOfTransfer();
    void finish(bool ok);
    void invalidValue(int channel, int infoRow);
    void channelInvalid();
    void timeRepair(int field, int channel);
    bool sendDownRecord(bool fresh);
    void readDownloadRows();
    void giveUp();
    void loadValidation();
    void confirmedWrite();
    bool send(const QByteArray& body);
    int wireChannelOfRow();

    Link& m_link;
    Clock& m_clock;
    Operator& m_op;
    InstrumentStore& m_store;
    UploadProgressView& m_upload;
    AuditTrail* m_audit = nullptr;
    std::unique_ptr<ChannelSources> m_sources;
    int m_auditEntry = -1;
    // `info` columns 1, 3 and 4 by row, read once a transfer: a record is
    // checked without a query a value.
    struct Validation {
        QVariant fallback, minimum, maximum;
    };
    QList<Validation> m_validation;
    // A download of all channels: each channel's fields read and their values.
    QList<QList<int>> m_downFields;
    QList<QVariantList> m_downRows;
    int m_transferred = 0;
    int m_transferTotal = 0;
    bool m_running = false;
    bool m_failed = false;
};
