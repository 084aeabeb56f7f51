// Bundles the tests and hands them to Node's test runner.
import { spawnSync } from 'node:child_process';
import { mkdtemp, readdir, rm } from 'node:fs/promises';
import { tmpdir } from 'node:os';
import { dirname, join } from 'node:path';
import { fileURLToPath } from 'node:url';
import { build } from 'esbuild';

const here = dirname(fileURLToPath(import.meta.url));
const names = (await readdir(here)).filter((name) => name.endsWith('.test.ts')).sort();
const folder = await mkdtemp(join(tmpdir(), 'vexa-panel-'));
try {
    await build({
        entryPoints: names.map((name) => join(here, name)),
        absWorkingDir: dirname(here),
        outdir: folder,
        outExtension: { '.js': '.mjs' },
        bundle: true,
        platform: 'node',
        format: 'esm',
        target: 'node18',
        sourcemap: 'inline',
        loader: { '.css': 'empty' },
        logLevel: 'warning',
    });
    const files = names.map((name) => join(folder, name.replace(/\.ts$/, '.mjs')));
    const run = spawnSync(process.execPath, ['--enable-source-maps', '--test', ...files], { stdio: 'inherit' });
    process.exitCode = run.status ?? 1;
} finally {
    await rm(folder, { recursive: true, force: true });
}
