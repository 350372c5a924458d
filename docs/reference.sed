# Filters a header for doxygen: shows quoted texts of preconditions as code, removes from signatures what only the
# compiler needs, such as the conditions of a template, and removes deleted overloads.
/^ *\/\/\//s/"([^"]+)"/`\1`/g
/^[^/]*=\s*delete;/s/.*//
/friend struct detail::/s/.*//
s/, detail::If\w+<([^<>]|<[^<>]*>)*> = 0>/>/
s/, detail::IfIterator<It>>/>/
s/, (std::enable_if_t<.*, int>|IfView<V>) = 0>/>/
s/ : public detail::ReversePointer//
s/detail::Operand<T>/Operand<T>/g
