# SPDX-License-Identifier: MIT
# Makes of a public header what Doxygen reads: awk -f docs/doxygen.awk HEADER
# In the headers a comment holds for all declarations below it down to the next blank line, and one that stands alone for
# all that follows it. A paragraph with indented lines, such as a table, is kept as it stands.

# A line of a comment without the comment's marks.
function bare(line) {
    sub(/^ *(\/\*+|\*\/|\*|\/\/) ?/, "", line)
    sub(/ *\*\/ *$/, "", line)
    return line
}

# Doxygen writes other quotes so that they may become commands of a manual page.
function quoted(text) {
    while (sub(/"/, (is_quoted = !is_quoted) ? "“" : "”", text)) {
    }
    return text
}

function escaped(text) {
    gsub(/[\\@<>&#%$]/, "\\\\&", text)
    text = quoted(text)
    gsub(/\.”/, "\\.”", text) # which ends no sentence
    return text
}

function paragraphs(text, count, i, all, part) {
    count = split(text, part, /\n\n/)
    for (i = 1; i <= count; ++i) {
        if (part[i] ~ /\n +[^ ]/ && part[i] !~ /(^|\n)- /) {
            all = all "@verbatim\n" quoted(part[i]) "\n@endverbatim\n\n"
        } else {
            all = all escaped(part[i]) "\n\n"
        }
    }
    return all
}

function document(command, text) {
    if (text != "") {
        print "/** " command "\n" paragraphs(text) "*/"
    }
}

# What was collected of a comment so far.
function collected(text) {
    text = has_comment ? substr(comment, 2) : ""
    has_comment = 0
    comment = ""
    return text
}

function collect(line) {
    has_comment = 1
    comment = comment "\n" line
}

function close_section() {
    if (in_section) {
        print "/** @} */"
    }
    in_section = 0
}

function open_section(text, title) {
    close_section()
    gsub(/---- | ----/, "", text)
    title = text
    sub(/[.:(\n].*/, "", title)
    sub(/^[^.:(\n]*[.:]? */, "", text)
    document("@name " title, text == "" ? " " : text)
    print "/** @{ */"
    in_section = 1
    depth_of_section = depth
}

function declare(line, text, code) {
    if (!in_declaration) {
        if (has_comment) {
            in_force = collected()
        }
        document("", in_force)
        if (in_force == "" && line ~ /\(/ && line !~ /~/) {
            print "/** @there_is_no_comment */" # of which Doxygen warns
        }
    }
    code = line
    if (line ~ /[^ ].*(\/\/|\/\*) .*$/) { # a comment behind it
        text = line
        sub(/.*(\/\/|\/\*) /, "", text)
        sub(/ *\*\/ *$/, "", text)
        sub(/ *(\/\/|\/\*) .*$/, "", code)
        line = code " /**< " escaped(text) " */"
    }
    print line
    parentheses += gsub(/\(/, "", code) - gsub(/\)/, "", code)
    in_declaration = parentheses > 0 || code !~ /[;{}:,] *$/
}

FNR == 1 {
    is_of_file = 1
}
/SPDX-License-Identifier/ {
    next
}
in_block {
    if ($0 !~ /^ *\*\/ *$/) {
        collect(bare($0))
    }
    in_block = $0 !~ /\*\//
    next
}
/^ *(\/\/|\/\*)/ {
    if (bare($0) != "" || /^ *\/\//) {
        collect(bare($0))
    }
    in_block = /^ *\/\*/ && $0 !~ /\*\//
    next
}
is_of_file {
    document("@file\n", has_comment ? collected() : " ")
    is_of_file = 0
}
in_macro || in_body {
    print
    in_macro = in_macro && /\\$/
    in_body = in_body && !/^}/
    next
}
/^ *$/ {
    if (has_comment) {
        open_section(collected())
    }
    in_force = ""
    print
    next
}
/^ *}/ {
    --depth
}
/^ *(public|private|protected):/ || (/^ *}/ && depth < depth_of_section) {
    close_section()
}
/^#/ || /^ *(public|private|protected):/ || /^ *}/ || /^(namespace|extern "C") / {
    document("", collected())
    in_macro = /^#.*\\$/
    in_declaration = 0
    in_force = ""
    depth += /{ *$/
    print
    next
}
{
    declare($0)
    if (/^static inline .*{$/) {
        in_body = 1
    } else if (/{ *$/) {
        ++depth
        in_force = ""
    }
}
