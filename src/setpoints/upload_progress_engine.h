#pragma once

// The small progress form `upload` of the channel transfers: a title, two
// lines of text and a bar over the 216 channels.

#include "link/open_views.h"
#include "platform/change_notifier.h"
#include "platform/control_state.h"

#include <QObject>

class upload_progress_engine : public QObject, public UploadProgressView {
    Q_OBJECT
public:
    using QObject::QObject;

    static constexpr int ProgressBar1_Max = 216;

    ControlState Caption;      // the form's title
    ControlState Label1;       // "Channel n of 216 Channels Uploaded"
    ControlState Label2;       // what is going on
    ControlState ProgressBar1; // value: channels done
    bool loaded = false;

    // --- UploadProgressView ---
    void Show(const QString& title, const QString& label1, const QString& label2, int progress) override;
    void Show() override;
    void setProgress(int value, const QString& label1) override;
    void Unload() override;

signals:
    void changed();

private:
    ChangeNotifier m_notify{[this] { emit changed(); }};
};
