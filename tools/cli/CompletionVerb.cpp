#include "tools/cli/Verbs.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace lumenkey::tools {

namespace {

/// The long names of a verb's options, with blanks between them.
std::string optionsOf(CLI::App const& verb) {
    std::string words;
    for (CLI::Option const* const option : verb.get_options()) {
        for (std::string const& name : option->get_lnames()) {
            words += (words.empty() ? "--" : " --") + name;
        }
    }
    return words;
}

void writeForBash(std::vector<Verb> const& verbs, OutputSink& out) {
    std::string names;
    std::string cases;
    for (Verb const& verb : verbs) {
        names += (names.empty() ? "" : " ") + verb.arguments->get_name();
        cases += "    " + verb.arguments->get_name() + ") options='" + optionsOf(*verb.arguments) + "' ;;\n";
    }
    out.write("# Completion of lumenkey for bash: . <(lumenkey completion bash)\n"
              "_lumenkey() {\n"
              "    local word=\"${COMP_WORDS[COMP_CWORD]}\" options=''\n"
              "    COMPREPLY=()\n"
              "    if [ \"$COMP_CWORD\" -eq 1 ]; then\n"
              "        COMPREPLY=($(compgen -W '" +
              names +
              " --help --version' -- \"$word\"))\n"
              "        return\n"
              "    fi\n"
              "    case \"${COMP_WORDS[1]}\" in\n" +
              cases +
              "    esac\n"
              "    case \"$word\" in\n"
              "    -*) COMPREPLY=($(compgen -W \"$options\" -- \"$word\")) ;;\n"
              "    *) local IFS=$'\\n'; COMPREPLY=($(compgen -f -- \"$word\")) ;;\n"
              "    esac\n"
              "}\n"
              "complete -o filenames -F _lumenkey lumenkey\n");
}

} // namespace

Verb declareCompletion(CLI::App& program, std::vector<Verb> const& verbs) {
    auto const shell = std::make_shared<std::string>();
    CLI::App* const verb =
        program.add_subcommand("completion", "Write what a shell needs to complete verbs, options and files");
    verb->add_option("SHELL", *shell, "bash")
        ->check(CLI::IsMember(std::vector<std::string>{"bash"}))
        ->option_text(" ")
        ->required();
    verb->footer("Example: lumenkey completion bash > ~/.local/share/bash-completion/completions/lumenkey");
    return {verb, "bash", [&verbs, shell](OutputSink& out) { writeForBash(verbs, out); }};
}

} // namespace lumenkey::tools
