"""Frames stand in the log in the order in which the board sent them, however busy the machine is."""

import unittest

import order


class Order(unittest.TestCase):
    def test_no_frame_is_lost_or_out_of_order_at_line_rate(self):
        self.assertEqual(order.main(["--frames", "5000", "--busy", "2"]), 0)

    def test_the_tool_finds_an_inversion_if_there_is_one(self):
        figures = order.Figures()
        for number in (0, 1, 3, 2, 4, 7):
            figures.frame(number)
        self.assertEqual((figures.frames, figures.inversions, figures.lost), (6, 1, 2))
        self.assertFalse(figures.good())


if __name__ == "__main__":
    unittest.main()
