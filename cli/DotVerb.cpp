#include <cstdint>
#include <memory>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

#include "cli/Arguments.h"
#include "cli/Counted.h"
#include "cli/Failure.h"
#include "cli/Graph.h"
#include "cli/OpenIndex.h"
#include "cli/Output.h"
#include "cli/Verbs.h"
#include "cli/WordTree.h"
#include "wordcatcher/fuzzy/LXFuzzyIndex.h"
#include "wordcatcher/text/Unicode.h"

namespace wordcatcher::cli {

namespace {

// A deterministic automaton has some 30 states a letter at 2 edits and 10 times as many with each
// edit more.
constexpr std::int64_t kLargestDistance = 4;
constexpr std::size_t kLongestWord = 64;
constexpr std::size_t kMostStates = 500;
constexpr std::size_t kMostWords = 200;

constexpr const char* kDotFooter = R"(
Writes a graph in the language of Graphviz, whose "dot" draws it.

Examples:
  wordcatcher dot nfa gate 1 | dot -Tsvg > nfa.svg
  wordcatcher dot dfa gate 1 | dot -Tpng > dfa.png
  wordcatcher dot tree dogs.wci go | dot -Tsvg > tree.svg)";

constexpr const char* kNfaFooter = R"(
Its states (index_distance) tell how many letters of WORD are accounted for, and at
how many edits. "*" reads any letter, and an edge without a letter reads none. States
with two borders accept. WORD is taken as it is; searches lower-case theirs.

Examples:
  wordcatcher dot nfa gate 1 | dot -Tsvg > nfa.svg)";

constexpr const char* kDfaFooter = R"(
Each of its states stands for a set of states of the nondeterministic automaton (see
"wordcatcher dot nfa --help"); "*" reads any letter that has no edge of its own.

Examples:
  wordcatcher dot dfa gate 1 | dot -Tsvg > dfa.svg)";

constexpr const char* kTreeFooter = R"(
The stored words (in text mode whole phrases, in phonetic mode codes), lower-cased,
and where they part. Words end at the places with two borders.

Examples:
  wordcatcher dot tree dogs.wci | dot -Tsvg > tree.svg
  wordcatcher dot tree dogs.wci go | dot -Tsvg > tree.svg)";

struct DotArguments {
  std::string word;
  std::int64_t maxDistance = 0;
  std::string index;
  std::string prefix;
  bool verbose = false;
};

std::u16string decoded(const std::string& utf8, const std::string& name) {
  auto text = fromUtf8(utf8);
  if (!text) {
    throw Failure(name + " is not valid UTF-8: give it in UTF-8.");
  }
  return *std::move(text);
}

void checkCanBeRead(std::size_t states) {
  if (states > kMostStates) {
    throw Failure("The automaton has " + counted(states, "state") +
                  ", and no drawing of more than " + std::to_string(kMostStates) +
                  " can be read: give a shorter WORD or a smaller K.");
  }
}

ExitCode print(const Graph& graph) {
  Output output;
  output.write(graph.text());
  output.flush();
  return kMatched;
}

/// Draws an automaton from its start state on. `targets(state, symbol)` are the names of the states
/// that an edge leads to.
template <typename Automaton, typename Targets>
Graph drawn(const Automaton& automaton, const std::string& title, const Targets& targets) {
  using Name = typename decltype(automaton.startState())::value_type;
  Graph graph(title);
  std::unordered_map<Name, std::size_t> nodes;
  std::vector<Name> pending;
  const auto nodeOf = [&](const Name& name) {
    const auto known = nodes.find(name);
    if (known != nodes.end()) {
      return known->second;
    }
    pending.push_back(name);
    const std::size_t node =
        graph.addNode(displayUtf8(name.description()), automaton.isFinalState(name));
    return nodes.emplace(name, node).first->second;
  };
  graph.markStart(nodeOf(*automaton.startState()));
  for (std::size_t next = 0; next < pending.size(); ++next) {
    const Name name = pending[next];
    const std::size_t node = nodeOf(name);
    for (const auto& symbol : automaton.stateNamed(name)->edges()) {
      for (const Name& target : targets(name, symbol)) {
        graph.addEdge(node, nodeOf(target), symbol == u"_" ? "" : visible(symbol));
      }
    }
  }
  return graph;
}

LevenshteinNFA nfaOf(const DotArguments& arguments) {
  const auto word = decoded(arguments.word, "WORD");
  if (word.size() > kLongestWord) {
    throw Failure("WORD has more than " + std::to_string(kLongestWord) +
                  " letters, and no drawing of its automaton can be read: give a shorter one.");
  }
  return LXFuzzyIndex::_LXcreateNFAWithWord_withMaxDistance(word, arguments.maxDistance);
}

std::string titleOf(const DotArguments& arguments) {
  return inQuotes(arguments.word) + " within " + counted(arguments.maxDistance, "edit");
}

ExitCode runNfa(const DotArguments& arguments) {
  const auto nfa = nfaOf(arguments);
  checkCanBeRead(nfa.size());
  return print(drawn(nfa, titleOf(arguments), [&nfa](const auto& state, const auto& symbol) {
    // Sorted, so that the same call gives the same bytes.
    const auto following = nfa.followingStatesFrom_withSymbol(state, symbol);
    LXIntTupleSet targets;
    targets.insert(following.begin(), following.end());
    return targets;
  }));
}

ExitCode runDfa(const DotArguments& arguments) {
  const auto dfa = LXFuzzyIndex::_LXcreateDFAFromNFA(nfaOf(arguments));
  checkCanBeRead(dfa.size());
  return print(drawn(dfa, titleOf(arguments), [&dfa](const auto& state, const auto& symbol) {
    return std::vector{*dfa.followingStateFrom_withSymbol(state, symbol)};
  }));
}

void drawBelow(Graph& graph, std::size_t node, const WordTree& tree) {
  for (const auto& [units, below] : tree.edges) {
    const std::size_t next = graph.addNode("", below.isWord);
    graph.addEdge(node, next, visible(units));
    drawBelow(graph, next, below);
  }
}

ExitCode runTree(const DotArguments& arguments) {
  checkIndexComesFirst(arguments.index, {arguments.prefix});
  const auto prefix = decoded(arguments.prefix, "PREFIX");
  const WordTree tree =
      wordTreeOf(*openWords(arguments.index, arguments.verbose), prefix, kMostWords);
  Graph graph("The words of " + inQuotes(arguments.index));
  const std::size_t root = graph.addNode(visible(prefix), tree.isWord);
  graph.markStart(root);
  drawBelow(graph, root, tree);
  return print(graph);
}

void addAutomaton(CLI::App& dot, const std::shared_ptr<DotArguments>& arguments, const char* name,
                  const char* description, const char* footer, ChosenVerb& chosen,
                  ExitCode (*run)(const DotArguments&)) {
  CLI::App& verb = addVerb(dot, name, description, footer);
  addArgument(verb, "WORD", arguments->word, "The word");
  addNumber(verb, "K", arguments->maxDistance, kLargestDistance, "Edits");
  whenNamed(verb, chosen, [arguments, run] { return run(*arguments); });
}

void addTree(CLI::App& dot, const std::shared_ptr<DotArguments>& arguments, ChosenVerb& chosen) {
  CLI::App& verb = addVerb(dot, "tree", "The prefix tree of an index", kTreeFooter);
  addVerboseFlag(verb, arguments->verbose);
  addArgument(verb, "INDEX", arguments->index,
              "A search image, or the directory of a classic index");
  addOptionalArgument(verb, "PREFIX", arguments->prefix, "What the words to draw begin with");
  whenNamed(verb, chosen, [arguments] { return runTree(*arguments); });
}

}  // namespace

void addDotVerb(CLI::App& program, ChosenVerb& chosen) {
  CLI::App& dot = addVerb(program, "dot", "Draw automata and the words of an index", kDotFooter);
  const auto arguments = std::make_shared<DotArguments>();
  addAutomaton(dot, arguments, "nfa", "The automaton of the strings near a word", kNfaFooter,
               chosen, runNfa);
  addAutomaton(dot, arguments, "dfa", "The same, deterministic", kDfaFooter, chosen, runDfa);
  addTree(dot, arguments, chosen);
  requireVerb(dot);
}

}  // namespace wordcatcher::cli
