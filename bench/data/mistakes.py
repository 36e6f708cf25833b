"""Questions with mistakes, as people ask them."""

import string

LONG_WORD = 4
VERY_LONG_WORD = 8
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


def one_word_each(words):
    """Those that are one word by every engine's rules. One with a hyphen is a phrase of its own."""
    return [word for word in words if word.isalpha()]


def questions(phrases, extra_words, count, chance):
    """Lines of the number of a random phrase of several words, a tab, and the misspelled phrase."""
    for number in several_words(phrases, count, chance):
        yield f"{number}\t{misspelled(phrases[number], extra_words, chance)}"


def several_words(phrases, count, chance):
    several = [number for number, phrase in enumerate(phrases) if " " in phrase]
    return [chance.choice(several) for _ in range(count)]


def edited_twice(words, chance):
    long = [place for place, word in enumerate(words) if len(word) >= VERY_LONG_WORD]
    if not long:
        return None
    place = chance.choice(long)
    return words[:place] + [edited(edited(words[place], chance), chance)] + words[place + 1 :]


def swapped(words, chance):
    place = chance.randrange(len(words) - 1)
    return words[:place] + [words[place + 1], words[place]] + words[place + 2 :]


def lacking_one(words, chance):
    if len(words) < 3:
        return None
    place = chance.randrange(len(words))
    return words[:place] + words[place + 1 :]


def split(words, chance):
    long = [place for place, word in enumerate(words) if len(word) > LONG_WORD]
    if not long:
        return None
    place = chance.choice(long)
    cut = chance.randrange(2, len(words[place]) - 1)
    return words[:place] + [words[place][:cut], words[place][cut:]] + words[place + 1 :]


def joined(words, chance):
    place = chance.randrange(len(words) - 1)
    return words[:place] + [words[place] + words[place + 1]] + words[place + 2 :]


OTHER_MISTAKES = (edited_twice, swapped, lacking_one, split, joined)


def other_questions(phrases, count, chance):
    """As questions(), each with one other mistake: two edits in a long word, neighbours swapped, a
    word missing, a word split in two, or two joined."""
    for number in several_words(phrases, count, chance):
        words = None
        while words is None:
            words = chance.choice(OTHER_MISTAKES)(phrases[number].split(), chance)
        yield f"{number}\t{' '.join(words)}"
