#include "tools/cli/Verbs.h"

#include "tools/curve/Keypoint.h"
#include "tools/tree/ChannelClass.h"

#include <CLI/CLI.hpp>
#include <algorithm>
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

/// The words that bash takes apart at blanks: names of several words are known with hyphens too.
std::string wordsOf(std::string names) {
    for (std::size_t at = 0; (at = names.find(", ", at)) != std::string::npos;) {
        names[at] = '\n';
        names.erase(at + 1, 1);
    }
    std::replace(names.begin(), names.end(), ' ', '-');
    std::replace(names.begin(), names.end(), '\n', ' ');
    return names;
}

std::string classNames() {
    std::string names;
    for (std::string const& name : storedClassNames()) {
        names += (names.empty() ? "" : " ") + name;
    }
    return names;
}

void writeForBash(std::vector<Verb> const& verbs, OutputSink& out) {
    std::string names;
    std::string cases;
    for (Verb const& verb : verbs) {
        names += (names.empty() ? "" : " ") + verb.arguments->get_name();
        cases += "    " + verb.arguments->get_name() + ") options='" + optionsOf(*verb.arguments) + "' ;;\n";
    }
    out.write("# Completion of lumenkey for bash 4 and later: . <(lumenkey completion bash)\n"
              "_lumenkey() {\n"
              "    local word=\"${COMP_WORDS[COMP_CWORD]}\" options='' values=''\n"
              "    COMPREPLY=()\n"
              "    if [ \"$COMP_CWORD\" -eq 1 ]; then\n"
              "        mapfile -t COMPREPLY < <(compgen -W '" +
              names +
              " --help --version' -- \"$word\")\n"
              "        return\n"
              "    fi\n"
              "    case \"${COMP_WORDS[1]}\" in\n" +
              cases +
              "    esac\n"
              "    case \"${COMP_WORDS[COMP_CWORD - 1]}\" in\n"
              "    --interpolation) values='" +
              wordsOf(interpolationNames()) +
              "' ;;\n"
              "    --rows) values='input keypoints' ;;\n"
              "    *) case \"${COMP_WORDS[1]} $COMP_CWORD\" in\n"
              "       'add 4') values='" +
              classNames() +
              "' ;;\n"
              "       'completion 2') values='bash' ;;\n"
              "       esac ;;\n"
              "    esac\n"
              "    if [ -n \"$values\" ]; then\n"
              "        mapfile -t COMPREPLY < <(compgen -W \"$values\" -- \"$word\")\n"
              "        return\n"
              "    fi\n"
              "    case \"$word\" in\n"
              "    -*) mapfile -t COMPREPLY < <(compgen -W \"$options\" -- \"$word\") ;;\n"
              "    *) mapfile -t COMPREPLY < <(compgen -f -- \"$word\") ;;\n"
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
