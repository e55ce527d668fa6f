# Takes a document apart: Markdown, or a manual page, whose examples count. Prints a record a line,
# KIND, line number and text, with tabs between them:
#
#   run      a command: a line of an indented block or of a fence "sh", without the explanation
#            that stands behind it after two blanks or more
#   show     a command behind "$ ", of which the document shows what a terminal has
#   out      a line of what the show above prints, or of the file above
#   end      a block ends
#   file     the name of a file whose lines follow: a fence with a name behind its language
#   code     words between backticks in a sentence
#   link     where a link leads
#   fault    something that cannot be taken apart
#
# Every indented block is commands: what is something else stands in a fence that names it.

function record(kind, text, line) {
    printf "%s\t%d\t%s\n", kind, line ? line : FNR, text
}

# The place of the first two blanks outside of quotes in `text`, or 0.
function explained(text,   i, c, quote) {
    for (i = 1; i <= length(text); i++) {
        c = substr(text, i, 1)
        if (quote != "") {
            if (c == quote) quote = ""
        } else if (c == "\"" || c == "'") {
            quote = c
        } else if (c == " " && substr(text, i + 1, 1) == " ") {
            return i
        }
    }
    return 0
}

# Takes a command's line; one that ends in a backslash goes on with the next.
function command(kind, text,   place) {
    text = begun text
    begun = ""
    if (text ~ /\\$/) {
        begunKind = kind
        begun = substr(text, 1, length(text) - 1)
        return
    }
    column = 0
    place = explained(text)
    if (place) {
        column = place
        while (substr(text, column, 1) == " ") column++
        text = substr(text, 1, place - 1)
    }
    record(kind, text)
}

# Takes a line of a block of commands.
function commandLine(text,   blanks) {
    if (begun != "") {
        sub(/^ +/, "", text)
        command(begunKind, text)
    } else if (text ~ /^\$ /) {
        shown = 1
        command("show", substr(text, 3))
    } else if (shown) {
        record("out", text)
    } else if (text ~ /^ /) {
        blanks = match(text, /[^ ]/)
        if (!column || blanks != column) record("fault", "neither a command nor an explanation")
    } else if (text != "") {
        command("run", text)
    }
}

function endBlock() {
    if (!block) return
    if (begun != "") record("fault", "a backslash and nothing behind it")
    record("end", "")
    block = shown = blankLines = column = 0
    begun = ""
}

# Prints what a paragraph names between backticks, and its links.
function endParagraph(   rest, place, from) {
    rest = paragraph
    while (match(rest, /`[^`]+`/)) {
        record("code", substr(rest, RSTART + 1, RLENGTH - 2), began)
        rest = substr(rest, RSTART + RLENGTH)
    }
    rest = paragraph
    while (match(rest, /\]\([^)]+\)/)) {
        record("link", substr(rest, RSTART + 2, RLENGTH - 3), began)
        rest = substr(rest, RSTART + RLENGTH)
    }
    paragraph = ""
}

FILENAME ~ /\.[1-9]$/ {
    if ($1 == ".Sh") {
        examples = $0 == ".Sh EXAMPLES"
    } else if (examples && $1 == ".Dl") {
        text = substr($0, 5)
        gsub(/\\\(dq/, "\"", text)
        gsub(/\\&/, "", text)
        if (text !~ /^\$ / || text ~ /\\/) {
            record("fault", "no command that can be read")
        } else {
            record("show", substr(text, 3))
            record("end", "")
        }
    }
    next
}

/^```/ {
    endBlock()
    endParagraph()
    if (fence != "") {
        if (fence == "sh") { block = 1; endBlock() }
        fence = ""
        next
    }
    fence = substr($1, 4)
    if (fence == "") {
        record("fault", "a fence that does not say what is in it")
        fence = "text"
    }
    named = NF > 1
    if (named) record("file", $2)
    next
}

fence == "sh" { commandLine($0); next }
fence != "" { if (named) record("out", $0); next }

/^    / && (block || (afterBlank && paragraph == "")) {
    while (blankLines > 0) {
        blankLines--
        commandLine("")
    }
    block = 1
    commandLine(substr($0, 5))
    next
}
/^$/ {
    if (block) blankLines++
    endParagraph()
    afterBlank = 1
    next
}
{
    endBlock()
    afterBlank = 0
    if (paragraph == "") began = FNR
    paragraph = paragraph (paragraph == "" ? "" : " ") $0
}
END {
    if (fence != "") record("fault", "a fence without an end")
    endBlock()
    endParagraph()
}
