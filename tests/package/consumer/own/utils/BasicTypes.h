// A program's own header. It has the name of one of the library's, and is found first.
#define OWN_BASIC_TYPES
