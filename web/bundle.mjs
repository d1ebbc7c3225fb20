// Makes one page of the parts: bundle.mjs PAGE SCRIPT OUT, where SCRIPT is main.js with all it imports. The page runs
// this script and nothing else.

import { createHash } from 'node:crypto';
import { readFileSync, writeFileSync } from 'node:fs';
import { dirname, join } from 'node:path';

const [page, script, out] = process.argv.slice(2);
const code = readFileSync(script, 'utf8').replaceAll('</script', '<\\/script');
const style = readFileSync(join(dirname(page), 'style.css'), 'utf8');
const hash = createHash('sha256').update(code).digest('base64');
const policy = `default-src 'none'; img-src data: blob:; connect-src data:; style-src 'unsafe-inline'; script-src 'sha256-${hash}' 'wasm-unsafe-eval'`;
const parts = {
  '<meta charset="utf-8">': `<meta charset="utf-8">\n<meta http-equiv="Content-Security-Policy" content="${policy}">`,
  '<link rel="stylesheet" href="style.css">': `<style>\n${style}</style>`,
  '<script type="module" src="main.js"></script>': `<script type="module">${code}</script>`,
};
let html = readFileSync(page, 'utf8');
for (const [from, to] of Object.entries(parts)) {
  if (!html.includes(from)) throw new Error(`${page} has no ${from}`);
  html = html.replace(from, () => to);
}
writeFileSync(out, html);
