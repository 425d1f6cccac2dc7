#pragma once

#include <QList>
#include <QString>

// The twelve views of the main window, in the order of its booleans, with
// the names their menu items and toolbar buttons go by.
enum class ViewId {
    history,
    alarm,
    status,
    channels,
    statusp,
    power,
    loadshed,
    statusg,
    statuspg,
    front,
    brumalet,
    multiprobes,
};
constexpr int kViewCount = 12;

struct ViewInfo {
    ViewId id;
    const char* name;    // "history": the boolean is history_open
    const char* form;    // the view's form, "frmhistory"
    const char* caption; // menu caption, "Temp/Press Data Logged"
    const char* toolKey; // toolbar key, "tlbhistoryon"
};

const QList<ViewInfo>& viewCatalog();
const ViewInfo& viewInfo(ViewId id);

// The help topic of a view: the page that F1 opens while it is in front.
QString helpTopic(ViewId id);
// The page of the connection form.
inline const QString kConnectionHelpTopic = QStringLiteral("Connection Window");

// The toolbar in its order: key and tool tip.
struct ToolInfo {
    const char* key;
    const char* toolTip;
};
const QList<ToolInfo>& toolbarCatalog();

// The view a toolbar key opens, or -1 for the keys that open none.
int viewForToolKey(const QString& key);

// The order in which a switcher closes the other views.
const QList<ViewId>& closingOrder();
// The order in which exit unloads the views.
const QList<ViewId>& exitOrder();
