# The changes of tools/dev/mutate: reads one C++ source and prints each change that may be made to
# it, as "NUMBER<tab>LINE<tab>WHAT<tab>TEXT OF THE LINE<tab>together or alone".
#
# With `-v apply=NUMBER`, prints the source with that change. With `-v together=1`, prints one source
# that has every change that can be chosen while the program runs, by its number in the environment
# variable MUTANT, but for those in `-v without="NUMBER..."`: what the compiler says of such a change
# it says of the file "mutant", in a line from NUMBER * 1000 on.
#
# It knows words, not C++: what does not compile is found by the compiler. Comments and lines of the
# preprocessor stay as they are, and so do declarations but for the values in them.

BEGIN {
    split("== != != == <= < >= > && || || && + - - + * / / * % * & | | & ++ -- -- ++ -= =", swap, " ")
    for (i = 1; i in swap; i += 2) other[swap[i]] = swap[i + 1]
    other["+="] = "="
    other["true"] = "false"
    other["false"] = "true"
    # As brackets of templates, signs and marks of references these have no blanks around them.
    set(binary, "& && | * / % + -")
    set(keyword, "if else for while do return break continue switch case throw delete")
    set(declaring, "const constexpr auto static using struct class enum typedef extern inline")
    set(beforeBody, ") ] else do try const override noexcept mutable")
}

function set(target, list, names, i) {
    split(list, names, " ")
    for (i in names) target[names[i]] = 1
}

{ source = source $0 "\n" }

END {
    readTokens()
    matchBrackets()
    changeWords()
    changeNames()
    for (i = 1; i <= count; ++i) if (isBody[i]) changeStatements(i)
    findUnits()
    if (apply) printf "%s", changedText(apply, 1, length(source))
    else if (together) printTogether()
    else printChanges()
}

# The tokens: what they are, where they begin, whether blanks stand before them.

function readTokens(    place, rest, size, blank, atStart) {
    place = 1
    rest = source
    atStart = 1
    while (rest != "") {
        blank = match(rest, /^[ \n]+/) ? RLENGTH : 0
        if (blank) {
            if (substr(rest, 1, blank) ~ /\n/) atStart = 1
            place += blank
            rest = substr(rest, blank + 1)
            continue
        }
        if (rest ~ /^\/\// || (atStart && rest ~ /^#/)) {
            match(rest, /^([^\n\\]|\\\n|\\.)*/)
            size = RLENGTH
        } else if (rest ~ /^\/\*/) {
            size = index(rest, "*/") + 1
        } else {
            size = tokenSize(rest)
            token[++count] = substr(rest, 1, size)
            begin[count] = place
        }
        atStart = 0
        place += size
        rest = substr(rest, size + 1)
    }
}

function tokenSize(rest,    three) {
    if (match(rest, /^R"\(/)) return index(rest, ")\"") + 1
    if (match(rest, /^"([^"\\]|\\.)*"/)) return RLENGTH
    if (match(rest, /^'([^'\\]|\\.)*'/)) return RLENGTH
    if (match(rest, /^[0-9]([0-9A-Za-z_.']|[eE][+-][0-9])*/)) return RLENGTH
    if (match(rest, /^[A-Za-z_][A-Za-z0-9_]*/)) return RLENGTH
    three = substr(rest, 1, 3)
    if (three == "<=>" || three == "...") return 3
    if (match(rest, /^(::|->|==|!=|<=|>=|&&|\|\||\+\+|--|\+=|-=|<<)/)) return RLENGTH
    return 1
}

function finish(i) { return begin[i] + length(token[i]) - 1 }
function text(from, to) { return substr(source, from, to - from + 1) }
function isBlank(place) { return substr(source, place, 1) ~ /[ \n]/ }
function standsAlone(i) { return isBlank(begin[i] - 1) && isBlank(finish(i) + 1) }
function isWord(i) { return token[i] ~ /^[A-Za-z_]/ && !(token[i] in keyword) }

# Which bracket closes which, and which braces hold statements.

function matchBrackets(    i, depth, opening) {
    for (i = 1; i <= count; ++i) {
        if (token[i] ~ /^[({[]$/) {
            opening[++depth] = i
            isBody[i] = token[i] == "{" && beginsBody(i, opening[depth - 1])
        } else if (token[i] ~ /^[]})]$/) {
            partner[opening[depth]] = i
            partner[i] = opening[depth--]
        }
    }
}

function beginsBody(i, around,    before) {
    before = token[i - 1]
    if (before in beforeBody) return 1
    if (before ~ /^[;{}]$/) return around != "" && isBody[around]
    # A lambda that says what it returns.
    for (--i; i > 0 && token[i] ~ /^([A-Za-z_0-9]+|::|<|>|[*&,])$/; --i) {}
    return token[i] == "->" && token[i - 1] ~ /^(\)|mutable|noexcept)$/
}

# The changes.

function change(from, to, replacement, what,    key) {
    ++changes
    changeFrom[changes] = from
    changeTo[changes] = to
    changeText[changes] = replacement
    changeWhat[changes] = what
}

function replace(i, replacement) {
    change(begin[i], finish(i), replacement, quoted(token[i]) " becomes " quoted(replacement))
}

function quoted(words) { return "`" words "`" }

function changeWords(    i, word) {
    for (i = 1; i <= count; ++i) {
        word = token[i]
        if (word ~ /^[0-9]/) {
            # A pure virtual function's 0 is no number.
            if (!(token[i - 1] == "=" && token[i - 2] ~ /^(\)|const|noexcept)$/)) {
                replace(i, "(" word " + 1)")
            }
        } else if (word ~ /^(R"\(|")/) {
            if (token[i - 1] != "extern") {
                replace(i, word ~ /^R/ ? "R\"(~" substr(word, 4) : "\"~" substr(word, 2))
            }
        } else if (word ~ /^'/) {
            replace(i, word == "'~'" ? "'-'" : "'~'")
        } else if (word == "!") {
            change(begin[i], begin[i], "", "`!` left out")
        } else if (word == "-" && token[i + 1] ~ /^[0-9]/ && !standsAlone(i)) {
            change(begin[i], begin[i], "", "`-` left out")
        } else if (word == "<" || word == "<=") {
            if (standsAlone(i)) { replace(i, word == "<" ? "<=" : "<"); replace(i, ">") }
        } else if (word == ">" || word == ">=") {
            if (standsAlone(i)) { replace(i, word == ">" ? ">=" : ">"); replace(i, "<") }
        } else if (word in other && token[i - 1] != "operator") {
            if (!(word in binary) || standsAlone(i)) replace(i, other[word])
        } else if (word == "?") {
            change(begin[i], begin[i], "|| true ?", "condition before `?` is true")
            change(begin[i], begin[i], "&& false ?", "condition before `?` is false")
        } else if (word ~ /^(if|while|for)$/ && token[i + 1] == "(") {
            changeCondition(i)
        }
    }
}

function changeCondition(i,    opening, closing, from, to, at, semicolons, declares) {
    opening = i + 1
    closing = partner[opening]
    from = opening + 1
    to = closing - 1
    for (at = opening + 1; at < closing; ++at) {
        if (at in partner && partner[at] > at) {
            at = partner[at]
        } else if (token[at] == ";") {
            ++semicolons
            if (token[i] == "for" && semicolons == 2) to = at - 1
            else { from = at + 1; declares = 0 }
        } else if (token[at] == "=") {
            declares = 1
        }
    }
    # A loop over a range has no condition.
    if (token[i] == "for" && semicolons < 2) return
    if (token[i] != "for" && declares) {
        change(begin[closing], begin[closing], "; false)", "condition is false")
        if (token[i] == "if") change(begin[closing], begin[closing], "; true)", "condition is true")
        return
    }
    change(begin[from], finish(to), "false", "condition is false")
    # Loops without an end prove little and take long.
    if (token[i] == "if") change(begin[from], finish(to), "true", "condition is true")
}

# Constants with names: in the place of one stands the next of its kind that the source knows.

function changeNames(    i, kind) {
    for (i = 1; i <= count; ++i) {
        kind = kindOfName(i)
        if (kind != "" && !((kind, token[i]) in known)) {
            known[kind, token[i]] = ++sizeOf[kind]
            name[kind, sizeOf[kind]] = token[i]
        }
    }
    for (i = 1; i <= count; ++i) {
        kind = kindOfName(i)
        if (kind != "" && sizeOf[kind] > 1) {
            replace(i, name[kind, known[kind, token[i]] % sizeOf[kind] + 1])
        }
    }
}

function kindOfName(i) {
    if (token[i + 1] ~ /^(\(|<|::|\{)$/) return ""
    if (token[i] ~ /^k[A-Z]/) return "k"
    if (token[i] ~ /^[A-Z].*Key$/) return "Key"
    if (token[i - 1] == "::" && token[i] ~ /^[_a-z]/ && token[i - 2] ~ /^([A-Z]|log_messages)/) {
        return token[i - 2]
    }
    return ""
}

# The statements of the body that `opening` begins: each left out, each exchanged with the next one,
# but for two that set different properties of one object, whose order is nobody's business.

function changeStatements(opening,    closing, from, to, kind, lastFrom, lastTo, lastKind) {
    closing = partner[opening]
    lastKind = "none"
    unit(finish(opening) + 1, begin[closing] - 1)
    for (from = opening + 1; from < closing; from = to + 1) {
        to = statementEnd(from, closing)
        kind = statementKind(from, to)
        if (kind != "declaration") unit(begin[from], finish(to))
        if (kind == "call" || (kind == "jump" && to - from == 1)) {
            change(begin[from], finish(to), "", "statement left out")
        }
        if (returnsMore(from, to) && !deducesReturn(opening)) {
            change(begin[from], finish(to), "return {};", "nothing returned")
        }
        if (kind ~ /call|block/ && lastKind ~ /call|block/ &&
            !areApart(lastFrom, lastTo, from, to)) {
            change(begin[lastFrom], finish(to),
                text(begin[from], finish(to)) text(finish(lastTo) + 1, begin[from] - 1) \
                text(begin[lastFrom], finish(lastTo)), "exchanged with the next statement")
        }
        lastFrom = from
        lastTo = to
        lastKind = kind
    }
}

# Whether the statement returns something else than what stands for nothing.
function returnsMore(from, to) {
    return token[from] == "return" && to - from > 1 &&
        text(begin[from + 1], finish(to - 1)) !~ /^(false|true|0|nullptr|std::nullopt|{})$/
}

# Whether the body is that of a lambda that does not say what it returns.
function deducesReturn(opening) {
    for (--opening; token[opening] ~ /^(mutable|noexcept|const)$/; --opening) {}
    if (token[opening] == ")") opening = partner[opening] - 1
    return token[opening] == "]"
}

# Whether the order of two statements is nobody's business: each only sets a property, not the same
# one and of no object that the other names; or one only makes an object that the other does not name.
function areApart(from, to, second, end,    here, there) {
    if (makes(from)) return !mentions(second, end, token[from])
    if (makes(second)) return !mentions(from, to, token[second])
    here = setter(from, to)
    there = setter(second, end)
    if (!here || !there) return 0
    if (text(begin[from], begin[here] - 1) == text(begin[second], begin[there] - 1)) {
        return token[here] != token[there] ||
            (token[here] ~ /ForKey$/ && token[to - 2] != token[end - 2])
    }
    return !mentions(second, end, token[from]) && !mentions(from, to, token[second])
}

# Whether the statement makes an object, and nothing else.
function makes(i) {
    return token[i + 1] == "=" &&
        (token[i + 2] == "std" && token[i + 4] == "make_shared" ||
            token[i + 2] ~ /^[A-Z]/ && token[i + 3] == "::")
}

function mentions(from, to, word) {
    for (; from <= to; ++from) if (token[from] == word) return 1
    return 0
}

# The name of the property that the statement sets: `view->setText(...)`, `style.spacing = 8`, or, of
# this object and to what is not asked of anybody, `_syncing = true`; 0 where it does something else.
function setter(from, to,    i) {
    for (i = from; isWord(i); i += 2) {
        if (token[i + 1] == "(" && token[i + 2] == ")") i += 2
        if (token[i + 1] !~ /^(->|\.)$/) break
    }
    if (token[i + 1] == "=") return i > from || !mentions(from, to, "(") ? i : 0
    return i > from && token[i] ~ /^set[A-Z]/ && token[i + 1] == "(" ? i : 0
}

function statementEnd(from, closing,    i) {
    if (token[from] ~ /^(if|for|while|switch)$/) {
        i = partner[from + 1] + 1
        if (token[i] != "{") return statementEnd(i, closing)
        i = partner[i]
        return token[i + 1] == "else" ? statementEnd(i + 2, closing) : i
    }
    if (token[from] == "{") return partner[from]
    for (i = from; i < closing && token[i] != ";"; ++i) {
        if (i in partner && partner[i] > i) i = partner[i]
    }
    return i
}

function statementKind(from, to) {
    if (token[from] ~ /^(if|for|while|switch|\{)$/) return "block"
    if (token[from] ~ /^(return|break|continue|throw)$/) return "jump"
    return isDeclaration(from, to) ? "declaration" : "call"
}

# Declarations begin with a word that says so, or with a type and a name.
function isDeclaration(from, to,    i, depth) {
    if (token[from] in declaring) return 1
    for (i = from; isWord(i) && token[i + 1] == "::"; i += 2) {}
    if (!isWord(i)) return 0
    if (token[++i] == "<" && !standsAlone(i)) {
        for (depth = 1; depth > 0 && ++i < to;) depth += (token[i] == "<") - (token[i] == ">")
        ++i
    }
    if (token[i] == "::") return isDeclaration(i + 1, to)
    for (; token[i] ~ /^([*&]|const)$/; ++i) {}
    return isWord(i) && token[i + 1] ~ /^[=;({[]$/
}

# Units are what can stand in one branch of a condition as well as in another: statements that
# declare nothing, and all that is between the braces of a body.

function unit(from, to) {
    if (to < from) return
    ++units
    unitFrom[units] = from
    unitTo[units] = to
}

function innermost(from, to, except,    u, best) {
    for (u = 1; u <= units; ++u) {
        if (u != except && unitFrom[u] <= from && unitTo[u] >= to &&
            (!best || unitTo[u] - unitFrom[u] < unitTo[best] - unitFrom[best])) best = u
    }
    return best + 0
}

function findUnits(    i) {
    for (i = 1; i <= changes; ++i) changeUnit[i] = innermost(changeFrom[i], changeTo[i], 0)
    for (i = 1; i <= units; ++i) unitAround[i] = innermost(unitFrom[i], unitTo[i], i)
}

# The text between `from` and `to` with one change in it.
function changedText(number, from, to) {
    return text(from, changeFrom[number] - 1) changeText[number] text(changeTo[number] + 1, to)
}

function printTogether(    i, names) {
    split(without, names, " ")
    for (i in names) isLeftOut[names[i]] = 1
    printf "%s", "extern \"C\" char* getenv(const char*) noexcept;\n" \
        "extern \"C\" int atoi(const char*) noexcept;\n" \
        "static bool mutant(int number) {\n" \
        "    static const char* const chosen = getenv(\"MUTANT\");\n" \
        "    return chosen != nullptr && atoi(chosen) == number;\n}\n"
    printf "%s", withUnits(0, 1, length(source))
}

# The text between `from` and `to`, with the units right below `around` in all their forms.
function withUnits(around, from, to,    u, following, result) {
    for (;;) {
        following = 0
        for (u = 1; u <= units; ++u) {
            if (unitAround[u] == around && unitFrom[u] >= from &&
                (!following || unitFrom[u] < unitFrom[following])) following = u
        }
        if (!following) return result text(from, to)
        result = result text(from, unitFrom[following] - 1) unitForms(following)
        from = unitTo[following] + 1
    }
}

function unitForms(u,    i, result, plain) {
    plain = withUnits(u, unitFrom[u], unitTo[u])
    for (i = 1; i <= changes; ++i) {
        if (changeUnit[i] == u && !(i in isLeftOut)) {
            result = result "if (mutant(" i ")) {\n#line " i * 1000 " \"mutant\"\n" \
                changedText(i, unitFrom[u], unitTo[u]) "\n} else "
        }
    }
    return result == "" ? plain : result "{\n#line 1 \"source\"\n" plain "\n}\n"
}

# The same change of lines that read the same has a number from the second on, so that each has a
# name of its own, wherever in the source it stands.

function printChanges(    i, j, nth) {
    linesOf()
    for (i = 1; i <= changes; ++i) {
        nth = 1
        for (j = 1; j <= changes; ++j) {
            nth += changeWhat[j] == changeWhat[i] && changeFrom[j] < changeFrom[i] &&
                lineText[changeLine[j]] == lineText[changeLine[i]]
        }
        print i "\t" changeLine[i] "\t" changeWhat[i] (nth > 1 ? ", number " nth : "") "\t" \
            lineText[changeLine[i]] "\t" (changeUnit[i] ? "together" : "alone")
    }
}

# Which line each change begins in, and what each line reads without its indentation.
function linesOf(    i, line, lines, at) {
    lines = split(source, lineText, "\n")
    at = 1
    for (line = 1; line <= lines; ++line) {
        for (i = 1; i <= changes; ++i) if (changeFrom[i] >= at) changeLine[i] = line
        at += length(lineText[line]) + 1
        sub(/^ +/, "", lineText[line])
    }
}
