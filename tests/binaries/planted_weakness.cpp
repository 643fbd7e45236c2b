// Linked without what protects the others.
void plantedWeakness() {}
