// Looks up misspelled words, or asks misspelled phrases, with Lucene 8.
//
//     java LuceneFuzzy words WORDS QUERIES [RESULTS]
//     java LuceneFuzzy phrases PHRASES QUERIES
//
// "words": one document a word; every word within 1 and 2 edits, transpositions counting as two.
// Measured are the whole FuzzyQuery (k1, k2) and its enumeration of terms alone (terms1, terms2),
// which scores nothing and is the least that Lucene can do. "phrases": one document a phrase; a
// query is an OR of its words, fuzzy as widely configured: 2 edits beyond five characters, 1 from
// three on, with Lucene's defaults else; ten results.
//
// The index is in memory, in one segment. Prints one JSON object, latencies in microseconds after a
// whole pass to warm up; RESULTS gets lines of the distance, the query and the words found.

import java.io.IOException;
import java.io.PrintWriter;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import java.util.Locale;
import org.apache.lucene.analysis.TokenStream;
import org.apache.lucene.analysis.core.KeywordAnalyzer;
import org.apache.lucene.analysis.standard.StandardAnalyzer;
import org.apache.lucene.analysis.Analyzer;
import org.apache.lucene.analysis.tokenattributes.CharTermAttribute;
import org.apache.lucene.document.Document;
import org.apache.lucene.document.Field;
import org.apache.lucene.document.StringField;
import org.apache.lucene.document.TextField;
import org.apache.lucene.index.DirectoryReader;
import org.apache.lucene.index.IndexWriter;
import org.apache.lucene.index.IndexWriterConfig;
import org.apache.lucene.index.LeafReaderContext;
import org.apache.lucene.index.MultiTerms;
import org.apache.lucene.index.Term;
import org.apache.lucene.index.Terms;
import org.apache.lucene.index.TermsEnum;
import org.apache.lucene.search.BooleanClause;
import org.apache.lucene.search.BooleanQuery;
import org.apache.lucene.search.FuzzyQuery;
import org.apache.lucene.search.FuzzyTermsEnum;
import org.apache.lucene.search.IndexSearcher;
import org.apache.lucene.search.Query;
import org.apache.lucene.search.ScoreDoc;
import org.apache.lucene.search.ScoreMode;
import org.apache.lucene.search.SimpleCollector;
import org.apache.lucene.search.TermQuery;
import org.apache.lucene.store.ByteBuffersDirectory;
import org.apache.lucene.util.BytesRef;

public final class LuceneFuzzy {
  private static final String FIELD = "text";
  private static final int SHOWN = 10;
  // Of each query the median counts, which leaves out what else the machine did.
  private static final int PASSES = 3;
  // More than any query of the work finds within two edits.
  private static final int EXPANSIONS = 20_000;

  private final ByteBuffersDirectory directory = new ByteBuffersDirectory();
  private final List<String> output = new ArrayList<>();
  private final List<String> lines;
  private IndexSearcher searcher;

  private LuceneFuzzy(List<String> lines) {
    this.lines = lines;
  }

  private interface Work {
    int run(String query) throws IOException;
  }

  private interface MakeField {
    Field of(String text);
  }

  public static void main(String[] arguments) throws IOException {
    BooleanQuery.setMaxClauseCount(Integer.MAX_VALUE);
    LuceneFuzzy lucene = new LuceneFuzzy(Files.readAllLines(Path.of(arguments[1])));
    List<String> queries = Files.readAllLines(Path.of(arguments[2]));
    if (arguments[0].equals("words")) {
      lucene.lookUpWords(queries);
      if (arguments.length > 3) {
        lucene.writeWords(queries, Path.of(arguments[3]));
      }
    } else {
      lucene.askPhrases(queries);
    }
    System.out.println("{" + String.join(", ", lucene.output) + "}");
  }

  /** A document's number is its line's: there is one segment, and nothing is deleted. */
  private void build(Analyzer analyzer, MakeField field) throws IOException {
    long start = System.nanoTime();
    IndexWriterConfig config = new IndexWriterConfig(analyzer).setRAMBufferSizeMB(512);
    try (IndexWriter writer = new IndexWriter(directory, config)) {
      for (String line : lines) {
        Document document = new Document();
        document.add(field.of(line));
        writer.addDocument(document);
      }
      writer.forceMerge(1);
    }
    double seconds = (System.nanoTime() - start) / 1e9;
    long bytes = 0;
    for (String name : directory.listAll()) {
      bytes += directory.fileLength(name);
    }
    searcher = new IndexSearcher(DirectoryReader.open(directory));
    searcher.setQueryCache(null);
    output.add(String.format(Locale.ROOT, "\"buildSeconds\": %.3f", seconds));
    output.add("\"indexBytes\": " + bytes);
  }

  private void lookUpWords(List<String> queries) throws IOException {
    build(new KeywordAnalyzer(), text -> new StringField(FIELD, text, Field.Store.NO));
    for (int edits = 1; edits <= 2; ++edits) {
      int distance = edits;
      measure("k" + edits, queries, query -> wordsNear(query, distance).size());
      measure("terms" + edits, queries, query -> termsNear(query, distance).size());
    }
  }

  private void writeWords(List<String> queries, Path results) throws IOException {
    try (PrintWriter file = new PrintWriter(Files.newBufferedWriter(results))) {
      for (int edits = 1; edits <= 2; ++edits) {
        for (String query : queries) {
          List<String> words = wordsNear(query, edits);
          if (!sorted(words).equals(sorted(termsNear(query, edits)))) {
            throw new IllegalStateException("The two ways differ on " + query);
          }
          file.println(edits + "\t" + query + "\t" + String.join(" ", words));
        }
      }
    }
  }

  private static List<String> sorted(List<String> words) {
    List<String> copy = new ArrayList<>(words);
    copy.sort(null);
    return copy;
  }

  private List<String> wordsNear(String word, int edits) throws IOException {
    Query query = new FuzzyQuery(new Term(FIELD, word), edits, 0, EXPANSIONS, false);
    List<String> words = new ArrayList<>();
    searcher.search(
        query,
        new SimpleCollector() {
          private int base;

          @Override
          protected void doSetNextReader(LeafReaderContext context) {
            base = context.docBase;
          }

          @Override
          public void collect(int document) {
            words.add(lines.get(base + document));
          }

          @Override
          public ScoreMode scoreMode() {
            return ScoreMode.COMPLETE_NO_SCORES;
          }
        });
    return words;
  }

  private List<String> termsNear(String word, int edits) throws IOException {
    Terms terms = MultiTerms.getTerms(searcher.getIndexReader(), FIELD);
    TermsEnum near = new FuzzyTermsEnum(terms, new Term(FIELD, word), edits, 0, false);
    List<String> words = new ArrayList<>();
    for (BytesRef term = near.next(); term != null; term = near.next()) {
      words.add(term.utf8ToString());
    }
    return words;
  }

  private void askPhrases(List<String> queries) throws IOException {
    Analyzer analyzer = new StandardAnalyzer();
    build(analyzer, text -> new TextField(FIELD, text, Field.Store.NO));
    int first = 0;
    int spelledFirst = 0;
    int withinTen = 0;
    List<String> texts = new ArrayList<>();
    for (String line : queries) {
      int tab = line.indexOf('\t');
      int source = Integer.parseInt(line.substring(0, tab));
      texts.add(line.substring(tab + 1));
      ScoreDoc[] found = searcher.search(anyOf(analyzer, line.substring(tab + 1)), SHOWN).scoreDocs;
      if (found.length > 0 && found[0].doc == source) {
        spelledFirst += 1;
      }
      for (int place = 0; place < found.length; ++place) {
        if (spaced(lines.get(found[place].doc)).equals(spaced(lines.get(source)))) {
          withinTen += 1;
          first += place == 0 ? 1 : 0;
          break;
        }
      }
    }
    measure("query", texts, text -> searcher.search(anyOf(analyzer, text), SHOWN).scoreDocs.length);
    output.add("\"questions\": " + texts.size());
    output.add("\"foundFirst\": " + first);
    output.add("\"spelledFirst\": " + spelledFirst);
    output.add("\"foundWithinTen\": " + withinTen);
  }

  /** A phrase by its words: what stands between them says nothing to an index of words. */
  private static String spaced(String phrase) {
    return phrase.replace('-', ' ');
  }

  private static Query anyOf(Analyzer analyzer, String text) throws IOException {
    BooleanQuery.Builder any = new BooleanQuery.Builder();
    try (TokenStream tokens = analyzer.tokenStream(FIELD, text)) {
      CharTermAttribute token = tokens.addAttribute(CharTermAttribute.class);
      tokens.reset();
      while (tokens.incrementToken()) {
        Term term = new Term(FIELD, token.toString());
        int edits = token.length() > 5 ? 2 : token.length() > 2 ? 1 : 0;
        Query query = edits == 0 ? new TermQuery(term) : new FuzzyQuery(term, edits);
        any.add(query, BooleanClause.Occur.SHOULD);
      }
      tokens.end();
    }
    return any.build();
  }

  private void measure(String name, List<String> queries, Work work) throws IOException {
    long found = 0;
    for (String query : queries) {
      found += work.run(query);
    }
    long foundAgain = 0;
    long[][] passes = new long[queries.size()][PASSES];
    for (int pass = 0; pass < PASSES; ++pass) {
      for (int i = 0; i < passes.length; ++i) {
        long start = System.nanoTime();
        foundAgain += work.run(queries.get(i));
        passes[i][pass] = System.nanoTime() - start;
      }
    }
    long[] nanoseconds = new long[passes.length];
    for (int i = 0; i < passes.length; ++i) {
      Arrays.sort(passes[i]);
      nanoseconds[i] = passes[i][PASSES / 2];
    }
    if (PASSES * found != foundAgain) {
      throw new IllegalStateException("A query did not find the same again.");
    }
    Arrays.sort(nanoseconds);
    output.add(
        String.format(
            Locale.ROOT,
            "\"%s\": {\"mean\": %.3f, \"p50\": %.3f, \"p99\": %.3f, \"found\": %d}",
            name,
            Arrays.stream(nanoseconds).average().orElse(0) / 1e3,
            nanoseconds[nanoseconds.length / 2] / 1e3,
            nanoseconds[nanoseconds.length * 99 / 100] / 1e3,
            found));
  }
}
