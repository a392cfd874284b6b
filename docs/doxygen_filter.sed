# Makes the comments of the public headers readable for Doxygen: "//" to "///", behind a declaration to "///<", and a block
# to "/**". In a comment nothing is a command or a tag.
# Doxygen knows no namespace std to put the hash of a text into.
/^template <>$/{
    N
    /std::hash/{
        :body
        N
        /\n\};$/!b body
        d
    }
}
/^ *\/\//{
    s/[\\@<>#%]/\\&/g
    # Far from the margin a line goes on with the comment behind the declaration above it.
    s/^( {24,})\/\//\1\/\/\/</
    t
    s/\/\//\/\/\//
    b
}
/[;,{)>]( +)\/\/ /{
    h
    s/^(.*[;,{)>] +)\/\/ .*$/\1/
    x
    s/^.*[;,{)>] +\/\/ //
    s/[\\@<>#%]/\\&/g
    s/^/\/\/\/< /
    x
    G
    s/\n//
    b
}
/^ *\/\*/,/\*\//{
    s/\/\*/\/**/
}
