#include "setpoints/upload_progress_engine.h"

void upload_progress_engine::Show(const QString& title, const QString& label1, const QString& label2,
                                  int progress)
{
    const auto p = m_notify.procedure();
    loaded = true;
    Caption.text = title;
    Label1.text = label1;
    Label2.text = label2;
    ProgressBar1.value = qBound(0, progress, ProgressBar1_Max);
}

void upload_progress_engine::Show()
{
    const auto p = m_notify.procedure();
    loaded = true;
}

void upload_progress_engine::setProgress(int value, const QString& label1)
{
    const auto p = m_notify.procedure();
    ProgressBar1.value = qBound(0, value, ProgressBar1_Max);
    Label1.text = label1;
}

void upload_progress_engine::Unload()
{
    const auto p = m_notify.procedure();
    loaded = false;
}
