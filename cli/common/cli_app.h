#pragma once

// The option parser's class by name alone: its header costs seconds wherever it is included, and only
// the files that add options need it.
namespace CLI {
class App;
}
