// Manual pages and completions, read off the options as they are declared.

#include "common/manual.h"

#include <algorithm>
#include <cctype>
#include <sstream>

namespace vidshow::tools {

namespace {

using Options = std::vector<const CLI::Option*>;

std::string joined(const std::vector<std::string>& words, const std::string& between) {
    std::string text;
    for (const std::string& word : words)
        text += (text.empty() ? "" : between) + word;
    return text;
}

// What an option calls its value: CLI11 puts what its checks say behind a colon.
std::string valueName(const CLI::Option& option) {
    if (option.get_items_expected_max() == 0) return "";
    const std::string type = option.get_type_name();
    return type.substr(0, type.find(':'));
}

// The words that an option takes; none when it takes others.
std::vector<std::string> choices(const CLI::Option& option) {
    const std::string type = option.get_type_name();
    const size_t open = type.find(":{");
    if (open == std::string::npos) return {};
    std::istringstream list(type.substr(open + 2, type.find('}') - open - 2));
    std::vector<std::string> words;
    for (std::string word; std::getline(list, word, ',');)
        words.push_back(word);
    return words;
}

std::vector<std::string> names(const CLI::Option& option) {
    std::vector<std::string> all;
    for (const std::string& name : option.get_snames())
        all.push_back("-" + name);
    for (const std::string& name : option.get_lnames())
        all.push_back("--" + name);
    return all;
}

// As it stands in a line of man(7).
std::string escaped(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '\\') {
            result += "\\e";
        } else if (c == '-') {
            result += "\\-";
        } else {
            result += c == '\n' ? ' ' : c;
        }
    }
    const bool request = !result.empty() && (result[0] == '.' || result[0] == '\'');
    return (request ? "\\&" : "") + result;
}

std::string bold(const std::string& text) {
    return "\\fB" + escaped(text) + "\\fR";
}

std::string italic(const std::string& text) {
    return "\\fI" + escaped(text) + "\\fR";
}

std::string synopsis(const CLI::App& app) {
    std::string line = bold(app.get_name()) + " [" + italic("OPTION") + "...]";
    for (const CLI::Option* option : app.get_options()) {
        if (!option->get_positional()) continue;
        const std::string name = italic(option->get_name(true));
        line += option->get_required() ? " " + name : " [" + name + "]";
    }
    return line + "\n";
}

std::string sentence(const CLI::Option& option) {
    std::string text = escaped(option.get_description());
    const std::vector<std::string> words = choices(option);
    if (!words.empty()) text += "; one of " + escaped(joined(words, ", "));
    return text + ".\n";
}

std::string entry(const CLI::Option& option) {
    std::string head;
    if (option.get_positional()) {
        head = italic(option.get_name(true));
    } else {
        std::vector<std::string> marked;
        for (const std::string& name : names(option))
            marked.push_back(bold(name));
        head = joined(marked, ", ");
        const std::string value = valueName(option);
        if (!value.empty()) head += " " + italic(value);
    }
    return ".TP\n" + head + "\n" + sentence(option);
}

std::string upper(std::string text) {
    for (char& c : text)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    return text;
}

std::string beginningSmall(std::string text) {
    text.at(0) = static_cast<char>(std::tolower(static_cast<unsigned char>(text.at(0))));
    return text;
}

std::string paragraphs(const std::string& text) {
    std::string lines;
    for (size_t at = 0; at < text.size();) {
        const size_t end = std::min(text.find("\n\n", at), text.size());
        lines += ".PP\n" + escaped(text.substr(at, end - at)) + "\n";
        at = end + 2;
    }
    return lines;
}

// The case of a completion for what follows these options.
std::string caseOf(const std::string& pattern, const std::string& body) {
    return pattern.empty()
               ? ""
               : "        " + pattern + ")\n            " + body + "\n            return ;;\n";
}

std::string offer(const std::vector<std::string>& words) {
    return "COMPREPLY=($(compgen -W '" + joined(words, " ") + "' -- \"$cur\"))";
}

}  // namespace

std::string wrapped(const std::string& text, size_t width) {
    std::string lines;
    size_t column = 0;
    std::istringstream words(text);
    for (std::string word; words >> word;) {
        if (column != 0 && column + 1 + word.size() > width) {
            lines += "\n";
            column = 0;
        }
        lines += (column != 0 ? " " : "") + word;
        column += (column != 0 ? 1 : 0) + word.size();
    }
    return lines;
}

std::string manualPage(const ProgramText& text, const CLI::App& app) {
    std::string page = ".TH " + upper(app.get_name()) + " 1 \"\" \"vidshow " + text.version +
                       "\" \"User Commands\"\n.SH NAME\n" + escaped(text.name) + " \\- " +
                       escaped(beginningSmall(text.summary)) + "\n.SH SYNOPSIS\n" + synopsis(app) +
                       ".SH DESCRIPTION\n" + escaped(app.get_description()) + "\n.SH OPTIONS\n";
    for (const bool positional : {true, false}) {
        for (const CLI::Option* option : app.get_options()) {
            if (option->get_positional() == positional) page += entry(*option);
        }
    }
    for (const ProgramText::Section& section : text.sections)
        page += ".SH " + upper(section.title) + "\n" + paragraphs(section.text);
    return page;
}

std::string bashCompletion(const CLI::App& app) {
    std::vector<std::string> all;
    std::vector<std::string> withOwnWords;  // a value that nothing can guess
    std::string cases;
    for (const CLI::Option* option : app.get_options()) {
        if (option->get_positional()) continue;
        const std::vector<std::string> own = names(*option);
        all.insert(all.end(), own.begin(), own.end());
        const std::string value = valueName(*option);
        if (value.empty() || value == "FILE") continue;
        const std::vector<std::string> words = choices(*option);
        if (words.empty()) {
            withOwnWords.insert(withOwnWords.end(), own.begin(), own.end());
        } else {
            cases += caseOf(joined(own, "|"), offer(words));
        }
    }
    const std::string name = app.get_name();
    std::string function = "_" + name;
    for (char& c : function)
        c = c == '-' ? '_' : c;
    return "# Completion of " + name + " for bash, printed by the program itself.\n" + function +
           "() {\n"
           "    local cur=${COMP_WORDS[COMP_CWORD]} prev=${COMP_WORDS[COMP_CWORD-1]}\n"
           "    if [[ $cur == = ]]; then\n"
           "        cur=\n"
           "    elif [[ $prev == = ]]; then\n"
           "        prev=${COMP_WORDS[COMP_CWORD-2]}\n"
           "    fi\n"
           "    COMPREPLY=()\n"
           "    case $prev in\n" +
           cases + caseOf(joined(withOwnWords, "|"), "compopt +o default 2>/dev/null") +
           "    esac\n"
           "    if [[ $cur == -* ]]; then\n"
           "        " +
           offer(all) +
           "\n"
           "    fi\n"
           "}\n"
           "complete -o default -F " +
           function + " " + name + "\n";
}

}  // namespace vidshow::tools
