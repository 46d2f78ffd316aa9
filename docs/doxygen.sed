# Turns the plain comments of a header into Doxygen's, word for word.
/^ *\/\//{
  s|[\\@<>&#]|\\&|g
  s|^( *)// ?|\1/// |
}
s|([;,{}]) +// |\1 ///< |
s|^( *)/\* |\1/** |
s|([;,{}]) +/\* |\1 /**< |
