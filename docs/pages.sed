# Filters a page for doxygen: the reference has no copies of the examples, so their names stand there without a link.
s#\[([^]]+)\]\(\.\./examples/[^)]*\)#`\1`#g
