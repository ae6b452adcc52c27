#!/usr/bin/env python3
"""Turns the deployment guide (docs/deploy.md) into the manual page vexlan-cna(8).

The guide is the one text an administrator reads; the manual page is made from
it at build time so the two never differ. Only what the guide uses is
understood: headings, paragraphs, indented command blocks, bullet and numbered
lists (nested by indentation), tables, `code`, **bold** and [links](target).

usage: md2man.py GUIDE.md OUT.8 NAME SECTION VERSION
"""
import re
import sys

ITEM = re.compile(r'^(\s*)([-*]|\d+\.) (.*)$')
INLINE = re.compile(r'`([^`]*)`|\*\*([^*]+)\*\*|\[([^\]]+)\]\(([^)]+)\)')


def escape(text):
    """Plain text for troff."""
    return text.replace('\\', '\\e').replace('-', '\\-')


def inline(text):
    """Markdown inline forms to troff fonts."""
    out, pos = [], 0
    for m in INLINE.finditer(text):
        out.append(escape(text[pos:m.start()]))
        if m.group(1) is not None:
            out.append('\\fB' + escape(m.group(1)) + '\\fP')
        elif m.group(2) is not None:
            out.append('\\fB' + inline(m.group(2)).replace('\\fB', '').replace('\\fP', '') + '\\fP')
        else:
            out.append(escape(m.group(3)) + ' (' + escape(m.group(4)) + ')')
        pos = m.end()
    out.append(escape(text[pos:]))
    return ''.join(out)


def guard(line):
    """A line that starts with a dot or a quote would be read as a request."""
    return '\\&' + line if line[:1] in ('.', "'") else line


def indent_of(line):
    return len(line) - len(line.lstrip(' '))


class Page:
    def __init__(self, name, section, version):
        self.name = name
        self.out = ['.TH %s %s "" "%s" "System Administration"' % (escape(name.upper()), section, version)]

    def emit(self, *lines):
        self.out.extend(lines)

    def indented(self, indent, lines):
        if indent > 0:
            self.emit('.RS %d' % indent)
        self.emit(*lines)
        if indent > 0:
            self.emit('.RE')


def convert(md, name, section, version):
    page = Page(name, section, version)
    lines = md.splitlines()
    titled = False
    context = 0        # text indent of the list item the text belongs to
    after_blank = True
    i = 0
    while i < len(lines):
        line = lines[i]
        stripped = line.strip()
        if not stripped:
            after_blank = True
            i += 1
            continue
        ind = indent_of(line)
        if line.startswith('#'):
            level = len(line) - len(line.lstrip('#'))
            text = inline(line[level:].strip())
            if level == 1 and not titled:
                page.emit('.SH NAME', '%s \\- %s' % (escape(name), text), '.SH DESCRIPTION')
                titled = True
            elif level <= 2:
                page.emit('.SH ' + text.upper())
            else:
                page.emit('.SS ' + text)
            context, after_blank, i = 0, False, i + 1
            continue
        if stripped.startswith('|'):
            block = []
            while i < len(lines) and lines[i].strip().startswith('|'):
                block.append(lines[i])
                i += 1
            rows = [[c.strip() for c in r.strip().strip('|').split('|')] for r in block]
            rows = [r for r in rows if not all(re.fullmatch(r':?-+:?', c) for c in r if c)]
            header, body = rows[0], rows[1:]
            for cells in body:
                rest = [cells[k] if len(header) <= 2 else '%s: %s' % (header[k], cells[k])
                        for k in range(1, len(cells)) if k < len(header) and cells[k]]
                page.indented(ind, ['.TP', guard(inline(cells[0])), guard(inline('; '.join(rest)))])
            after_blank = False
            continue
        if after_blank and ind >= context + 4:
            # A command block: everything at least this far in, blank lines
            # inside it kept.
            block = []
            while i < len(lines):
                if lines[i].strip() and indent_of(lines[i]) < ind:
                    break
                if not lines[i].strip():
                    nxt = next((l for l in lines[i + 1:] if l.strip()), '')
                    if indent_of(nxt) < ind:
                        break
                block.append(lines[i][ind:])
                i += 1
            page.indented(ind, ['.PP', '.nf'] + [guard(escape(b)) for b in block] + ['.fi'])
            after_blank = False
            continue
        m = ITEM.match(line)
        if m:
            marker = '\\(bu' if m.group(2) in ('-', '*') else m.group(2)
            context = len(m.group(1)) + len(m.group(2)) + 1
            text = [m.group(3)]
            i += 1
            while i < len(lines) and lines[i].strip() and not ITEM.match(lines[i]) \
                    and not lines[i].strip().startswith('|') and indent_of(lines[i]) < context + 4:
                text.append(lines[i].strip())
                i += 1
            page.indented(len(m.group(1)), ['.IP %s %d' % (marker, max(3, len(m.group(2)) + 2)),
                                            guard(inline(' '.join(text)))])
            after_blank = False
            continue
        # A paragraph: within a list item when indented under it.
        if ind < context and after_blank:
            context = 0
        text = [stripped]
        i += 1
        while i < len(lines) and lines[i].strip() and not ITEM.match(lines[i]) \
                and not lines[i].strip().startswith(('|', '#')):
            text.append(lines[i].strip())
            i += 1
        body = guard(inline(' '.join(text)))
        if context and ind >= context:
            page.indented(context, ['.PP', body])
        else:
            page.emit('.PP', body)
        after_blank = False
    return '\n'.join(page.out) + '\n'


def main():
    if len(sys.argv) != 6:
        sys.stderr.write(__doc__)
        return 2
    src, dst, name, section, version = sys.argv[1:]
    with open(src, encoding='utf-8') as f:
        md = f.read()
    with open(dst, 'w', encoding='utf-8') as f:
        f.write(convert(md, name, section, version))
    return 0


if __name__ == '__main__':
    sys.exit(main())
