# The rules of check-layers: reads every source and header of the tree, named from its root.


BEGIN {
    longest = 400

    # Layer and the layers that it may include beside itself.
    allow("platform", "")
    allow("support", "platform")
    allow("footer", "support platform")
    allow("upgrade", "support platform")
    allow("pane", "upgrade footer support platform")
    allow("device", "platform")
    allow("host/core", "device platform")
    allow("host/cli", "host/core device platform")
    allow("host/qt", "host/core device platform")
    allow("tools", "device platform")
    allow("samples", "platform")
    everything = "platform support footer upgrade pane device host/core host/cli host/qt tools"
    allow("tests", everything)
    allow("bench", everything)

    # Library, by the start of its headers, and the layers that may use it.
    library("Q[A-Z]", "host/qt")
    library("sqlite|SQLiteCpp/", "device")
    library("unicode/", "device host/cli")
    library("archive", "device tools")
    library("png[.]h", "device")
    library("spdlog/|fmt/", "device")
    library("systemd/|sdbus-c[+][+]/", "device")
    library("nlohmann/", "device host/core host/cli host/qt tools")
    library("CLI/", "host/cli host/qt tools")
    library("histedit|editline/", "host/cli")

    # These need nothing but the standard library and POSIX.
    split("platform support footer upgrade pane samples", names, " ")
    for (i in names) bare[names[i]] = 1
    posix = "^(syslog|unistd|fcntl|dlfcn|spawn|signal|pthread|poll|time|errno|sys/[a-z]+)[.]h$"

    # What the services of a device stand on; every other folder of device/ is of services, which
    # do not know each other: the wiring alone knows them all.
    split("json files description system", names, " ")
    for (i in names) foundation[names[i]] = 1
    wiring = "device/DevicePlatform.cpp"
}

function allow(layer, others) {
    allowed[layer] = others
    reach[layer, layer] = 1
    count = split(others, other, " ")
    for (i = 1; i <= count; ++i) reach[layer, other[i]] = 1
}

function library(start, layers) {
    starts[++libraries] = "^(" start ")"
    users[libraries] = layers
}

function fault(why) {
    print file ":" FNR ": " why
    faults = 1
}

function layerOf(path, parts) {
    if (split(path, parts, "/") < 2) return ""
    return parts[1] == "host" ? parts[1] "/" parts[2] : parts[1]
}

# The folder of services of device/ that a path lies in; empty for all else.
function serviceFolder(path, parts) {
    if (split(path, parts, "/") < 3 || parts[1] != "device" || parts[2] in foundation) return ""
    return parts[2]
}

function orNothing(list) { return list == "" ? "nothing else" : list }

function checkLayer(target, to) {
    to = layerOf(target)
    if (!(to in allowed)) {
        fault("includes \"" target "\", which is no place of the project; headers are named from the root")
    } else if (!((layer, to) in reach)) {
        fault("includes \"" target "\"; beside itself " layer " may include " orNothing(allowed[layer]))
    }
}

function checkServices(target, to) {
    to = serviceFolder(target)
    if (layer != "device" || to == "" || file == wiring) return
    if (services != "" && services != to) {
        fault("includes \"" target "\" beside device/" services "; only " wiring " may include several services")
    } else if (services == "") {
        services = to
    }
}

function checkLibrary(header, i, found, names, count, j) {
    for (i = 1; i <= libraries; ++i) {
        if (header !~ starts[i] || layer == "tests" || layer == "bench") continue
        found = 0
        count = split(users[i], names, " ")
        for (j = 1; j <= count; ++j) if (names[j] == layer) found = 1
        if (!found) fault("includes <" header ">, which may stand in " users[i] " only")
        return
    }
    if (layer in bare && header ~ /[.\/]/ && header !~ posix) {
        fault("includes <" header ">; " layer " may use the standard library and POSIX only")
    }
}

FNR == 1 {
    file = substr(FILENAME, 3)
    files[file] = 1
    layer = layerOf(file)
    services = serviceFolder(file)
    if (!(layer in allowed)) fault("is in no layer of the project")
}

FNR == longest + 1 { fault("is longer than " longest " lines") }

/^[[:space:]]*#[[:space:]]*include[[:space:]]*"/ {
    split($0, pieces, "\"")
    checkLayer(pieces[2])
    checkServices(pieces[2])
    edge[file, ++edges[file]] = pieces[2]
    place[file, edges[file]] = FNR
}

/^[[:space:]]*#[[:space:]]*include[[:space:]]*</ {
    split($0, pieces, /[<>]/)
    checkLibrary(pieces[2])
}

# Whoever searches a log knows every line that the page can write.
layer ~ /^(footer|upgrade|pane)$/ && /systemLog *(->|[.])|LogMessage( +[A-Za-z]+)? *[{]/ {
    fault("writes a line of its own; the page's lines stand in support/LogMessages.h")
}

# Follows the includes of one file; one that leads back to a file under way closes a circle.
function follow(from, path, i, to) {
    state[from] = "under way"
    for (i = 1; i <= edges[from]; ++i) {
        to = edge[from, i]
        if (state[to] == "under way") {
            print from ":" place[from, i] ": includes \"" to "\", which closes a circle: " path to
            faults = 1
        } else if (state[to] == "" && to in files) {
            follow(to, path to " > ")
        }
    }
    state[from] = "done"
}

END {
    for (name in files) if (state[name] == "") follow(name, name " > ")
    exit faults
}
