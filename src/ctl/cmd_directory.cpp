// q19ctl directory: the instrument directory without windows. It drives the
// connection form's directory engine, so the refusals and messages are the
// form's own.

#include "ctl/ctl_command.h"
#include "directory/data_folder.h"
#include "directory/directory_engine.h"
#include "platform/operator.h"
#include "platform/store_layout.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <cstdio>

namespace {

const QString Usage = QStringLiteral(
    "list | add ID NAME [--address TEXT] [--town TEXT] [--phone TEXT] [--modem-phone TEXT]"
    " | delete ID | compact ID");

int usage(const QString& why)
{
    return ctl::usageError(QStringLiteral("directory"), why);
}

void out(const QString& text)
{
    std::fprintf(stdout, "%s\n", text.toLocal8Bit().constData());
}

int list(ccForm1_directory& form, bool json)
{
    form.Option1_Click(0);
    QJsonArray rows;
    for (const QStringList& row : form.rows()) {
        if (!json) {
            out(row.join(QLatin1Char('\t')));
            continue;
        }
        QJsonObject o;
        for (int f = 0; f < directory_table::FieldCount && f < row.size(); ++f)
            o.insert(directory_table::columnName(directory_table::Field(f)), row.at(f));
        rows.append(o);
    }
    if (json)
        out(QString::fromUtf8(QJsonDocument(rows).toJson(QJsonDocument::Indented)).trimmed());
    return ctl::Ok;
}

// The boxes that add fills from the command's own options.
const QList<QPair<QString, int>> kBoxOptions = {
    {QStringLiteral("address"), ccForm1_directory::AddressBox},
    {QStringLiteral("town"), ccForm1_directory::TownBox},
    {QStringLiteral("phone"), ccForm1_directory::PhoneBox},
    {QStringLiteral("modem-phone"), ccForm1_directory::ModemPhoneBox},
};

int add(ccForm1_directory& form, const CtlOptions& o, const QStringList& positional)
{
    QHash<int, QString> values;
    for (const auto& [name, box] : kBoxOptions) {
        if (o.isSet(name))
            values.insert(box, o.value(name));
    }
    if (positional.size() != 2)
        return usage(QStringLiteral("add needs ID and NAME"));
    values.insert(ccForm1_directory::IdBox, positional.at(0));
    values.insert(ccForm1_directory::NameBox, positional.at(1));

    form.Command1_Click();
    for (auto it = values.cbegin(); it != values.cend(); ++it)
        form.Text1_Change(it.key(), it.value());
    if (form.Command4_Click())
        return ctl::Ok;
    form.Command5_Click();
    return ctl::Failure;
}

// Makes the row of the ID the current and open one, as a pick in the list does.
bool select(ccForm1_directory& form, const QString& id)
{
    const int index = form.indexOfId(id);
    if (index < 0) {
        std::fprintf(stderr, "q19ctl directory: there is no Glacinor with ID %s\n", id.toLocal8Bit().constData());
        return false;
    }
    form.DBCombo1_Click(index);
    return form.Text1[ccForm1_directory::IdBox].text == id;
}

int run(const CtlOptions& o)
{
    if (o.args.isEmpty())
        return usage(QStringLiteral("no directory command given"));
    const QString sub = o.args.first();
    const QStringList args = o.args.mid(1);
    const bool yes = o.yes;
    if (sub != QLatin1String("list") && sub != QLatin1String("add") && sub != QLatin1String("delete")
        && sub != QLatin1String("compact"))
        return usage(QStringLiteral("unknown directory command %1").arg(sub));
    bool boxes = false;
    for (const auto& option : kBoxOptions)
        boxes = boxes || o.isSet(option.first);
    if (boxes && sub != QLatin1String("add"))
        return usage(QStringLiteral("only add takes --address, --town, --phone and --modem-phone"));
    if ((sub == QLatin1String("list") && !args.isEmpty()) || (sub == QLatin1String("add") && args.size() != 2)
        || ((sub == QLatin1String("delete") || sub == QLatin1String("compact")) && args.size() != 1))
        return usage(QStringLiteral("wrong arguments for %1").arg(sub));

    DataFolder folder(o.dataDir);
    QString error;
    if (!folder.ensure(&error)) {
        std::fprintf(stderr, "q19ctl directory: %s\n", error.toLocal8Bit().constData());
        return ctl::Failure;
    }
    HeadlessOperator op(yes);
    ccForm1_directory form(folder, op);
    if (!form.Form_Load())
        return ctl::Failure;

    int result = ctl::Failure;
    if (sub == QLatin1String("list")) {
        result = list(form, o.json);
    } else if (sub == QLatin1String("add")) {
        result = add(form, o, args);
    } else if (select(form, args.first())) {
        const int before = op.messages().size();
        const bool done = sub == QLatin1String("delete") ? form.Command2_Click() : form.Command8_Click();
        if (done)
            result = ctl::Ok;
        else if (!yes && op.messages().size() == before + 1)
            ctl::progress(QStringLiteral("q19ctl directory: not confirmed; --yes answers Yes"));
    }
    form.Form_Unload();
    return result;
}

const ctl::Registration registration(
    {QStringLiteral("directory"), Usage, QStringLiteral("list, add, delete or compact instruments of the directory"),
     run,
     {{QStringLiteral("address"), QStringLiteral("add: the instrument's address."), QStringLiteral("TEXT")},
      {QStringLiteral("town"), QStringLiteral("add: its town and state."), QStringLiteral("TEXT")},
      {QStringLiteral("phone"), QStringLiteral("add: the site's telephone."), QStringLiteral("TEXT")},
      {QStringLiteral("modem-phone"), QStringLiteral("add: the number its modem answers."), QStringLiteral("TEXT")}},
     false});

} // namespace
