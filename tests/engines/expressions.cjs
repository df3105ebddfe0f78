// Does with the expressions of an exported configuration what the engine does with them: joins the
// lines of LOG into messages and takes each apart, with the engine's own kind of expressions. Prints
// a JSON object a message. Usage: node expressions.cjs MODULES ENGINE CONFIGURATION LOG
const fs = require("fs");
const path = require("path");

const [modules, engine, configuration, log] = process.argv.slice(2);
const load = (name) => require(require.resolve(name, { paths: [modules] }));
const text = fs.readFileSync(configuration, "utf8");

// A function from a text to the groups' texts, or null.
function re2(expression) {
  const { RE2 } = load("re2-wasm");
  const compiled = new RE2(expression, "u");
  return (line) => {
    const match = compiled.exec(line);
    return match && (match.groups || {});
  };
}

async function oniguruma() {
  const onig = load("vscode-oniguruma");
  const wasm = fs.readFileSync(
    path.join(modules, "node_modules/vscode-oniguruma/release/onig.wasm")).buffer;
  await onig.loadWASM(wasm);
  return (expression) => {
    const names = [...expression.matchAll(/\(\?<([a-z_]+)>/g)].map((one) => one[1]);
    const scanner = new onig.OnigScanner([expression]);
    return (line) => {
      const string = new onig.OnigString(line);
      const match = scanner.findNextMatchSync(string, 0);
      string.dispose();
      if (!match) return null;
      const groups = {};
      names.forEach((name, number) => {
        const { start, end } = match.captureIndices[number + 1];
        groups[name] = line.substring(start, end);
      });
      return groups;
    };
  };
}

// The expressions for a message's begin and for all of it, and what is done to the level.
async function fromVector() {
  const whole = load("yaml").parse(text);
  const source = whole.sources.korvex_log_file.multiline;
  const program = whole.transforms.korvex_log.source;
  return { begin: re2(source.start_pattern), line: re2(/r'(.*)'\)/.exec(program)[1]),
           trims: program.includes("strip_whitespace") };
}

async function fromLoki() {
  const stages = load("yaml").parse(text).scrape_configs[0].pipeline_stages;
  const stage = (name) => (stages.find((one) => name in one) || {})[name];
  return { begin: re2(stage("multiline").firstline), line: re2(stage("regex").expression),
           trims: stage("template") !== undefined };
}

async function fromFluentBit() {
  const compile = await oniguruma();
  const whole = load("yaml").parse(text);
  const bare = (rule) => rule.regex.slice(1, -1);
  const [first, next] = whole.multiline_parsers[0].rules;
  const begin = compile(bare(first));
  const goesOn = compile(bare(next));
  return {
    begin: (line) => {
      const begins = begin(line);
      if ((begins === null) === (goesOn(line) === null)) throw Error("both or neither: " + line);
      return begins;
    },
    line: compile(whole.parsers[0].regex),
  };
}

async function fromLogstash() {
  const compile = await oniguruma();
  const message = /"KORVEX_MESSAGE" => '(.*)'/.exec(text)[1];
  const line = /"message" => '(.*)' }/.exec(text)[1];
  return { begin: compile(/pattern => '(.*)'/.exec(text)[1]),
           line: compile(line.replace(/%\{KORVEX_MESSAGE:(\w+)\}/, `(?<$1>${message})`)) };
}

async function main() {
  const from = { vector: fromVector, loki: fromLoki, "fluent-bit": fromFluentBit,
                 logstash: fromLogstash };
  const { begin, line, trims } = await from[engine]();
  const messages = [];
  for (const one of fs.readFileSync(log, "utf8").replace(/\n$/, "").split("\n")) {
    if (begin(one) !== null) messages.push(one);
    else messages[messages.length - 1] += "\n" + one;
  }
  for (const one of messages) {
    const groups = line(one);
    if (groups === null) throw Error("no match: " + one);
    if (trims) groups.level = groups.level.trim();
    console.log(JSON.stringify(groups));
  }
}

main();
