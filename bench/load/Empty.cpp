// A library of nothing.
