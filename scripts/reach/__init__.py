"""What scripts/coverage is made of."""
