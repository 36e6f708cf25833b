// Asks misspelled phrases with MiniSearch, as its documentation configures it: words found by the
// OR of all, fuzzy up to a fifth of their length, which is the setting of its examples.
//
//     node --expose-gc minisearch.mjs PHRASES QUERIES
//
// in a directory whose node_modules holds minisearch. Prints one JSON object, latencies in
// microseconds after a whole pass to warm up, each the median of three passes; indexBytes is the index as JSON.

import { readFileSync } from 'node:fs'
import { createRequire } from 'node:module'

// Packages are looked for where it is run, not where this file is.
const MiniSearch = createRequire(`${process.cwd()}/`)('minisearch')

const FUZZY = 0.2
const SHOWN = 10
// Of each question the median counts, which leaves out what else the machine did.
const PASSES = 3

const linesOf = (path) => readFileSync(path, 'utf8').trimEnd().split('\n')

const heapBytes = () => {
  globalThis.gc()
  return process.memoryUsage().heapUsed
}

const phrases = linesOf(process.argv[2])
const questions = linesOf(process.argv[3]).map((line) => {
  const [source, text] = line.split('\t')
  return { source: Number(source), text }
})

const heapBefore = heapBytes()
const buildStart = performance.now()
const index = new MiniSearch({ fields: ['text'], searchOptions: { fuzzy: FUZZY } })
index.addAll(phrases.map((text, id) => ({ id, text })))
const buildSeconds = (performance.now() - buildStart) / 1e3
const heap = heapBytes() - heapBefore

// A phrase by its words: what stands between them says nothing to an index of words.
const spaced = phrases.map((text) => text.replaceAll('-', ' '))

let foundFirst = 0
let spelledFirst = 0
let foundWithinTen = 0
for (const { source, text } of questions) {
  const found = index.search(text)
  const place = found.findIndex((result) => spaced[result.id] === spaced[source])
  spelledFirst += found.length > 0 && found[0].id === source ? 1 : 0
  foundFirst += place === 0 ? 1 : 0
  foundWithinTen += place >= 0 && place < SHOWN ? 1 : 0
}

const passes = Array.from({ length: PASSES }, () =>
  questions.map(({ text }) => {
    const start = performance.now()
    index.search(text)
    return (performance.now() - start) * 1e3
  }),
)
const microseconds = questions.map((_, i) => {
  const times = passes.map((pass) => pass[i])
  return times.sort((a, b) => a - b)[Math.floor(PASSES / 2)]
})
microseconds.sort((a, b) => a - b)
const at = (part) => microseconds[Math.floor(microseconds.length * part)]

console.log(
  JSON.stringify({
    buildSeconds,
    heapBytes: heap,
    indexBytes: JSON.stringify(index).length,
    query: {
      mean: microseconds.reduce((sum, each) => sum + each, 0) / microseconds.length,
      p50: at(0.5),
      p99: at(0.99)
    },
    questions: questions.length,
    foundFirst,
    spelledFirst,
    foundWithinTen
  })
)
