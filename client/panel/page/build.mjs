// Makes the page: `node build.mjs OUTDIR` writes index.html, panel.css and panel.js, and in page.d what they are made of,
// for the build to know when they are stale.
import { build } from 'esbuild';
import { copyFile, mkdir, writeFile } from 'node:fs/promises';
import { dirname, join } from 'node:path';
import { fileURLToPath } from 'node:url';

const here = dirname(fileURLToPath(import.meta.url));
const folder = process.argv[2];
if (!folder) {
    console.error('usage: node build.mjs OUTDIR');
    process.exit(2);
}

await mkdir(folder, { recursive: true });
const { metafile } = await build({
    entryPoints: { panel: join(here, 'src/app/main.tsx') },
    absWorkingDir: here,
    outdir: folder,
    bundle: true,
    minify: true,
    format: 'iife',
    target: 'es2022',
    charset: 'utf8',
    legalComments: 'none',
    metafile: true,
    logLevel: 'warning',
});
const html = 'src/app/index.html';
await copyFile(join(here, html), join(folder, 'index.html'));
const paths = [join(folder, 'index.html'), ...[html, ...Object.keys(metafile.inputs)].map((source) => join(here, source))];
const [output, ...inputs] = paths.map((path) => path.replaceAll(' ', '\\ '));
await writeFile(join(folder, 'page.d'), `${output}: ${inputs.join(' ')}\n`);
