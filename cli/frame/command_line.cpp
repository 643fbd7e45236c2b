#include "cli/frame/command_line.h"

#include <fcntl.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <string_view>
#include <utility>

#include "cli/frame/build_facts.h"
#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/nearest_name.h"
#include "cli/frame/shown_text.h"

namespace pelorin::cli {
namespace {

std::vector<std::string> optionNames(const CLI::App& app) {
  std::vector<std::string> names;
  for (const CLI::Option* option : app.get_options()) {
    for (const std::string& name : option->get_lnames()) names.push_back("--" + name);
    for (const std::string& name : option->get_snames()) names.push_back("-" + name);
  }
  return names;
}

std::vector<OptionText> optionTexts(const CLI::App& app) {
  std::vector<OptionText> texts;
  for (const CLI::Option* option : app.get_options()) {
    OptionText text = {.names = {},
                       .value = option->get_type_name(),
                       .help = option->get_description(),
                       .heading = option->get_group(),
                       .required = option->get_required(),
                       .repeated = option->get_items_expected_max() > 1};
    for (const std::string& name : option->get_snames()) text.names.push_back("-" + name);
    for (const std::string& name : option->get_lnames()) text.names.push_back("--" + name);
    if (text.names.empty() && text.value.empty()) text.value = option->get_name(true);
    if (option->get_items_expected_max() == 0) text.value.clear();
    texts.push_back(std::move(text));
  }
  return texts;
}

constexpr const char* exampleHeading = "Examples:\n";

std::string exampleLine(const std::string& example) {
  return "  " + example + "\n";
}

// A file that is opened while a standard stream is closed gets its number, and what is said to a
// person ends in a photo. Opened the wrong way round, uses of the stream stay errors.
void keepStandardDescriptors() {
  for (const int descriptor : {STDIN_FILENO, STDOUT_FILENO, STDERR_FILENO}) {
    if (::fcntl(descriptor, F_GETFD) != -1) continue;
    if (::open("/dev/null", descriptor == STDIN_FILENO ? O_WRONLY : O_RDONLY) != descriptor) {
      std::_Exit(static_cast<int>(ExitCode::someFailed));
    }
  }
}

CommandLine::Reading refused(const std::string& message, const CLI::App* verb) {
  const std::string of = verb == nullptr ? "" : " " + verb->get_name();
  return {.refusal =
              "quenby" + of + ": " + shownText(message) + " (see quenby" + of + " --help)\n"};
}

bool asksForBuildFacts(const std::vector<std::string>& arguments) {
  const auto has = [&](const char* option) {
    return std::ranges::find(arguments, option) != arguments.end();
  };
  return arguments.size() == 2 && has("--json") && (has("--version") || has("-V"));
}

}  // namespace

CommandLine::CommandLine()
    : app_(std::make_unique<CLI::App>("Quenby makes photos better, one or a thousand at a time.")) {
  app_->name("quenby");
  app_->set_version_flag("-V,--version", "quenby " PELORIN_VERSION, "Print the version and leave");
  app_->add_flag("--json")->description(
      "With --version: compiler, instruction sets and libraries, too");
  app_->set_help_flag("-h,--help", "Print this help and leave");
  app_->require_subcommand(0, 1);
  app_->get_formatter()->label("SUBCOMMAND", "VERB");
  app_->get_formatter()->column_width(30);
  app_->footer(
      "Examples:\n"
      "  quenby enhance photo.jpg -o better.jpg\n"
      "  quenby enhance -r holiday -o better/ -j 4\n"
      "  quenby info photo.jpg\n\n"
      "`quenby VERB --help` tells all about a verb.");
}

CommandLine::~CommandLine() = default;

Verb CommandLine::addVerb(const std::string& name, const std::string& summary,
                          const std::string& examples, std::function<ExitCode()> work) {
  CLI::App* verb = app_->add_subcommand(name, summary);
  std::vector<std::string> lines;
  std::string footer = exampleHeading;
  for (std::size_t start = 0; start < examples.size();) {
    const std::size_t end = std::min(examples.find('\n', start), examples.size());
    lines.push_back(examples.substr(start, end - start));
    footer += exampleLine(lines.back());
    start = end + 1;
  }
  footer +=
      "\nExit codes: 0 all done, 1 some files failed, 2 wrong usage, 3 nothing to do,\n"
      "130 interrupted.";
  verb->footer(footer);
  verb->group("Verbs");
  verbs_.push_back({verb, std::move(lines), std::move(work)});
  return Verb(verb);
}

void CommandLine::hide(const std::string& name) {
  const auto verb =
      std::ranges::find(verbs_, name, [](const Work& w) { return w.verb->get_name(); });
  verb->hidden = true;
  verb->verb->group("");
}

std::vector<std::string> CommandLine::verbNames() const {
  std::vector<std::string> names;
  for (const Work& work : verbs_) {
    if (!work.hidden) names.push_back(work.verb->get_name());
  }
  return names;
}

CommandText CommandLine::text() const {
  CommandText text = {.name = app_->get_name(),
                      .version = PELORIN_VERSION,
                      .summary = app_->get_description(),
                      .options = optionTexts(*app_),
                      .verbs = {}};
  for (const Work& work : verbs_) {
    if (work.hidden) continue;
    std::size_t shown = std::string_view(exampleHeading).size();
    for (const std::string& example : work.examples) shown += exampleLine(example).size();
    text.verbs.push_back({work.verb->get_name(), work.verb->get_description(),
                          optionTexts(*work.verb), work.examples,
                          work.verb->get_footer().substr(shown)});
  }
  return text;
}

const CommandLine::Work* CommandLine::chosen() const {
  const auto named = std::ranges::find_if(verbs_, [](const Work& w) { return w.verb->parsed(); });
  return named == verbs_.end() ? nullptr : &*named;
}

CommandLine::Reading CommandLine::read(std::vector<std::string> arguments) {
  if (arguments.empty()) return {.refusal = app_->help()};
  if (arguments[0] == "help") {
    arguments.erase(arguments.begin());
    arguments.push_back("--help");
  }
  const auto isCalled = [&](const Work& work) { return work.verb->get_name() == arguments[0]; };
  if (!arguments[0].starts_with('-') && std::ranges::none_of(verbs_, isCalled)) {
    return refused(unknownName("verb", arguments[0], verbNames()), nullptr);
  }
  if (asksForBuildFacts(arguments)) {
    return {.code = ExitCode::allDone, .answer = buildFacts().dump(2) + "\n"};
  }
  for (std::string& argument : arguments) {
    // CLI11 takes [a,b] for a list; here it can only be a file's name.
    if (argument.starts_with('[')) argument.insert(0, "./");
  }
  const auto verbOfError = [this] { return chosen() == nullptr ? nullptr : chosen()->verb; };
  try {
    std::ranges::reverse(arguments);
    app_->parse(std::move(arguments));
  } catch (const CLI::Success& asked) {  // --help, --version
    std::ostringstream text;
    app_->exit(asked, text, text);
    return {.code = ExitCode::allDone, .answer = std::move(text).str()};
  } catch (const CLI::ExtrasError& error) {
    const CLI::App* verb = verbOfError();
    for (const CLI::App* app : {verb, static_cast<const CLI::App*>(app_.get())}) {
      if (app == nullptr) continue;
      for (const std::string& extra : app->remaining()) {
        if (extra.size() < 2 || extra[0] != '-') continue;
        return refused(unknownName("option", extra, optionNames(verb ? *verb : *app_)), verb);
      }
    }
    return refused(error.what(), verb);
  } catch (const CLI::ParseError& error) {
    return refused(error.what(), verbOfError());
  }
  if (chosen() == nullptr) return refused("no verb given", nullptr);
  if (app_->count("--json") > 0) return refused("--json goes behind the verb", nullptr);
  return {.runs = true};
}

ExitCode CommandLine::run(int argc, char** argv) {
  keepStandardDescriptors();
  // Writes beyond a limit or into a closed pipe are then errors like any other.
  std::signal(SIGPIPE, SIG_IGN);
  std::signal(SIGXFSZ, SIG_IGN);
  installInterruptHandler();

  const Reading reading = read({argv + 1, argv + argc});
  if (!reading.runs) {
    std::fputs(reading.refusal.c_str(), stderr);
    std::fputs(reading.answer.c_str(), stdout);
    return reading.code;
  }
  const Work* const work = chosen();
  const std::string name = work->verb->get_name();
  ExitCode code;
  try {
    code = work->run();
  } catch (const UsageError& error) {
    std::fputs(refused(error.what(), work->verb).refusal.c_str(), stderr);
    return ExitCode::usage;
  } catch (const Interrupted&) {
    return ExitCode::interrupted;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "quenby %s: %s\n", name.c_str(), shownText(explain(error)).c_str());
    return ExitCode::someFailed;
  }
  const bool printed = std::fflush(stdout) == 0 && std::ferror(stdout) == 0;
  if (!printed && code == ExitCode::allDone) {
    std::fprintf(stderr, "quenby %s: standard output cannot be written\n", name.c_str());
    return ExitCode::someFailed;
  }
  return code;
}

}  // namespace pelorin::cli
