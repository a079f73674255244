// Replaced by the effect engine's units.
