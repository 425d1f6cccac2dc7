#include "link/open_views.h"

bool OpenViews::anyOpen() const
{
    return history_open || alarm_open || status_open || channels_open || statusp_open
        || power_open || loadshed_open || statusg_open || statuspg_open || front_open
        || brumalet_open || multiprobes_open;
}

void OpenViews::closeAll()
{
    history_open = alarm_open = status_open = channels_open = statusp_open = power_open =
        loadshed_open = statusg_open = statuspg_open = front_open = brumalet_open =
            multiprobes_open = false;
}
