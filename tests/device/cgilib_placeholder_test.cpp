// Placeholder so that the device test target has a source until device tests land.
