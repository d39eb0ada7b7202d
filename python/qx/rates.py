"""Sampling rates in comments and headers: a word for a rate or an interval, a number, and a unit.

Other numbers of hertz are ignored, since they may be a corner frequency or a tone. Prefixes and units are
case-sensitive; "mHz" and "MHz" go by a table. An ambiguous number keeps both readings (the rules are in
docs/recordings.md).
"""

import dataclasses
import re

SECONDS_OF_NAMES = {
    1.0: "s sec secs second seconds sekunde sekunden seconde secondes segundo segundos secondi",
    1e-3: "ms msec msecs millis milli millisecond milliseconds millisekunde millisekunden milliseconde "
          "millisecondes",
    1e-6: "us µs μs usec µsec micros microsecond microseconds mikrosekunde mikrosekunden microseconde "
          "microsecondes",
    1e-9: "ns nsec nanosecond nanoseconds nanosekunden nanosecondes",
    1e-12: "ps picosecond picoseconds",
    60.0: "min mins minute minutes minuten minutos",
    3600.0: "h hr hrs hour hours std stunde stunden heure heures hora horas",
    86400.0: "d day days tag tage jour jours dia dias"}
SECONDS = {name: scale for scale, names in SECONDS_OF_NAMES.items() for name in names.split()}
PREFIXES = {"": 1.0, "k": 1e3, "K": 1e3, "M": 1e6, "G": 1e9, "m": 1e-3, "µ": 1e-6, "μ": 1e-6, "u": 1e-6}
HERTZ_WORDS = {"hertz": 1.0, "kilohertz": 1e3, "megahertz": 1e6, "gigahertz": 1e9, "millihertz": 1e-3}

# A number: groups between blanks, or marks that decide() interprets, and an exponent.
BLANKS = " \u00a0\u2009\u202f"
NUMBER = (rf"(?:\d{{1,3}}(?:[{BLANKS}]\d{{3}})+(?!\d)(?:[.,]\d+)?|\d+(?:[.,'’]\d+)*|[.,]\d+)"
          r"(?:[eE][-+]?\d+|\s?[x×*·]\s?10\^?[-+]?\d+)?(?![\d'’])")
TIME = "(?:" + "|".join(sorted((re.escape(name) for name in SECONDS), key=len, reverse=True)) + r")\b\.?"
SAMPLES = (r"(?:samples?|smpl?s?|points?|pts|scans?|readings?|measurements?|values?|(?:mess|abtast)?werte|"
           r"abtastungen|messungen|times|[ée]chantillons?|[ée]ch\.?|mesures?|points? de mesure|muestras|campioni)")
PER = r"\s*(?:/|\bper\b|\bpro\b|\bpar\b|\bpor\b|\bal\b|\bje\b)\s*"
COUNTED = (rf"(?P<kilo>[kKMG]?)(?:S|Sa|SA)/(?P<t1>(?i:{TIME}))|(?P<sps>[kKMGm]?)(?:sps|SPS|Sps|fps|FPS)\b|"
           rf"(?i:{SAMPLES}{PER}(?P<t2>{TIME}))")
UNIT = (rf"{COUNTED}|(?P<hertz>[kKMGmuµμ]?)(?:Hz|hz|HZ)\b|(?P<word>(?i:{'|'.join(HERTZ_WORDS)}))\b|"
        rf"(?i:(?:1\s?{PER}|{PER})(?P<t3>{TIME})|frames?{PER}(?P<t5>{TIME}))|"
        rf"(?P<t4>(?i:s|sec|min|h|ms))(?:\^?-1|⁻¹)|s/s\b|"
        rf"(?P<time>(?i:{TIME}))|(?P<bare>[kM])\b")
END = r"(?![\w^*²³⁻°%]|\s*/\s*[A-Za-z])"

STRONG_RATE = (r"sampl(?:e|es|ing|er)?[ _-]*(?:rate|frequency|freq\b\.?|frequenz)|"
               r"abtast[ -]*(?:rate|frequenz)|"
               r"(?:fr[ée]quence|taux|cadence|fr[ée]q\.?)\s+d(?:['’]|e\s+)\s*(?:[ée]chantillonnage|acquisition)|"
               r"frecuencia de muestreo|frequenza di campionamento|acquisition[ _-]*(?:rate|frequency)|"
               r"(?:sampled|sampling) (?:at|with)|digiti[sz]ed at|abgetastet mit|[ée]chantillonn[ée]e? [àa]|"
               r"(?-i:sfreq|srate|sps|SPS|[fF]_?s)")
WEAK_RATE = (r"(?:scan|frame|data|log(?:ging)?|recording|measur(?:ement|ing))[ _-]*(?:rate|frequency)|"
             r"(?:mess|aufzeichnungs|log)(?:rate|frequenz)|acquired at|recorded at|aufgezeichnet mit|"
             r"sampling|abtastung|[ée]chantillonnage|(?-i:Fe|FS|sr|SR|ODR)")
STRONG_INTERVAL = (
    r"(?:sampl(?:e|es|ing)|scan|log(?:ging)?|recording|measur(?:ement|ing)|acquisition)[ _-]*(?:interval|period)|"
    r"time[ _-]*(?:step|increment)|x[ _-]?incr(?:ement)?|delta[ _-]?t|(?-i:[Δ∆]t|dt|DT)|"
    r"(?:abtast|mess|log|speicher|aufzeichnungs)intervall|abtast(?:zeit|periode|schritt)|zeitschritt|"
    r"(?:p[ée]riode|pas|intervalle)\s+d(?:['’]|e\s+)\s*(?:[ée]chantillonnage|acquisition|temps|mesure)|"
    r"sampl(?:ed?|ing) every|one sample every")
WEAK_INTERVAL = r"interval|intervall|intervalle|(?-i:T_?s|Te|T_?a)"
CONTINENTAL = re.compile(r"abtast|mess|frequenz|aufzeichn|zeit|speicher|abgetastet|pro |je |[ée]chantillon|"
                         r"fr[ée]quence|cadence|p[ée]riode|\bpas\b|\bpar\b|muestr|campion|werte|intervall",
                         re.IGNORECASE)
SEPARATION = (r"(?:[\s:=≈~;,\"@]|\b(?:is|was|ist|est|of|von|at|à|bei|set to|about|approx|ca|env|environ|etwa)"
              r"\b\.?){1,8}?")
KEYED = re.compile(
    rf"(?i:(?<![\w])(?:(?P<strong>{STRONG_RATE})|(?P<interval>{STRONG_INTERVAL})|(?P<weak>{WEAK_RATE})|"
    rf"(?P<weak_interval>{WEAK_INTERVAL})))(?:\s*/\s*(?P<divisor>\d+(?:\.\d+)?))?"
    rf"(?:\s*[\[(]\s*(?P<in1>[^\])]*?)\s*[\])]|\s+in\s+(?P<in2>[^\s:=]+)|[_ ](?P<in3>[A-Za-zµμ/]+))?"
    rf"(?:\s+(?:T_?s?|f_?s|dt)\s?(?==))?(?i:{SEPARATION})"
    rf"(?:(?P<clock>\d+:\d\d:\d\d(?:[.,]\d+)?)|(?P<number>{NUMBER}))(?:\s*(?:±|\+/?-)\s*[\d.,]+)?"
    rf"(?P<range>\s*(?:-|–|\bto\b|\bbis\b|\.\.+)\s*\d[\d.,]*)?")
COUNTED_ALONE = re.compile(rf"(?<![\d.,'’])(?P<number>{NUMBER})\s*[\[(]?(?:{COUNTED}){END}")
AFTER = re.compile(rf"\s*[\[(\"]?\s*(?:{UNIT}){END}")
IN_NEXT_CELL = re.compile(rf"\s*[,;]\s*(?:{UNIT}){END}")
PROSE = re.compile(r"\s*(?:$|[^\w\s°%µΩ/^*]|(?:and|with|for|at|from|on|und|mit|für|et|avec|pour|nominal)\b)|"
                   r"\s+\w+\s?[:=]")
MORE_CELLS = re.compile(r"(?:\s*;\s*[\d.,]+(?=\s*(?:;|$)))+")
REVERSED = re.compile(rf"(?<![\d.,'’])(?P<number>{NUMBER})\s?(?:{UNIT}){END}[\s-]*"
                      rf"(?i:sampl(?:e|ing)\b(?:[ _-]*(?:rate|frequency|interval|period)\b)?|"
                      rf"abtast(?:rate|frequenz|intervall)|(?:{STRONG_RATE}|{STRONG_INTERVAL})\b)")
PERHAPS = re.compile(rf"(?i:\b(?:rate|frequency|frequenz|fr[ée]quence)\s*[:=]\s*){NUMBER}(?:\s?[kKMGm]?Hz)?")
NOT_THE_RATE = re.compile(r"(?:max(?:imum|imal\w*|\.)?|highest|greatest|min(?:imum|imal\w*|\.)?|"
                          r"original|former|old|up to|[/*×·])\s*$", re.IGNORECASE)
FACTOR = re.compile(r"[\d.]+\s*$")  # before a symbol
QUOTIENT = re.compile(r"/\s?(\d+(?:\.\d+)?)")
SEVERAL_A_LINE = re.compile(rf"(?<![\d.])(\d+)\s+{SAMPLES}\s*(?:/|per|in each|on each|pro|par)\s*"
                            r"(?:line|row|zeile|ligne)", re.IGNORECASE)


@dataclasses.dataclass
class Habit:
    """What is known about the marks in the numbers of a file."""
    decimal: str = ""  # the decimal mark that values show, "," or ".", or empty
    told: str = ""  # the decimal mark given by an option
    thousands: bool = False  # whether an option says that single marks group thousands


@dataclasses.dataclass
class Named:
    """A rate that a text names."""
    words: str
    readings: tuple  # samples per second: several if the text is ambiguous, empty if it is not a number
    assumed: str = ""  # the assumed unit, if the text has none


def seconds_of(unit):
    """The seconds of a unit of time, or None."""
    return SECONDS.get(unit.strip(" .").lower())


def readings_of(text, habit, small=False, continental=False):
    """The numbers that a text may mean: one; two if a mark may either group thousands or be a decimal mark; none
    if its groups are invalid. `small` says that thousands are unlikely, as with kilohertz; `continental` that
    the words are from a language with decimal commas."""
    mantissa, exponent = text, ""
    if match := re.search(r"(?:[eE]|\s?[x×*·]\s?10\^?)([-+]?\d+)$", text):
        mantissa, exponent = text[:match.start()], match[1]
    scale = float(f"1e{exponent or 0}")  # may be 0 or infinite
    mantissa = re.sub(rf"[{BLANKS}’]", "'", mantissa.strip())
    marks = [mark for mark in mantissa if mark in ".,'"]
    if not marks:
        return (float(mantissa) * scale,)
    last, kinds = marks[-1], set(marks)
    whole, _, fraction = mantissa.rpartition(last)
    if len(kinds) == 1 and (len(marks) > 1 or last == "'"):
        return (float(mantissa.replace(last, "")) * scale,) if _grouped(mantissa, last) else ()
    if len(kinds) == 2 and last != "'" and marks.count(last) == 1:
        group = (kinds - {last}).pop()
        return (float(whole.replace(group, "") + "." + fraction) * scale,) if _grouped(whole, group) else ()
    if len(kinds) > 1:
        return ()
    small_one, large_one = float(f"{whole or '0'}.{fraction}") * scale, float((whole or "0") + fraction) * scale
    if exponent.strip("+-0") or not _grouped(mantissa, last):
        return (small_one,)
    if habit.thousands and habit.told != last:
        return (large_one,)
    if habit.told:
        return (small_one,) if habit.told == last else (large_one,)
    return _by_habit(last, large_one, small_one, habit, small, continental)


def _is_measured(value):
    """Whether a number can be a rate or an interval, and its reciprocal is finite."""
    return 1e-300 < value < 1e300


def _grouped(text, mark):
    return bool(re.fullmatch(rf"[1-9]\d{{0,2}}(?:{re.escape(mark)}\d{{3}})+", text))


def _by_habit(mark, large, small_one, habit, small, continental):
    """The readings of a number with one mark before three digits."""
    commas = continental or habit.decimal == ","
    if small:
        return (small_one,) if (mark == ",") == commas else (large, small_one)
    if mark == "," and not commas or mark == "." and commas and habit.decimal != ".":
        return (large,)
    if mark == "," and continental and habit.decimal == ",":
        return (small_one,)
    return large, small_one


def _scales(match):
    """How the unit of a match converts the number x: x * scale, or 1 / (x * scale) for a unit of time."""
    groups = match.groupdict()
    for name in ("t1", "t2", "t3", "t4", "t5"):
        if groups.get(name):
            return [PREFIXES[groups.get("kilo") or ""] / seconds_of(groups[name])], False
    if groups.get("time"):
        return [seconds_of(groups["time"])], True
    if groups.get("word"):
        return [HERTZ_WORDS[groups["word"].lower()]], False
    prefix = groups.get("hertz") or groups.get("sps") or groups.get("bare") or ""
    if prefix == "m" and not match[0].rstrip().endswith("Hz"):
        return [1e-3, 1e6], False  # in lower case: milli or mega
    return [PREFIXES[prefix]], False


def _unit_in(text):
    match = re.fullmatch(rf"(?:{UNIT})", text.strip().replace("_", "/")) if text else None
    return match if match and not match.groupdict().get("bare") else None


def named_in(text, habit=Habit()):
    """The rates that a text names (Named), and remarks on other text that looks like one."""
    found, remarks, taken = [], [], []
    for match in KEYED.finditer(text):
        taken.append(match.span())
        named, remark = _keyed(text, match, habit)
        found += [named] if named else []
        remarks += [remark] if remark else []
    for match in [*REVERSED.finditer(text), *COUNTED_ALONE.finditer(text)]:
        inside = any(start < match.end() and match.start() < end for start, end in taken)
        if not inside and not NOT_THE_RATE.search(text[:match.start()]):
            taken.append(match.span())
            scales, inverse = _scales(match)
            numbers = readings_of(match["number"], habit, inverse or max(scales) > 1,
                                  bool(CONTINENTAL.search(match[0])))
            found.append(Named(match[0].strip(), tuple(1 / (n * s) if inverse else n * s for n in numbers
                                                       if _is_measured(n) for s in scales)))
    if not found and not taken and (perhaps := PERHAPS.search(text)):
        remarks.append(f"'{perhaps[0]}' may be the sampling rate or not")
    return [one for one in found if not one.readings or min(one.readings) > 0], remarks


def _of_clock(match, words):
    """The rate of an interval of hours, minutes and seconds, or None."""
    hours, minutes, seconds = match["clock"].replace(",", ".").split(":")
    length = 3600 * int(hours) + 60 * int(minutes) + float(seconds)
    return Named(words, (1 / length,)) if length > 0 and (match["interval"] or match["weak_interval"]) else None


def _keyed(text, match, habit):
    """The rate of a match of KEYED, or None; and a remark on why there is none, or an empty text."""
    before = text[:match.start()]
    if NOT_THE_RATE.search(before) or text[match.start():match.end()].lower().startswith(("fs", "f_s", "fe")) and (
            FACTOR.search(before)):
        return None, ""
    tail = text[match.end():]
    inside = next((match[name] for name in ("in1", "in2", "in3") if match[name]), "")
    inside = "" if re.fullmatch(r"[fF]_?s|T_?s?|dt", inside) else inside
    unit, after = _unit_in(inside), AFTER.match(tail)
    over = QUOTIENT.match(tail) if match["number"] else None
    if over:  # 1/60 Hz
        tail, after = tail[over.end():], AFTER.match(tail[over.end():])
    next_cell = tail.lstrip()[:1]
    if next_cell in (",", ";") and text[:match.start("number")].rstrip().endswith(next_cell) and match["number"]:
        after = after or IN_NEXT_CELL.match(tail)
        more = MORE_CELLS.match(tail)
        if more and set(re.findall(r"[\d.,]+", more[0])) != {match["number"]}:
            return Named(text[match.start():match.end() + more.end()], ()), ""
    if inside and not unit and (match["in3"] or not after):
        return None, ""
    end = match.end() + (over.end() if over else 0)
    words = text[match.start():end + (after.end() if after and not match["clock"] else 0)].strip(" \"")
    words += ")" * (words.count("(") - words.count(")"))
    if match["range"]:
        return None, f"'{words}' is a range"
    if match["clock"]:
        return _of_clock(match, words), ""
    unit, assumed = after or unit, ""
    by_interval = bool(match["interval"] or match["weak_interval"])
    if not unit:
        if not PROSE.match(tail) or match["weak"] or match["weak_interval"]:
            full_scale = match["weak"] == "FS" and PROSE.match(tail)
            return None, f"'{words}' may be the full scale" if full_scale else ""
        scales, inverse, assumed = [1.0], by_interval, "seconds" if by_interval else "hertz"
    else:
        scales, inverse = _scales(unit)
        if unit.groupdict().get("bare") and by_interval:
            return None, ""
    if match["weak_interval"] and not inverse:
        return None, ""
    numbers = readings_of(match["number"], habit, inverse or max(scales) > 1, bool(CONTINENTAL.search(match[0])))
    numbers = [n / float(over[1]) for n in numbers] if over and float(over[1]) else numbers
    factor = float(match["divisor"] or 1)
    values = [n * s for n in numbers for s in scales]
    if factor <= 0 or not all(map(_is_measured, values)):
        return None, ""
    rates = tuple(factor / value if inverse else factor * value for value in values)
    return Named(words, rates, assumed), ""
