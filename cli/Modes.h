#ifndef WORDCATCHER_CLI_MODES_H
#define WORDCATCHER_CLI_MODES_H

#include <cstdint>

namespace CLI {
class App;
}

namespace wordcatcher::cli {

/// Adds --mode to a verb. `option` receives the matcher's options value (see KXWordcatcher) and
/// must live until the command line was parsed; without --mode it becomes the one of words.
void addModeOption(CLI::App& verb, std::uint64_t& option);

}  // namespace wordcatcher::cli

#endif
