// A program's own header, which is named as one of the library's and stands before it in the search path.
#define OWN_BASIC_TYPES
