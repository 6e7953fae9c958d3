"""What bench/arm_cost.py makes of made-up code: arm_cost_test.py FOLDER, where arm_cost.py is."""
import re
import sys
import unittest

sys.dont_write_bytecode = True
sys.path.insert(0, sys.argv.pop())
from arm_cost import (BINDS, PEERS, SUMS, Stack, assembly, counts, difference, inner_loop, is_bound, ranges,  # noqa: E402
                      weighted)


def call(rounds, body, before=(1, 2), after=(90, 91)):
    return [*before, *(body * rounds), *after]


class InnerLoop(unittest.TestCase):
    def test_blocks_in_any_order(self):
        body = [40, 44, 10, 14, 4000, 18]  # entered in the middle; a block and a called function are elsewhere
        loop, rounds = inner_loop(call(10, body), call(25, body))
        self.assertEqual((loop, rounds), ([10, 14, 4000, 18, 40, 44], 15))

    def test_inner_rounds_belong_to_the_outer_loop(self):
        body = [20] + [24, 28] * 4 + [32]
        loop, rounds = inner_loop(call(8, body), call(16, body))
        self.assertEqual((sorted(loop), rounds), (sorted(body), 8))

    def test_refuses_what_does_not_repeat(self):
        with self.assertRaisesRegex(ValueError, "no loop"):
            inner_loop([1, 2, 3], [1, 2, 3])
        uneven = [[10] + [14] * (i * 7 % 5) for i in range(40)]
        with self.assertRaisesRegex(ValueError, "steady"):
            inner_loop(sum(uneven[:20], []), sum(uneven, []))
        two_loops = [call(n, [10, 14]) + [70, 74, 78] * n for n in (20, 40)]
        with self.assertRaisesRegex(ValueError, "grows"):
            inner_loop(*two_loops)


class Instructions(unittest.TestCase):
    def test_counts(self):
        loop = [("add", "r1, sp, #0x30"), ("vldmia", "r1, {d8, d9}"), ("ldr", "r1, [sp, #0x8]"),
                ("vld1.8", "{d0}, [r1]"), ("vstr", "d4, [sp, #120]"), ("vorr", "q1, q2, q2"), ("vorr", "q1, q2, q3"),
                ("mov", "v1.16b, v2.16b"), ("mov", "x1, x2"), ("str", "q0, [x1]"), ("bne", "0x10")]
        self.assertEqual(counts(loop, Stack()), dict(instructions=11, moves=2, spills=2))

    def test_text_for_the_models(self):
        loop = [("b.ne", "0x4005a0 <f+0x10>"), ("tbz", "x1, #0x3, 0x400 <f>"), ("bic", "v0.8h, #0xff, lsl #8"),
                ("ite", "gt"), ("addgt.w", "r3, r0, #0x10"), ("movle", "r3, r1"), ("vmul.i16", "q0, q1, q2"),
                ("vldmia", "r1!, {d8, d9, d10}"), ("vswp", "d0, d1")]
        self.assertEqual(assembly(loop).splitlines(),
                         ["b.ne there", "tbz x1, #0x3, there", "bic v0.8h, #0xff, lsl #8", "add.w r3, r0, #0x10",
                          "mov r3, r1", "vmul.i16 q0, q1, q2", "vld1.64 {d8, d9}, [r1]", "vld1.64 {d10}, [r1]",
                          "vtrn.32 d0, d1"])


class Sums(unittest.TestCase):
    def test_weighted(self):
        rows = {"a": dict(moves=2), "b": dict(moves=1)}
        self.assertEqual(weighted(rows, {"a": 1, "b": .5}), dict(moves=2.5))
        self.assertIsNone(weighted(rows, {"a": 1, "c": 1}))
        self.assertTrue(SUMS.keys() <= PEERS.keys())

    def test_whole_calls(self):
        self.assertEqual(difference([dict(moves=2)]), dict(moves=2))
        self.assertEqual(difference([dict(moves=2), dict(moves=7)]), dict(moves=5))

    def test_bound_by_loads_and_stores(self):
        def figures(cycles, accesses):
            return {"p": cycles, "p: loads and stores": accesses}
        self.assertTrue(is_bound(figures(9, 9), figures(10, 9), "p"))
        self.assertFalse(is_bound(figures(9, 8), figures(10, 9), "p"))  # ours are less: 0.8 can be had
        self.assertFalse(is_bound(figures(9, 9), figures(10, 8), "p"))

    def test_reasons_are_for_rows_that_are_compared(self):
        for rows in BINDS:
            self.assertTrue(any(re.fullmatch(rows, name) for name in PEERS), rows)

    def test_ranges(self):
        self.assertEqual(ranges([0x1000, 0x14, 0x10]), "0x10..0x14,0x1000..0x1000")


if __name__ == "__main__":
    unittest.main()
