// Operations whose modules are still being written. Each answers "nothing
// done" so that the program runs; none pretends to work.
