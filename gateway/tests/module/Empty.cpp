// A shared object without a module's entry.
