"""Questions with mistakes, as people ask them."""

import string

LONG_WORD = 4
EDITED = 0.5
EXTRA_WORD = 0.3


def edited(word, chance):
    """The word after one insertion, deletion or replacement."""
    place = chance.randrange(len(word))
    letter = chance.choice(string.ascii_lowercase)
    kind = chance.choice(("insert", "delete", "replace"))
    if kind == "insert":
        return word[:place] + letter + word[place:]
    if kind == "delete":
        return word[:place] + word[place + 1 :]
    return word[:place] + letter + word[place + 1 :]


def misspelled(phrase, extra_words, chance):
    """The phrase with some of its longer words edited once, and sometimes one word too many."""
    words = [
        edited(word, chance) if len(word) > LONG_WORD and chance.random() < EDITED else word
        for word in phrase.split()
    ]
    if chance.random() < EXTRA_WORD:
        words.insert(chance.randint(0, len(words)), chance.choice(extra_words))
    return " ".join(words)


def questions(phrases, extra_words, count, chance):
    """Lines of the number of a random phrase of several words, a tab, and the misspelled phrase."""
    several = [number for number, phrase in enumerate(phrases) if " " in phrase]
    for _ in range(count):
        number = chance.choice(several)
        yield f"{number}\t{misspelled(phrases[number], extra_words, chance)}"
