# What doxygen reads of a header: quoted texts of preconditions as code, and signatures without what only the compiler
# needs, such as the conditions under which a template takes part, and the overloads that are refused.
/^ *\/\/\//s/"([^"]+)"/`\1`/g
/^[^/]*=\s*delete;/s/.*//
/friend struct detail::/s/.*//
s/, detail::If\w+<([^<>]|<[^<>]*>)*> = 0>/>/
s/, detail::IfIterator<It>>/>/
s/, std::enable_if_t<.*, int> = 0>/>/
s/ : public detail::ReversePointer//
s/detail::Operand<T>/Operand<T>/g
