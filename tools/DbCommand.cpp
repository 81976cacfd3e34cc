#include <CLI/CLI.hpp>
#include <functional>
#include <iostream>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "tools/Commands.h"
#include "tools/DataFileTool.h"
#include "tools/RecordFields.h"

namespace {

// What a command line says; each command uses a part of it.
struct DbOptions {
    std::string file;
    OutputFormat format = OutputFormat::Table;
    std::string statement;
    Selection selection;
    bool all = false;
    std::vector<long> records;
    std::vector<std::string> values;
    std::string path;
    TextFormat text;
    std::string description;
    bool repair = false;
};

using Options = std::shared_ptr<DbOptions>;
using Action = std::function<int(DataFileTool&, const DbOptions&)>;

// The selection that --where made, or null without it.
const Selection* Selected(const DbOptions& options) {
    return options.selection.statement.empty() ? nullptr : &options.selection;
}

// Takes over --and and --or, which work in the order in which they are given.
void CollectSteps(const CLI::App& command, Selection* selection) {
    std::map<const CLI::Option*, std::size_t> used;
    for (const CLI::Option* option : command.parse_order()) {
        const bool narrows = option->check_name("--and");
        if (narrows || option->check_name("--or"))
            selection->further.emplace_back(narrows ? QueryMode::And : QueryMode::Or,
                                            option->results().at(used[option]++));
    }
}

class DbCommand {
  public:
    DbCommand(CLI::App& application, int& status);

    void AddReadingCommands();
    void AddChangingCommands();
    void AddMarkingCommands();
    void AddTextCommands();
    void AddFileCommands();

  private:
    void AddFormat(CLI::App* command);
    CLI::App* Add(const char* name, const char* description, Action action);
    CLI::Option* AddWhere(CLI::App* command, const char* description);
    void AddSelection(CLI::App* command, CLI::Option* where = nullptr);

    CLI::App* command_;
    int& status_;
    Options options_ = std::make_shared<DbOptions>();
};

DbCommand::DbCommand(CLI::App& application, int& status)
    : command_(application.add_subcommand("db", "Look into a data file, and change it.")), status_(status) {
    command_->require_subcommand(1);
    command_->add_option("FILE", options_->file, "The data file")->required();
    AddFormat(command_);
}

void DbCommand::AddFormat(CLI::App* command) {
    command
        ->add_option_function<std::string>(
            "--format",
            [options = options_](const std::string& name) {
                static const std::map<std::string, OutputFormat> formats = {
                    {"table", OutputFormat::Table}, {"tsv", OutputFormat::Tsv}, {"json", OutputFormat::Json}};
                const auto found = formats.find(name);
                if (found == formats.end())
                    throw CLI::ValidationError("--format", "'" + name + "' is none of table, tsv and json");
                options->format = found->second;
            },
            "table (default), tsv or json")
        ->option_text("FORMAT");
}

CLI::App* DbCommand::Add(const char* name, const char* description, Action action) {
    CLI::App* added = command_->add_subcommand(name, description);
    AddFormat(added);
    added->callback([added, options = options_, &status = status_, action = std::move(action)] {
        CollectSteps(*added, &options->selection);
        status = WithOutput([&](TextOutput& output) {
            DataFileTool tool(options->file, options->format, output, std::cerr);
            return tool.Finish(action(tool, *options));
        });
    });
    return added;
}

CLI::Option* DbCommand::AddWhere(CLI::App* command, const char* description) {
    return command->add_option("--where", options_->selection.statement, description)
        ->option_text("STATEMENT")
        ->check(CLI::Validator(
            [](const std::string& statement) {
                return statement.empty() ? std::string("the statement is empty") : std::string();
            },
            ""));
}

void DbCommand::AddSelection(CLI::App* command, CLI::Option* where) {
    constexpr int many = 1000;
    for (const auto& [name, help] : {std::pair{"--and", "Keep those that also match; may be repeated"},
                                     std::pair{"--or", "Add those that match; may be repeated"}}) {
        CLI::Option* step = command->add_option(name, help)
                                ->expected(1, many)
                                ->allow_extra_args(false)
                                ->option_text("STATEMENT");
        if (where != nullptr)
            step->needs(where);
    }
    command->add_flag("--case", options_->selection.exact, "The case of letters matters");
}

void DbCommand::AddReadingCommands() {
    Add(
        "info", "Show what the header says",
        [](DataFileTool& tool, const DbOptions&) { return tool.Info(); });
    Add(
        "columns", "List the columns", [](DataFileTool& tool, const DbOptions&) { return tool.Columns(); });
    CLI::App* query = Add("query", "Show records", [](DataFileTool& tool, const DbOptions& options) {
        return tool.Query(options.selection);
    });
    query->add_option("STATEMENT", options_->selection.statement,
                      "Which: COLUMN OPERATOR VALUE, the operator being =, !=, <, <=, >, >= or contains; "
                      "without it all records");
    AddSelection(query);
    query->add_option("--sort", options_->selection.sortColumn, "Show them in the order of this column")
        ->option_text("COLUMN");
    CLI::App* check =
        Add("check", "Say what is wrong with the file, and where",
            [](DataFileTool& tool, const DbOptions& options) { return tool.Check(options.repair); });
    check->add_flag("--repair", options_->repair, "Set the header's counts right, after a backup");
}

void DbCommand::AddChangingCommands() {
    CLI::App* set =
        Add("set", "Change a column of records", [](DataFileTool& tool, const DbOptions& options) {
            if (!options.all && Selected(options) == nullptr)
                throw CLI::RequiredError("--where or --all");
            return tool.Set(options.statement, options.selection);
        });
    set->add_option("STATEMENT", options_->statement,
                    "COLUMN OPERATOR VALUE, the operator being =, +, -, * or /")
        ->required();
    CLI::Option* where = AddWhere(set, "Which records");
    set->add_flag("--all", options_->all, "All records")->excludes(where);
    AddSelection(set, where);
    CLI::App* append = Add(
        "append", "Add a record",
        [](DataFileTool& tool, const DbOptions& options) { return tool.Append(options.values); });
    append->add_option("NAME=VALUE", options_->values, "A column's value; without one it is zero or empty")
        ->check(CLI::Validator(
            [](const std::string& value) {
                return value.find('=') == value.npos ? "a value is NAME=VALUE, not '" + value + "'"
                                                     : std::string();
            },
            ""));
}

void DbCommand::AddMarkingCommands() {
    const struct {
        const char* name;
        const char* description;
        const char* done;
        int (DATABASE::*mark)(long);
    } commands[] = {
        {"delete", "Delete records; they keep their numbers until the file is compacted", "deleted",
         &DATABASE::Delete},
        {"lock", "Mark records as locked", "locked", &DATABASE::Lock},
        {"unlock", "Take the mark off records", "unlocked", &DATABASE::UnLock},
        {"undelete", "Take deleted records back", "undeleted", &DATABASE::UnDelete},
    };
    for (const auto& [name, description, done, mark] : commands) {
        CLI::App* command =
            Add(name, description, [done = done, mark = mark](auto& tool, const auto& options) {
                if (options.records.empty() && Selected(options) == nullptr)
                    throw CLI::RequiredError("A record's number");
                return tool.Mark(done, mark, options.records, Selected(options));
            });
        command->add_option("RECORD", options_->records, "The records' numbers");
        if (mark == &DATABASE::UnDelete)
            continue; // a selection has no deleted records
        CLI::Option* where = AddWhere(command, "Those that match, instead of numbers");
        where->excludes("RECORD");
        AddSelection(command, where);
    }
}

void DbCommand::AddTextCommands() {
    CLI::App* exporting = Add("export", "Write records to a text file, a line each",
                              [](DataFileTool& tool, const DbOptions& options) {
                                  return tool.Export(options.path, options.text, Selected(options));
                              });
    exporting->add_option("TEXTFILE", options_->path, "The text file; replaced when it exists")->required();
    exporting->add_option("--separator", options_->text.separator, "What follows each field (default: a tab)")
        ->option_text("TEXT");
    exporting->add_flag("--characters", options_->text.characters,
                        "Write a byte as the character of that code, not as a number");
    exporting->add_flag("--heading", options_->text.heading, "Write a first line of the columns' names");
    CLI::Option* where = AddWhere(exporting, "Which records (default: all)");
    AddSelection(exporting, where);
    exporting->add_option("--sort", options_->selection.sortColumn, "Write them in the order of this column")
        ->option_text("COLUMN")
        ->needs(where);
    CLI::App* load = Add(
        "load", "Append the records of a text file, or none when a line is wrong",
        [](DataFileTool& tool, const DbOptions& options) { return tool.Load(options.path, options.text); });
    load->add_option("TEXTFILE", options_->path, "The text file, a line for each record")->required();
    load->add_option("--separators", options_->text.separator,
                     "The characters that end a field (default: a tab)")
        ->option_text("TEXT");
    load->add_flag("--characters", options_->text.characters,
                   "Read a byte as the character of that code, not as a number");
    load->add_flag("--heading", options_->text.heading,
                   "Expect a first line of the columns' names, in their order");
}

void DbCommand::AddFileCommands() {
    CLI::App* create = Add("create", "Make a new file", [](DataFileTool& tool, const DbOptions& options) {
        return tool.Create(options.description, options.values);
    });
    create
        ->add_option("--column", options_->values,
                     "A column; may be repeated. TYPE is string, byte, short, long, float, date or time; "
                     "WIDTH is in bytes, and a string needs one")
        ->option_text("NAME:TYPE[:WIDTH[:DECIMALS]]")
        ->allow_extra_args(false)
        ->check(CLI::Validator(
            [](const std::string& text) {
                COLUMN_ENTRY column{};
                return ParseColumn(text, &column);
            },
            ""))
        ->required();
    create->add_option("--description", options_->description, "A text of at most 31 bytes")
        ->option_text("TEXT");
    Add("compact", "Rewrite the file without its deleted records; the others get new numbers",
        [](DataFileTool& tool, const DbOptions&) { return tool.Compact(); });
}

} // namespace

void AddDbCommand(CLI::App& application, int& status) {
    DbCommand command(application, status);
    command.AddReadingCommands();
    command.AddChangingCommands();
    command.AddMarkingCommands();
    command.AddTextCommands();
    command.AddFileCommands();
}
