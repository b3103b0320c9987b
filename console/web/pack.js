// pack.js OUTPUT: makes one page of console.html and what it names, here, and the packages beside it.
import { readFile, writeFile } from "node:fs/promises";
import { build } from "esbuild";

const novnc = "node_modules/@novnc/novnc";
const textOf = (file) => readFile(file, "utf8");

/// The terms of what others have made of the page.
async function notice() {
    const { version } = JSON.parse(await textOf(`${novnc}/package.json`));
    const [cipherTerms] = (await textOf(`${novnc}/core/crypto/des.js`)).match(/\/\*.*?\*\//s);
    return `<!--
The page of tessella-console. Its script contains noVNC ${version}, copyright the noVNC authors, under the
Mozilla Public License 2.0, https://mozilla.org/MPL/2.0/; the sources are the package @novnc/novnc of npm.
Parts of them have terms of their own.

core/crypto/des.js:
${cipherTerms}

vendor/pako:
${await textOf(`${novnc}/vendor/pako/LICENSE`)}-->
`;
}

async function bundled(file) {
    const { outputFiles } = await build({
        entryPoints: [file], bundle: true, minify: true, format: "esm", legalComments: "none", write: false,
    });
    return outputFiles[0].text.trim();
}

const [script, style] = await Promise.all(["console.js", "console.css"].map(bundled));
const terms = await notice();
const page = (await textOf("console.html"))
    .replace('<link rel="stylesheet" href="console.css">', () => `<style>${style}</style>`)
    .replace(' src="console.js">', () => `>${script}`)
    .replace("<html", () => `${terms}<html`);
await writeFile(process.argv[2], page);
