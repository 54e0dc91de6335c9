#include "tools/cli/Verbs.h"

#include "lumenkey/version.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>

namespace lumenkey::tools {

namespace {

/// Text as the formatter of manual pages takes it: nothing in it is a request.
std::string pageText(std::string_view text) {
    std::string page;
    bool isLineStart = true;
    for (char const c : text) {
        if (isLineStart && (c == '.' || c == '\'')) {
            page += "\\&";
        }
        page += c == '\\' ? "\\e" : c == '-' ? "\\-" : std::string(1, c);
        isLineStart = c == '\n';
    }
    return page;
}

/// Lines stay lines, and a blank one parts paragraphs.
std::string pageParagraphs(std::string_view text) {
    std::string page;
    while (!text.empty()) {
        std::size_t const end = std::min(text.find('\n'), text.size());
        std::string_view const line = text.substr(0, end);
        page += line.empty() ? ".PP\n" : pageText(line) + "\n.br\n";
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return page;
}

std::string headOf(CLI::Option const& option) {
    std::string head = option.get_positional() ? option.get_name() : option.get_name(false, true);
    std::string const& argument = option.get_option_text();
    return argument.empty() || argument == " " ? head : head + " " + argument;
}

void writeOptions(CLI::App const& arguments, OutputSink& out) {
    for (CLI::Option const* const option : arguments.get_options()) {
        out.write(".TP\n.B " + pageText(headOf(*option)) + "\n" + pageText(option->get_description()) + "\n");
    }
}

void writeVerb(Verb const& verb, OutputSink& out) {
    CLI::App const& arguments = *verb.arguments;
    out.write(".SS " + pageText(arguments.get_name()) + "\n" + pageText(arguments.get_description()) +
              ".\n.PP\n" + ".B " + pageText("lumenkey " + arguments.get_name() + " " + verb.usage) + "\n");
    writeOptions(arguments, out);
    out.write(".PP\n" + pageParagraphs(arguments.get_footer()));
}

void writeManual(CLI::App const& program, std::vector<Verb> const& verbs, OutputSink& out) {
    out.write(".TH LUMENKEY 1 \"\" \"lumenkey " + std::string(LumenkeyVersionString) + "\"\n");
    out.write(".SH NAME\nlumenkey \\- " + pageText(program.get_description()) + "\n");
    out.write(".SH SYNOPSIS\n.B lumenkey\nVERB ...\n.SH DESCRIPTION\n" +
              pageParagraphs(program.get_footer()));
    out.write(".SH OPTIONS\n");
    writeOptions(program, out);
    out.write(".SH VERBS\n");
    for (Verb const& verb : verbs) {
        writeVerb(verb, out);
    }
}

} // namespace

Verb declareManual(CLI::App& program, std::vector<Verb> const& verbs) {
    CLI::App* const verb = program.add_subcommand("manual", "Write the manual page");
    verb->footer("The page is made of the same texts as the help of all verbs.\n\n"
                 "Example: lumenkey manual | man -l -");
    return {verb, "", [&program, &verbs](OutputSink& out) { writeManual(program, verbs, out); }};
}

} // namespace lumenkey::tools
