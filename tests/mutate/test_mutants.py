# SPDX-License-Identifier: Apache-2.0
"""What is changed and what is not, in sources made for it."""

from __future__ import annotations

import unittest

from mutate.campaign import CATALOGUE_SAMPLE, in_turn, limited, sample, stale_entries
from mutate.listed import Entry, EntryError, parse_entries
from mutate.mutants import Key, Mutant, make_mutants
from mutate.mutate import verdict
from mutate.source import Source, tokenize, unmutated_regions
from mutate.suite import Outcome


def source(text: str, path: str = "src/a/b.cpp") -> Source:
    return Source(path, text, tokenize(text))


def changes(text: str, path: str = "src/a/b.cpp") -> list[tuple[str, str]]:
    return [(each.before, each.after) for each in make_mutants([source(text, path)])]


def body(statements: str) -> str:
    return f"void f() {{\n{statements}\n}}\n"


class OperatorsTest(unittest.TestCase):
    def test_comparison_gets_its_other_bound_and_its_opposite(self) -> None:
        self.assertEqual(changes(body("g(a < b);")),
                         [("g(a < b);", "g(a <= b);"), ("g(a < b);", "g(a >= b);")])
        self.assertEqual(changes(body("g(a == b);")), [("g(a == b);", "g(a != b);")])

    def test_logic_arithmetic_and_signs_change(self) -> None:
        for before, after in (("a && b", "a || b"), ("a + b", "a - b"), ("a % b", "a / b"),
                              ("!a", "a"), ("-a", "a"), ("++a", "--a"), ("a >> b", "a << b")):
            self.assertEqual(changes(body(f"g({before});")), [(f"g({before});", f"g({after});")])

    def test_brackets_of_templates_pointers_and_references_stay(self) -> None:
        self.assertEqual(changes(body("g(std::array<T, N>{}, *p, &q);")), [])
        self.assertEqual(changes("void f(const T& t, char* const* u);\n"), [])

    def test_output_stays_but_a_shift_changes(self) -> None:
        self.assertEqual(changes(body("file << name;")), [])
        self.assertIn(("g(a << 8);", "g(a >> 8);"), changes(body("g(a << 8);")))

    def test_condition_without_a_comparison_is_negated(self) -> None:
        self.assertEqual(changes(body("if (ready()) {\n}")),
                         [("if (ready()) {", "if (!(ready())) {")])
        self.assertEqual(changes(body("if (a == b) {\n}")), [("if (a == b) {", "if (a != b) {")])


class ConstantsTest(unittest.TestCase):
    def replacements(self, constant: str) -> list[str]:
        return [after[2:-2] for _, after in changes(body(f"g({constant});"))]

    def test_numbers_get_their_neighbours(self) -> None:
        self.assertEqual(self.replacements("7"), ["8", "6"])
        self.assertEqual(self.replacements("0"), ["1"])
        self.assertEqual(self.replacements("10U"), ["11U", "9U"])
        self.assertEqual(self.replacements("0640"), ["0641", "0637"])

    def test_hexadecimal_numbers_keep_their_width(self) -> None:
        self.assertEqual(self.replacements("0x00FFU"), ["0x0100U", "0x00FEU"])
        self.assertEqual(self.replacements("0xFFFFFFFFU"),
                         ["0x00000000U", "0xFFFFFFFEU", "0xFFFEFFFFU"])

    def test_texts_lose_a_character_or_get_another(self) -> None:
        self.assertEqual(self.replacements(r'"abc\n"'), [r'"abX\n"', '"abc"'])
        self.assertEqual(self.replacements('""'), ['"?"'])
        self.assertEqual(self.replacements("'='"), ["'X'"])

    def test_names_of_constants_get_their_opposite_or_the_next_one(self) -> None:
        self.assertEqual(self.replacements("O_RDONLY"), ["O_WRONLY", "O_RDWR"])
        self.assertEqual(self.replacements("true"), ["false"])
        self.assertIn(("g(FIRST_SIZE);", "g(OTHER_SIZE);"),
                      changes(body("g(FIRST_SIZE);\nh(OTHER_SIZE);")))

    def test_enumerator_gets_the_next_one(self) -> None:
        text = "enum class Kind { one, two };\n" + body("g(Kind::two);")
        self.assertEqual(changes(text), [("g(Kind::two);", "g(Kind::one);")])


class OrderTest(unittest.TestCase):
    def test_adjacent_statements_change_places(self) -> None:
        self.assertEqual(changes(body("g();\nh();")), [("g(); h();", "h(); g();")])

    def test_statements_around_a_block_stay(self) -> None:
        self.assertEqual(changes(body("g();\nif (!a) {\n}\nh();")),
                         [("if (!a) {", "if (a) {")])

    def test_declarations_without_a_call_stay(self) -> None:
        self.assertEqual([after for _, after in changes(body("int a = b;\nstd::string c;"))], [])

    def test_data_members_change_places_and_functions_do_not(self) -> None:
        self.assertEqual(changes("struct A {\n    int a;\n    int b;\n    void f();\n};\n"),
                         [("int a; int b;", "int b; int a;")])

    def test_rows_of_a_table_change_places(self) -> None:
        self.assertEqual(changes('T t[] = {\n    {x, y},\n    {u, v},\n};\n'),
                         [("{x, y}, {u, v},", "{u, v}, {x, y},")])

    def test_rows_of_words_change_places(self) -> None:
        self.assertIn(("0x00, 0x01, 0x02, 0x03,", "0x02, 0x03, 0x00, 0x01,"),
                      changes("T t[] = {\n    0x00, 0x01,\n    0x02, 0x03,\n};\n"))


class SkippedTest(unittest.TestCase):
    def test_comments_includes_and_assertions_stay(self) -> None:
        self.assertEqual(changes('#include "a.h"\n// a < 1\n/* 2 */\nstatic_assert(f(3) == 4);\n'),
                         [])

    def test_code_that_only_an_assertion_uses_stays(self) -> None:
        text = ("constexpr int LIMIT_OF_IT = 3;\n"
                "constexpr bool inner() {\n    return 1 < LIMIT_OF_IT;\n}\n"
                "constexpr bool outer() {\n    return inner();\n}\n"
                "static_assert(outer());\n")
        self.assertEqual(changes(text), [])
        self.assertNotEqual(changes(text + body("g(inner());")), [])

    def test_name_that_another_file_defines_itself_is_not_a_use(self) -> None:
        checked = source("constexpr char NAME_OF_IT[] = {};\nstatic_assert(NAME_OF_IT[0] == 0);\n")
        other = source(body("g(NAME_OF_IT);"), "src/a/c.cpp")
        self.assertEqual(len(unmutated_regions([checked, other])["src/a/b.cpp"]), 2)
        header = source("extern const char NAME_OF_IT[];\n", "src/a/b.h")
        self.assertEqual(len(unmutated_regions([checked, other, header])["src/a/b.cpp"]), 1)

    def test_constant_of_a_header_is_not_a_check(self) -> None:
        header = source("constexpr int SIZE_OF_IT = 3;\n", "src/a/b.h")
        user = source("static_assert(SIZE_OF_IT == 3);\n")
        self.assertEqual(unmutated_regions([header, user])["src/a/b.h"], [])


class MutantTest(unittest.TestCase):
    def test_text_holds_the_change_and_the_diff_shows_it(self) -> None:
        original = body("g(a == b);")
        mutant = make_mutants([source(original)])[0]
        self.assertEqual(mutant.text, body("g(a != b);"))
        self.assertEqual(mutant.line, 2)
        self.assertIn("-g(a == b);\n+g(a != b);\n", mutant.diff(original))

    def test_mutants_that_look_alike_are_numbered(self) -> None:
        mutants = make_mutants([source(body("g(!a);") + body("g(!a);"))])
        self.assertEqual([mutant.occurrence for mutant in mutants], [1, 2])


def rows(path: str, count: int) -> list[Mutant]:
    return [Mutant(path, line, str(line), "", 1, True, "") for line in range(count)]


class SampleTest(unittest.TestCase):
    def test_rows_are_sampled_alike_for_the_same_seed(self) -> None:
        mutants = rows("a", 1000)
        self.assertEqual(len(sample(mutants, "1")), CATALOGUE_SAMPLE)
        self.assertEqual(sample(mutants, "1"), sample(mutants, "1"))
        self.assertNotEqual(sample(mutants, "1"), sample(mutants, "2"))

    def test_limit_draws_from_every_file(self) -> None:
        drawn = limited([*rows("a", 100), *rows("b", 2), *rows("c", 100)], 9, "1")
        self.assertEqual([sum(each.path == path for each in drawn) for path in "abc"], [4, 2, 3])

    def test_drawing_in_turn_gives_all_and_starts_with_every_file(self) -> None:
        mutants = [*rows("a", 100), *rows("b", 2), *rows("c", 100)]
        drawn = in_turn(mutants, "1")
        self.assertEqual([each.path for each in drawn[:7]], list("abcabca"))
        self.assertCountEqual(drawn, mutants)
        self.assertNotEqual(drawn, in_turn(mutants, "2"))


ENTRY = "@ src/a/b.cpp\n- g(!a);\n+ g(a);\n= nobody looks\n"


def entries_of(text: str) -> list[Entry]:
    return parse_entries(text, "list.txt")


class ListTest(unittest.TestCase):
    def test_entry_is_that_of_its_mutant(self) -> None:
        first, second = make_mutants([source(body("g(!a);") + body("g(!a);"))])
        self.assertEqual(entries_of(ENTRY)[0].key(), first.key())
        second_entry = ENTRY.replace("b.cpp", "b.cpp (2)")
        self.assertEqual(entries_of("# why\n\n" + second_entry)[0].key(), second.key())

    def test_malformed_lists_are_refused_by_name(self) -> None:
        for text in (ENTRY + ENTRY, ENTRY + "@ x\n", ENTRY.replace("= ", "? "),
                     ENTRY.replace("nobody looks", ""), ENTRY.replace("b.cpp", "b.cpp two")):
            with self.subTest(text), self.assertRaisesRegex(EntryError, r"^list\.txt:\d+: "):
                entries_of(text)

    def test_entry_without_its_mutant_or_that_is_untrue_is_stale(self) -> None:
        entries = entries_of(ENTRY)
        mutant = make_mutants([source(body("g(!a);"))])[0]

        def stale(made: list[Mutant], untrue: dict[Key, str], only: str | None) -> list[str]:
            return stale_entries("list.txt", entries, made, untrue, only)

        self.assertEqual(stale([mutant], {}, None), [])
        self.assertEqual(stale([], {}, "src/other.cpp"), [])
        self.assertEqual(stale([], {}, None), ["list.txt:1: there is no such mutant"])
        self.assertEqual(stale([mutant], {mutant.key(): "noticed by config"}, None),
                         ["list.txt:1: noticed by config"])

    def test_each_outcome_has_its_column(self) -> None:
        self.assertEqual([verdict(Outcome(by), False) for by in ("", "config", "compiler")],
                         ["survived", "tests", "compiler"])
        self.assertEqual(verdict(Outcome(""), True), "equivalent")
