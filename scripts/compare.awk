# Compares decoded messages, one JSON object a line: awk -f compare.awk SENT GENERATED
#
# Shows the fields that differ with the rule that makes them differ; with -v summary=1 only those
# that no rule explains, and the total. Exit status 1 when there is such a field, or a message
# that did not come back.

BEGIN {
  kept_as_they_are = " message systemId utilizedMsgIndicator computationIndicator heightIndicator " \
    "horShiftIndicator vertShiftIndicator horInterpolationMethod vertInterpolationMethod " \
    "projectionType rectificationFlag "
  not_stored = " plateNumber horQualityIndicator vertQualityIndicator" \
               " horGridQualityIndicator vertGridQualityIndicator mjd "
}

{ sub(/\r$/, "") }

FNR == NR { sent[++count] = $0; next }

FNR <= count { compare(sent[FNR], $0); next }

{ unexplained("a message that was not sent: " $0) }

END {
  while (FNR < count) unexplained("did not come back: " sent[++FNR])
  if (summary) {
    printf "  %d messages, %d fields: %d the same, %d different by the rules above\n", count, all_fields,
           all_fields - all_differing, all_explained
  }
  exit failed
}

function compare(sent_line, generated_line,    i, name, total, differing, rows, rule) {
  total = parse(sent_line, fields, sent_value)
  parse(generated_line, ignored, generated_value)
  if (sent_value["message"] != generated_value["message"]) {
    unexplained(sent_value["message"] " came back as " generated_value["message"])
    return
  }
  for (i = 1; i <= total; i++) {
    name = fields[i]
    if (sent_value[name] == generated_value[name]) continue
    differing++
    rule = explain(name, sent_value[name], generated_value[name])
    if (rule == "") failed = 1
    else all_explained++
    if (rule == "" || !summary) rows = rows row(name, sent_value[name], generated_value[name], rule)
  }
  all_fields += total
  all_differing += differing
  if (!summary) {
    printf "  %s: %d of %d fields the same\n", sent_value["message"], total - differing, total
  }
  printf "%s", rows
}

# Of an array the first number that differs is shown.
function row(name, sent, generated, rule,    a, b, n, i, first, more) {
  if (sent ~ /^\[/) {
    n = numbers(sent, a)
    numbers(generated, b)
    for (i = n; i >= 1; i--) {
      if (a[i] == b[i]) continue
      more++
      first = i
    }
    name = name "[" first - 1 "]"
    sent = a[first]
    generated = b[first]
    if (more > 1) rule = rule ", so are " more - 1 " others"
  }
  return sprintf("    %-24s  %-18s  %-18s  %s\n", name, sent, generated,
                 rule == "" ? "NOT EXPECTED" : rule)
}

# Splits an object into its fields, which are plain values or arrays of numbers.
function parse(line, fields, values,    parts, total, i, colon, name) {
  sub(/^\{"/, "", line)
  sub(/\}$/, "", line)
  total = split(line, parts, /, ?"/)
  for (i = 1; i <= total; i++) {
    colon = index(parts[i], "\":")
    name = substr(parts[i], 1, colon - 1)
    fields[i] = name
    values[name] = substr(parts[i], colon + 2)
    gsub(/^ | $/, "", values[name])
  }
  return total
}

function explain(name, sent, generated) {
  if (index(not_stored, " " name " ") && generated == 0) return "not kept in the files"
  if (name == "targetName") return generated == cleaned(sent) ? "cleaned to be a file name" : ""
  if (name == "sourceName") return generated == family(sent) ? "reduced to its family" : ""
  if (index(kept_as_they_are, " " name " ")) return ""
  return truncated(sent, generated) ? "cut toward zero" : ""
}

# Each number the same, or one unit nearer to zero.
function truncated(sent, generated,    a, b, n, i) {
  n = numbers(sent, a)
  if (numbers(generated, b) != n) return 0
  for (i = 1; i <= n; i++) {
    if (a[i] !~ /^-?[0-9]+$/ || b[i] !~ /^-?[0-9]+$/) return 0
    if (a[i] - b[i] != 0 && a[i] - b[i] != (a[i] > 0 ? 1 : -1)) return 0
  }
  return 1
}

function numbers(text, into) {
  gsub(/[\[\] ]/, "", text)
  return split(text, into, ",")
}

# Letters and digits stay, all else becomes "_", and a run of one character becomes one.
function cleaned(name,    result, last, character, i) {
  name = substr(name, 2, length(name) - 2)
  gsub(/[^A-Za-z0-9]/, "_", name)
  for (i = 1; i <= length(name); i++) {
    character = substr(name, i, 1)
    if (character != last) result = result character
    last = character
  }
  return "\"" result "\""
}

function family(name) {
  if (name ~ /WGS84/) return "\"WGS84\""
  if (name ~ /ETRS89/) return "\"ETRS89\""
  if (name ~ /ITRF/) return "\"ITRF\""
  return name
}

function unexplained(text) {
  print "  " text
  failed = 1
}
