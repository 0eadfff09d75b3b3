// CommandLine.cpp: options and their help.

#include "CommandLine.h"

#include "DictionaryReader.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <map>

namespace {

constexpr char kAbout[] = "Looks into string dictionaries, checks them, compares them and converts them.";

constexpr char kStatuses[] = "Exit status: 0 fine; 1 problems or differences were found, or a key is missing; 2 wrong\n"
                             "usage; 3 a file cannot be read or written, and no output file was made.\n"
                             "Texts are printed as UTF-8. `ktdict COMMAND --help` says more.";

// CLI11 takes an argument in brackets apart at its commas where an option takes several. With this in front of it, it is
// a text like any other.
constexpr char kShield = '\x01';

bool IsBracketed(std::string const &argument) {
    return argument.size() >= 2 && argument.front() == '[' && argument.back() == ']';
}

std::string Unshielded(std::string text) {
    if (!text.empty() && text.front() == kShield) {
        text.erase(0, 1);
    }
    return text;
}

// The texts of options that Options has in another form.
struct Words {
    std::string format = "text";
    std::string to;
    std::string encoding = "utf-16";
    std::string order = "little";
    std::string locale;
};

CLI::App *AddCommand(CLI::App &app, char const *name, char const *about, Words &words) {
    CLI::App *const command = app.add_subcommand(name, about);
    command->add_option("--format", words.format, "How to print: text or json (text)")
        ->check(CLI::IsMember({"text", "json"}))
        ->type_name("FORMAT");
    return command;
}

void AddConvert(CLI::App &app, Options &options, Words &words) {
    ConvertOptions &convert = options.convert;
    CLI::App *const command = AddCommand(app, "convert", "Write a dictionary in another form", words);
    command->add_option("--to", words.to, "The form to write: text or binary")
        ->required()
        ->check(CLI::IsMember({"text", "binary"}))
        ->type_name("FORM");
    command->add_option("--encoding", words.encoding, "Text: utf-16 or ansi; binary: utf-16 or utf-8 (utf-16)")
        ->check(CLI::IsMember({"utf-16", "utf-8", "ansi"}))
        ->type_name("ENCODING");
    command->add_option("--byte-order", words.order, "Of numbers and UTF-16 units: little or big (little)")
        ->check(CLI::IsMember({"little", "big"}))
        ->type_name("ORDER");
    command->add_option("--locale", words.locale, "The locale that the binary form names (the input's, or en_US)")
        ->type_name("NAME");
    command->add_flag("--escape", convert.escapes, "Text: write what would come back otherwise as entities");
    command->add_flag("--salvage", convert.salvages, "Convert what can be read of a damaged input");
    command->add_flag("-f,--force", convert.overwrites, "Replace an output that is there (never the input)");
    command->add_option("INPUT", convert.input, "The dictionary")->required();
    command->add_option("OUTPUT", convert.output, "The file to make; one that is there is refused")->required();
    command->footer(
        "Every entry is read back from the new file. Entries that come back otherwise (a caret, backslash or\n"
        "entity in the text form, a character that the encoding has not) are warned of, and the status is\n"
        "1; the file is there all the same.");
}

void AddCommands(CLI::App &app, Options &options, Words &words) {
    CLI::App *const dump = AddCommand(app, "dump", "Print all entries of a dictionary", words);
    dump->add_flag("--no-header{false}", options.hasHeader, "Leave out the line that describes the file");
    dump->add_option("FILE", options.files, "The dictionary")->required()->expected(1);

    CLI::App *const get = AddCommand(app, "get", "Print the text of one key, as the application finds it", words);
    get->add_flag("-r,--raw", options.isRaw, "Print the text itself, without escapes for control characters");
    get->add_option("KEY", options.key, "[$$$]NAME[=DEFAULT]")->required();
    get->add_option("FILE", options.files, "The dictionaries to look in, each by itself")->required();

    CLI::App *const check = AddCommand(app, "check", "Report what is wrong in dictionaries", words);
    check->add_option("FILE", options.files, "The dictionaries; the keys of all are compared with the first one's")
        ->required();

    AddConvert(app, options, words);

    CLI::App *const diff = AddCommand(app, "diff", "Compare the entries of two dictionaries", words);
    diff->add_option("FILE", options.files, "The two dictionaries")->required()->expected(2);
}

// What is wrong with a combination, or null.
char const *Settle(CLI::App const &app, Words const &words, Options &options) {
    static std::map<std::string, Command> const kCommands{{"dump", Command::Dump},
                                                          {"get", Command::Get},
                                                          {"check", Command::Check},
                                                          {"convert", Command::Convert},
                                                          {"diff", Command::Diff}};
    CLI::App const *const command = app.get_subcommands().front();
    options.command = kCommands.at(command->get_name());
    options.isJson = words.format == "json";
    options.key = Unshielded(options.key);
    std::transform(options.files.begin(), options.files.end(), options.files.begin(), Unshielded);
    if (options.command == Command::Get) {
        orvik_private::KeyText const key = orvik_private::SplitKeyText(options.key);
        return key.isMalformed                   ? "the key begins with $ but not with $$$"
               : key.name.empty()                ? "the key has no name"
               : options.isRaw && options.isJson ? "--raw does not go with --format json"
                                                 : nullptr;
    }
    if (options.command != Command::Convert) {
        return nullptr;
    }
    ConvertOptions &convert = options.convert;
    convert.input = Unshielded(convert.input);
    convert.output = Unshielded(convert.output);
    convert.isBinary = words.to == "binary";
    convert.encoding = words.encoding == "utf-16"  ? orvik_private::kEncodingNone
                       : words.encoding == "utf-8" ? orvik_private::kEncodingUtf8
                                                   : orvik_private::kEncodingAnsi;
    convert.order = words.order == "big" ? std::endian::big : std::endian::little;
    if (command->count("--locale") != 0) {
        convert.locale = Unshielded(words.locale);
    }
    return convert.isBinary && convert.encoding == orvik_private::kEncodingAnsi ? "the binary form is utf-16 or utf-8"
           : !convert.isBinary && convert.encoding == orvik_private::kEncodingUtf8 ? "the text form is utf-16 or ansi"
           : convert.encoding == orvik_private::kEncodingAnsi && command->count("--byte-order") != 0
               ? "ANSI text has no byte order"
           : !convert.isBinary && convert.locale ? "only the binary form names a locale"
           : convert.isBinary && convert.escapes ? "the binary form needs no --escape"
                                                 : nullptr;
}

} // namespace

ParsedCommandLine ParseCommandLine(std::vector<std::string> arguments) {
    Options options;
    Words words;
    CLI::App app(kAbout, "ktdict");
    app.allow_windows_style_options(false); // keys begin with "/"
    app.require_subcommand(1);
    app.set_version_flag("--version", "ktdict " KTDICT_VERSION);
    app.footer(kStatuses);
    app.failure_message(CLI::FailureMessage::simple);
    AddCommands(app, options, words);
    for (std::string &argument : arguments) {
        if (IsBracketed(argument)) {
            argument.insert(argument.begin(), kShield);
        }
    }
    std::reverse(arguments.begin(), arguments.end()); // as the parser takes them
    ParsedCommandLine result;
    std::string wrong;
    try {
        app.parse(std::move(arguments));
        char const *const what = Settle(app, words, options);
        if (what == nullptr) {
            result.options = std::move(options);
            return result;
        }
        wrong = what;
    } catch (CLI::CallForHelp const &) {
        result.text = app.help();
        return result;
    } catch (CLI::CallForVersion const &version) {
        result.text = std::string(version.what()) + "\n";
        return result;
    } catch (CLI::ParseError const &error) {
        wrong = error.what();
    }
    std::erase(wrong, kShield);
    result.text = "ktdict: " + wrong + "\nktdict: `ktdict --help` lists the commands and options\n";
    result.status = Status::Usage;
    return result;
}
