#!/usr/bin/env python3
"""Consistency check of the provider's class definitions.

Parses every class file under dmtf/ and vexlan/ and the class table
classes.tsv, and reports each fault as one line:

  - a file that does not parse (unbalanced braces, unknown CIM type, a file
    that does not declare exactly the class it is named after);
  - a superclass or a referenced class that no file declares;
  - a redeclared property or method without Override, with another type, or
    an Override that names nothing inherited;
  - a table row that disagrees with its class file (superclass, keys,
    association or indication kind, provider types), a class file without a
    row, a row out of load order, an interop class that needs a class the
    interop namespace lacks.

With --generated DIR it also checks the output of gen-registration.sh
against the table. Exit status 0 when all holds, 1 otherwise.
Only the Python standard library is used.
"""
import argparse
import os
import re
import sys

CIM_TYPES = {'boolean', 'string', 'char16', 'datetime', 'real32', 'real64',
             'uint8', 'uint16', 'uint32', 'uint64', 'sint8', 'sint16', 'sint32', 'sint64'}
PROVIDER_TYPES = {'instance', 'association', 'method', 'indication'}
MAIN_NAMESPACE = 'root/vexlan_cmpi'
NAMESPACE_TOKENS = {MAIN_NAMESPACE, 'interop'}
TABLE_FIELDS = ('class', 'namespaces', 'superclass', 'types', 'keys', 'mof')


class MofError(Exception):
    pass


_TOKEN = re.compile(r'''
    (?P<space>\s+)
  | (?P<linecomment>//[^\n]*)
  | (?P<blockcomment>/\*.*?\*/)
  | (?P<pragma>\#pragma[^\n]*)
  | (?P<string>"(?:\\.|[^"\\\n])*")
  | (?P<char>'(?:\\.|[^'\\\n])*')
  | (?P<number>[-+]?(?:0[xX][0-9a-fA-F]+|\d+(?:\.\d+)?(?:[eE][-+]?\d+)?))
  | (?P<ident>[A-Za-z_][A-Za-z0-9_]*)
  | (?P<punct>[\[\]{}(),;:=$])
''', re.X | re.S)


def tokenize(text):
    """List of (kind, text, line). Raises MofError on a character that no MOF token starts with."""
    out, pos, line = [], 0, 1
    while pos < len(text):
        m = _TOKEN.match(text, pos)
        if not m:
            raise MofError('line %d: unexpected character %r' % (line, text[pos]))
        kind = m.lastgroup
        if kind not in ('space', 'linecomment', 'blockcomment', 'pragma'):
            out.append((kind, m.group(), line))
        line += m.group().count('\n')
        pos = m.end()
    return out


class Feature:
    """A property, reference, method or parameter."""

    def __init__(self, name, ctype, ref, array, qualifiers, line):
        self.name = name
        self.type = ctype          # CIM type, or 'ref'
        self.ref = ref             # class of a reference
        self.array = array
        self.qualifiers = qualifiers
        self.line = line
        self.params = None         # list of Feature for a method

    @property
    def key(self):
        return qualifier_true(self.qualifiers, 'key')

    def signature(self):
        t = '%s REF' % self.ref.lower() if self.type == 'ref' else self.type
        return t + ('[]' if self.array else '')


class MofClass:
    def __init__(self, name, superclass, qualifiers, path, line):
        self.name = name
        self.superclass = superclass
        self.qualifiers = qualifiers
        self.path = path
        self.line = line
        self.properties = []
        self.methods = []


class MofInstance:
    def __init__(self, classname, values, line):
        self.classname = classname
        self.values = values
        self.line = line


def qualifier_true(qualifiers, name):
    if name not in qualifiers:
        return False
    value = qualifiers[name]
    return not (isinstance(value, list) and value and str(value[0]).lower() == 'false')


class Parser:
    def __init__(self, text, path):
        self.toks = tokenize(text)
        self.i = 0
        self.path = path

    def peek(self):
        return self.toks[self.i] if self.i < len(self.toks) else ('eof', '', self.toks[-1][2] if self.toks else 1)

    def take(self):
        tok = self.peek()
        if tok[0] == 'eof':
            raise MofError('line %d: unexpected end of file' % tok[2])
        self.i += 1
        return tok

    def expect(self, text):
        tok = self.take()
        if tok[1] != text:
            raise MofError('line %d: expected %r, found %r' % (tok[2], text, tok[1]))
        return tok

    def ident(self):
        tok = self.take()
        if tok[0] != 'ident':
            raise MofError('line %d: expected a name, found %r' % (tok[2], tok[1]))
        return tok[1]

    def value(self):
        """A constant, a list in braces, or NULL; returned as text or list of texts."""
        tok = self.take()
        if tok[1] == '{':
            items = []
            while self.peek()[1] != '}':
                items.append(self.value())
                if self.peek()[1] == ',':
                    self.take()
                elif self.peek()[1] != '}':
                    raise MofError('line %d: expected "," or "}" in a list' % self.peek()[2])
            self.take()
            return items
        if tok[0] == 'string':
            text = tok[1][1:-1]
            while self.peek()[0] == 'string':           # adjacent strings concatenate
                text += self.take()[1][1:-1]
            return text
        if tok[0] in ('number', 'char', 'ident'):
            return tok[1]
        raise MofError('line %d: expected a value, found %r' % (tok[2], tok[1]))

    def qualifiers(self):
        quals = {}
        if self.peek()[1] != '[':
            return quals
        self.take()
        while True:
            name = self.ident().lower()
            value = True
            if self.peek()[1] == '(':
                self.take()
                value = [self.value()]
                self.expect(')')
            elif self.peek()[1] == '{':
                value = self.value()
            if self.peek()[1] == ':':                   # flavors
                self.take()
                while self.peek()[0] == 'ident':
                    self.take()
            if name in quals:
                raise MofError('qualifier %s given twice' % name)
            quals[name] = value
            tok = self.take()
            if tok[1] == ']':
                return quals
            if tok[1] != ',':
                raise MofError('line %d: expected "," or "]" in qualifiers, found %r' % (tok[2], tok[1]))

    def typed_name(self, quals):
        """type [REF] name [array]; returns a Feature."""
        line = self.peek()[2]
        ctype = self.ident()
        ref = None
        if self.peek()[1].lower() == 'ref':
            self.take()
            ref, ctype = ctype, 'ref'
        elif ctype.lower() not in CIM_TYPES:
            raise MofError('line %d: unknown CIM type %r' % (line, ctype))
        else:
            ctype = ctype.lower()
        name = self.ident()
        array = False
        if self.peek()[1] == '[':
            self.take()
            if self.peek()[0] == 'number':
                self.take()
            self.expect(']')
            array = True
            if ctype == 'ref':
                raise MofError('line %d: array of references %s' % (line, name))
        return Feature(name, ctype, ref, array, quals, line)

    def declaration(self):
        quals = self.qualifiers()
        tok = self.take()
        word = tok[1].lower()
        if word == 'qualifier':                         # qualifier declaration: skip
            while self.take()[1] != ';':
                pass
            return None
        if word == 'instance':
            self.expect('of')
            return self.instance(tok[2])
        if word != 'class':
            raise MofError('line %d: expected "class", found %r' % (tok[2], tok[1]))
        name = self.ident()
        superclass = None
        if self.peek()[1] == ':':
            self.take()
            superclass = self.ident()
        cls = MofClass(name, superclass, quals, self.path, tok[2])
        self.expect('{')
        while self.peek()[1] != '}':
            fquals = self.qualifiers()
            feature = self.typed_name(fquals)
            if self.peek()[1] == '(':
                self.take()
                feature.params = []
                while self.peek()[1] != ')':
                    feature.params.append(self.typed_name(self.qualifiers()))
                    if self.peek()[1] == ',':
                        self.take()
                    elif self.peek()[1] != ')':
                        raise MofError('line %d: expected "," or ")" in parameters' % self.peek()[2])
                self.take()
                cls.methods.append(feature)
            else:
                if self.peek()[1] == '=':
                    self.take()
                    self.value()
                cls.properties.append(feature)
            self.expect(';')
        self.expect('}')
        self.expect(';')
        return cls

    def instance(self, line):
        classname = self.ident()
        self.expect('{')
        values = {}
        while self.peek()[1] != '}':
            self.qualifiers()
            name = self.ident()
            self.expect('=')
            values[name] = self.value()
            self.expect(';')
        self.expect('}')
        self.expect(';')
        return MofInstance(classname, values, line)

    def parse(self):
        out = []
        while self.peek()[0] != 'eof':
            decl = self.declaration()
            if decl is not None:
                out.append(decl)
        return out


def parse_text(text, path='<text>'):
    return Parser(text, path).parse()


class Checker:
    def __init__(self, mofdir):
        self.mofdir = mofdir
        self.errors = []
        self.classes = {}              # lower name -> MofClass
        self.table = []                # dicts with TABLE_FIELDS and 'line'

    def error(self, where, text):
        self.errors.append('%s: %s' % (where, text))

    # ---- loading
    def load_classes(self):
        for sub in ('dmtf', 'vexlan'):
            d = os.path.join(self.mofdir, sub)
            if not os.path.isdir(d):
                self.error(d, 'directory missing')
                continue
            for f in sorted(os.listdir(d)):
                if not f.endswith('.mof'):
                    continue
                path = os.path.join(d, f)
                rel = '%s/%s' % (sub, f)
                try:
                    with open(path, encoding='utf-8') as fh:
                        decls = parse_text(fh.read(), rel)
                except (MofError, UnicodeDecodeError) as e:
                    self.error(rel, str(e))
                    continue
                classes = [x for x in decls if isinstance(x, MofClass)]
                if len(classes) != 1 or len(decls) != 1:
                    self.error(rel, 'a class file declares exactly one class, found %d declarations' % len(decls))
                    continue
                cls = classes[0]
                if f != cls.name + '.mof':
                    self.error(rel, 'declares %s, file name should be %s.mof' % (cls.name, cls.name))
                if (sub == 'dmtf') != cls.name.startswith('CIM_'):
                    self.error(rel, 'CIM_ classes belong in dmtf/, the provider\'s classes in vexlan/')
                if cls.name.lower() in self.classes:
                    self.error(rel, 'class %s declared again (first in %s)' % (cls.name, self.classes[cls.name.lower()].path))
                    continue
                self.classes[cls.name.lower()] = cls

    def load_table(self):
        path = os.path.join(self.mofdir, 'classes.tsv')
        try:
            with open(path, encoding='utf-8') as fh:
                lines = fh.read().split('\n')
        except OSError as e:
            self.error('classes.tsv', str(e))
            return
        for n, text in enumerate(lines, 1):
            if not text.strip() or text.startswith('#'):
                continue
            fields = text.split('\t')
            if len(fields) != len(TABLE_FIELDS) or any(not f.strip() for f in fields):
                self.error('classes.tsv:%d' % n, 'expected %d non-empty tab-separated fields' % len(TABLE_FIELDS))
                continue
            row = dict(zip(TABLE_FIELDS, (f.strip() for f in fields)))
            row['line'] = n
            self.table.append(row)

    # ---- class model helpers
    def get(self, name):
        return self.classes.get(name.lower()) if name else None

    def chain(self, cls):
        """cls and its ancestors, nearest first; stops at a missing class or a cycle."""
        out, seen = [], set()
        while cls is not None and cls.name.lower() not in seen:
            seen.add(cls.name.lower())
            out.append(cls)
            cls = self.get(cls.superclass)
        return out

    def isa(self, name, ancestor):
        cls = self.get(name)
        return cls is not None and any(c.name.lower() == ancestor.lower() for c in self.chain(cls))

    def inherited(self, cls, name, kind):
        """Nearest declaration of property/method `name` above cls."""
        for c in self.chain(cls)[1:]:
            for f in (c.properties if kind == 'property' else c.methods):
                if f.name.lower() == name.lower():
                    return c, f
        return None, None

    def resolved_properties(self, cls):
        """name -> (declaring class, Feature), nearest declaration winning; Key if any declaration has it."""
        props, keys = {}, set()
        for c in reversed(self.chain(cls)):
            for p in c.properties:
                props[p.name.lower()] = (c, p)
                if p.key:
                    keys.add(p.name.lower())
        return props, keys

    def has_qualifier(self, cls, name):
        return any(qualifier_true(c.qualifiers, name) for c in self.chain(cls))

    # ---- checks on the class files
    def check_classes(self):
        for cls in self.classes.values():
            where = '%s:%d' % (cls.path, cls.line)
            if cls.superclass and not self.get(cls.superclass):
                self.error(where, 'superclass %s of %s is not declared' % (cls.superclass, cls.name))
            chain = self.chain(cls)
            last = chain[-1]
            if last.superclass and self.get(last.superclass):
                self.error(where, 'superclass chain of %s has a cycle' % cls.name)
            names = set()
            for f in cls.properties + cls.methods:
                fwhere = '%s:%d' % (cls.path, f.line)
                if f.name.lower() in names:
                    self.error(fwhere, '%s.%s declared twice' % (cls.name, f.name))
                names.add(f.name.lower())
                for r in [f] + (f.params or []):
                    if r.type == 'ref' and not self.get(r.ref):
                        self.error(fwhere, 'reference class %s of %s.%s is not declared' % (r.ref, cls.name, f.name))
            for p in cls.properties:
                self.check_override(cls, p, 'property')
            for m in cls.methods:
                self.check_override(cls, m, 'method')
            self.check_kind(cls, where)

    def check_override(self, cls, f, kind):
        where = '%s:%d' % (cls.path, f.line)
        ocls, orig = self.inherited(cls, f.name, kind)
        override = f.qualifiers.get('override')
        if orig is None:
            if override is not None:
                self.error(where, 'Override on %s.%s, but no superclass has a %s of that name' % (cls.name, f.name, kind))
            return
        if override is None or not isinstance(override, list) or str(override[0]).lower() != f.name.lower():
            self.error(where, '%s.%s redefines %s.%s without Override ("%s")' % (cls.name, f.name, ocls.name, f.name, f.name))
        if f.type == 'ref' and orig.type == 'ref':
            if not self.isa(f.ref, orig.ref) and self.get(f.ref):
                self.error(where, '%s.%s narrows %s REF to %s, which is not a subclass of it' % (cls.name, f.name, orig.ref, f.ref))
        elif f.signature() != orig.signature():
            self.error(where, '%s.%s is %s, but %s declares it %s' % (cls.name, f.name, f.signature(), ocls.name, orig.signature()))
        if kind == 'method':
            mine = [(p.name.lower(), p.signature()) for p in f.params]
            theirs = [(p.name.lower(), p.signature()) for p in orig.params]
            if mine != theirs:
                self.error(where, 'method %s.%s has parameters unlike those of %s' % (cls.name, f.name, ocls.name))
        if orig.key and f.qualifiers.get('key') is not None and not f.key:
            self.error(where, '%s.%s drops the Key of %s' % (cls.name, f.name, ocls.name))

    def check_kind(self, cls, where):
        props, keys = self.resolved_properties(cls)
        refs = [name for name, (c, p) in props.items() if p.type == 'ref']
        if self.has_qualifier(cls, 'association'):
            if len([r for r in refs if r in keys]) < 2:
                self.error(where, 'association %s needs two key references' % cls.name)
        elif refs:
            self.error(where, '%s has references but is no association' % cls.name)
        if self.has_qualifier(cls, 'indication') and keys:
            self.error(where, 'indication %s has keys' % cls.name)

    # ---- checks on the table
    def check_table(self):
        seen = {}
        files = {}
        for row in self.table:
            where = 'classes.tsv:%d' % row['line']
            name = row['class']
            if name.lower() in seen:
                self.error(where, '%s has a row already (line %d)' % (name, seen[name.lower()]['line']))
                continue
            seen[name.lower()] = row
            files[row['mof']] = row
            cls = self.get(name)
            if cls is None:
                self.error(where, 'no class file declares %s' % name)
                continue
            if cls.path != row['mof']:
                self.error(where, '%s is declared in %s, the row says %s' % (name, cls.path, row['mof']))
            if (cls.superclass or '').lower() != row['superclass'].lower():
                self.error(where, 'superclass of %s is %s in the class file, %s in the row' % (name, cls.superclass, row['superclass']))
            namespaces = row['namespaces'].split()
            for ns in namespaces:
                if ns not in NAMESPACE_TOKENS:
                    self.error(where, 'unknown namespace %r (use %s or interop)' % (ns, MAIN_NAMESPACE))
            if MAIN_NAMESPACE not in namespaces:
                self.error(where, '%s must be in %s' % (name, MAIN_NAMESPACE))
            if len(set(namespaces)) != len(namespaces):
                self.error(where, 'a namespace is listed twice')
            self.check_row_kind(where, row, cls)
            _, keys = self.resolved_properties(cls)
            row_keys = [] if row['keys'] == '-' else row['keys'].split(',')
            if sorted(k.lower() for k in row_keys) != sorted(keys):
                props, _ = self.resolved_properties(cls)
                shown = sorted(props[k][1].name for k in keys)
                self.error(where, 'keys of %s are %s, the row says %s' % (name, ','.join(shown) or '-', row['keys']))
        for cls in self.classes.values():
            if cls.path.startswith('vexlan/') and cls.name.lower() not in seen:
                self.error(cls.path, '%s has no row in classes.tsv' % cls.name)
        self.check_order()

    def check_row_kind(self, where, row, cls):
        types = row['types'].split()
        if types == ['-']:
            return
        if len(set(types)) != len(types) or not set(types) <= PROVIDER_TYPES:
            self.error(where, 'provider types %r: use instance, association, method, indication or "-"' % row['types'])
            return
        assoc = self.has_qualifier(cls, 'association')
        indication = self.has_qualifier(cls, 'indication')
        if assoc != ('association' in types):
            self.error(where, '%s %s an association; the row types say otherwise' % (cls.name, 'is' if assoc else 'is not'))
        if assoc and 'instance' not in types:
            self.error(where, 'association %s must also be registered as instance' % cls.name)
        if indication != ('indication' in types):
            self.error(where, '%s %s an indication; the row types say otherwise' % (cls.name, 'is' if indication else 'is not'))
        if indication and 'instance' in types:
            self.error(where, 'indication %s cannot have instances' % cls.name)
        if 'method' in types and not any(c.methods for c in self.chain(cls)):
            self.error(where, '%s has no methods, yet is registered as method provider' % cls.name)

    def vexlan_needs(self, cls):
        """Provider classes that must be loaded before cls: its Vexlan ancestors and reference targets."""
        need = set()
        for c in self.chain(cls)[1:]:
            if c.path.startswith('vexlan/'):
                need.add(c.name.lower())
        for f in cls.properties + cls.methods:
            for r in [f] + (f.params or []):
                if r.type == 'ref':
                    target = self.get(r.ref)
                    if target is not None and target.path.startswith('vexlan/') and target is not cls:
                        need.add(target.name.lower())
        return need

    def check_order(self):
        position = {row['class'].lower(): i for i, row in enumerate(self.table)}
        for i, row in enumerate(self.table):
            cls = self.get(row['class'])
            if cls is None:
                continue
            where = 'classes.tsv:%d' % row['line']
            namespaces = set(row['namespaces'].split())
            for need in sorted(self.vexlan_needs(cls)):
                if need not in position:
                    continue
                if position[need] > i:
                    self.error(where, '%s needs %s, whose row comes later' % (row['class'], self.table[position[need]]['class']))
                missing = namespaces - set(self.table[position[need]]['namespaces'].split())
                if missing:
                    self.error(where, '%s needs %s in %s as well' % (row['class'], self.table[position[need]]['class'], ' '.join(sorted(missing))))

    # ---- checks on generated files
    def check_generated(self, outdir, pegasus_interop, sfcb_interop):
        registered = [r for r in self.table if r['types'] != '-']

        def namespaces(row, interop):
            return [interop if ns == 'interop' else ns for ns in row['namespaces'].split()]

        # class MOF per namespace: the table's classes, in the table's order,
        # without the schema's own classes (rows whose file is under dmtf/)
        for token, fname in ((MAIN_NAMESPACE, 'Vexlan_CNA_Provider.mof'), ('interop', 'Vexlan_CNA_Provider_Interop.mof')):
            want = [r['class'] for r in self.table
                    if token in r['namespaces'].split() and not r['mof'].startswith('dmtf/')]
            try:
                with open(os.path.join(outdir, fname), encoding='utf-8') as fh:
                    got = [c.name for c in parse_text(fh.read(), fname) if isinstance(c, MofClass)]
            except (OSError, MofError) as e:
                self.error(fname, str(e))
                continue
            if got != want:
                self.error(fname, 'holds %d classes, expected the %d of its namespace in table order' % (len(got), len(want)))

        # OpenPegasus registration
        fname = 'Vexlan_CNA_Provider_Registration.mof'
        try:
            with open(os.path.join(outdir, fname), encoding='utf-8') as fh:
                insts = parse_text(fh.read(), fname)
        except (OSError, MofError) as e:
            self.error(fname, str(e))
            insts = None
        if insts is not None:
            codes = {'instance': '2', 'association': '3', 'indication': '4', 'method': '5'}
            modules = [x for x in insts if x.classname == 'PG_ProviderModule']
            providers = [x for x in insts if x.classname == 'PG_Provider']
            if len(modules) != 1:
                self.error(fname, 'expected one PG_ProviderModule, found %d' % len(modules))
            else:
                m = modules[0].values
                for k, v in (('InterfaceType', 'CMPI'), ('InterfaceVersion', '2.0.0'), ('Location', 'Vexlan_CNA_Provider')):
                    if m.get(k) != v:
                        self.error(fname, 'PG_ProviderModule.%s is %r, expected %r' % (k, m.get(k), v))
            if len(providers) != 1 or providers[0].values.get('Name') != 'Vexlan_CNA_Provider':
                self.error(fname, 'expected one PG_Provider named Vexlan_CNA_Provider')
            caps = {}
            for x in insts:
                if x.classname != 'PG_ProviderCapabilities':
                    continue
                cn = x.values.get('ClassName', '')
                if cn.lower() in caps:
                    self.error(fname, '%s registered twice' % cn)
                caps[cn.lower()] = x.values
            for r in registered:
                v = caps.pop(r['class'].lower(), None)
                if v is None:
                    self.error(fname, '%s is not registered' % r['class'])
                    continue
                want_types = sorted(codes[t] for t in r['types'].split())
                if sorted(v.get('ProviderType') or []) != want_types:
                    self.error(fname, '%s has ProviderType %s, expected %s' % (r['class'], v.get('ProviderType'), want_types))
                # OpenPegasus's interop namespace is its own interop provider's:
                # no class of the provider is registered there.
                want_ns = [ns for ns in r['namespaces'].split() if ns != 'interop']
                if (v.get('Namespaces') or []) != want_ns:
                    self.error(fname, '%s has Namespaces %s, expected %s' % (r['class'], v.get('Namespaces'), want_ns))
            for cn in caps:
                self.error(fname, '%s is registered but has no registered row' % cn)
            # The profiles: every conforming element is a class the provider
            # serves in its namespace, and each capability is named once.
            served = {r['class'].lower() for r in registered if 'instance' in r['types'].split()}
            ids = set()
            profiles = [x for x in insts if x.classname == 'PG_ProviderProfileCapabilities']
            if not profiles:
                self.error(fname, 'no PG_ProviderProfileCapabilities: OpenPegasus would advertise no profile')
            for x in profiles:
                cid = x.values.get('CapabilityID', '')
                if cid in ids:
                    self.error(fname, 'profile capability %s listed twice' % cid)
                ids.add(cid)
                elements = x.values.get('ConformingElements') or []
                if not elements:
                    self.error(fname, 'profile capability %s names no conforming element' % cid)
                for e in elements:
                    if e.lower() not in served:
                        self.error(fname, 'profile capability %s names %s, which the provider does not serve' % (cid, e))

        # sfcb registration
        fname = 'Vexlan_CNA_Provider.reg'
        try:
            with open(os.path.join(outdir, fname), encoding='utf-8') as fh:
                text = fh.read()
        except OSError as e:
            self.error(fname, str(e))
            return
        sections, current = {}, None
        for n, line in enumerate(text.split('\n'), 1):
            s = line.strip()
            if not s or s.startswith('#'):
                continue
            m = re.match(r'^\[(\w+)\]$', s)
            if m:
                current = m.group(1).lower()
                if current in sections:
                    self.error('%s:%d' % (fname, n), '%s has two sections' % m.group(1))
                sections[current] = {}
                continue
            m = re.match(r'^(\w+):\s*(.*)$', s)
            if not m or current is None:
                self.error('%s:%d' % (fname, n), 'not a section header or "key: value" line')
                continue
            sections[current][m.group(1)] = m.group(2).split()
        for r in registered:
            sec = sections.pop(r['class'].lower(), None)
            if sec is None:
                self.error(fname, '%s has no section' % r['class'])
                continue
            want = {'provider': ['Vexlan_CNA_Provider'], 'location': ['Vexlan_CNA_Provider'],
                    'type': r['types'].split(), 'namespace': namespaces(r, sfcb_interop)}
            if sec != want:
                self.error(fname, 'section %s is %s, expected %s' % (r['class'], sec, want))
        for cn in sections:
            self.error(fname, 'section %s has no registered row' % cn)

    def run(self, generated=None, pegasus_interop='root/PG_InterOp', sfcb_interop='root/interop'):
        self.load_classes()
        self.load_table()
        self.check_classes()
        self.check_table()
        if generated:
            self.check_generated(generated, pegasus_interop, sfcb_interop)
        return self.errors


def main(argv=None):
    ap = argparse.ArgumentParser(description=__doc__.split('\n')[0])
    ap.add_argument('mofdir', nargs='?', default=os.path.dirname(os.path.abspath(__file__)))
    ap.add_argument('--generated', metavar='DIR', help='also check the output of gen-registration.sh in DIR')
    ap.add_argument('--pegasus-interop', default='root/PG_InterOp')
    ap.add_argument('--sfcb-interop', default='root/interop')
    args = ap.parse_args(argv)
    checker = Checker(args.mofdir)
    errors = checker.run(args.generated, args.pegasus_interop, args.sfcb_interop)
    for e in errors:
        print(e)
    if not errors:
        print('%d classes, %d table rows: consistent' % (len(checker.classes), len(checker.table)))
    return 1 if errors else 0


if __name__ == '__main__':
    sys.exit(main())
