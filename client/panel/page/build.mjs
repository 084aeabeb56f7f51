// Makes the page: `node build.mjs OUTDIR` writes index.html, panel.css and panel.js.
import { build } from 'esbuild';
import { copyFile, mkdir } from 'node:fs/promises';
import { dirname, join } from 'node:path';
import { fileURLToPath } from 'node:url';

const here = dirname(fileURLToPath(import.meta.url));
const folder = process.argv[2];
if (!folder) {
    console.error('usage: node build.mjs OUTDIR');
    process.exit(2);
}

await mkdir(folder, { recursive: true });
await build({
    entryPoints: { panel: join(here, 'src/app/main.tsx') },
    absWorkingDir: here,
    outdir: folder,
    bundle: true,
    minify: true,
    format: 'iife',
    target: 'es2022',
    charset: 'utf8',
    legalComments: 'none',
    logLevel: 'warning',
});
await copyFile(join(here, 'src/app/index.html'), join(folder, 'index.html'));
